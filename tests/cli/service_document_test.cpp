#include "cli/modem/service_document.h"

#include <gmock/gmock.h>

namespace taviwireless::cli {
namespace {

using testing::Pair;
using testing::UnorderedElementsAre;

TEST(ServiceDocument, TextsAreTakenAsTheyStand) {
    for (const std::string text : {"", "plain", "a\"b", "back\\slash\\", "\"", "\",",
                                   "\", \"x\": \"", "x\": \"y", ",", "{"}) {
        SCOPED_TRACE(text);
        const ModemState state = ReadModemDocument(
            "{\n\t\"id\": \"usbmodem0\",\n\t\"vendor\": \"" + text +
            "\",\n\t\"signal\": 54,\n\t\"pin_protected\": true,\n\t\"pin_remains\": -1,\n"
            "\t\"profile\": \n\t{\n\t\t\"user\": \"" +
            text + "\",\n\t\t\"roaming\": ,\n\t\t\"default_gw\": false\n\t}\n}\n");
        EXPECT_EQ(state.id, "usbmodem0");
        EXPECT_EQ(state.vendor, text);
        EXPECT_EQ(state.signal, 54);
        EXPECT_TRUE(state.pinProtected);
        EXPECT_EQ(state.pinRemains, -1);
        EXPECT_THAT(state.profile, UnorderedElementsAre(Pair("user", text), Pair("roaming", ""),
                                                        Pair("default_gw", "false")));
    }
}

}  // namespace
}  // namespace taviwireless::cli
