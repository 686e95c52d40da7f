#include <gmock/gmock.h>
#include <json/json.h>

#include "cli/report.h"

namespace taviwireless::cli {
namespace {

TEST(Output, AlignsColumnsByCharactersNotBytes) {
    testing::internal::CaptureStdout();
    Print(Table{{"NAME", "X"}, {"Zürich", "1"}, {"A", ""}});
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "NAME    X\nZürich  1\nA\n");
}

TEST(Output, TextOfAModemCannotSteerTheTerminal) {
    EXPECT_EQ(Printable("a\x1b[2Jb\r\n\x7f ü"), "a?[2Jb??? ü");
    EXPECT_EQ(Printable("\xC2\x9B"
                        "2J\xC2\xA0\xC2"),
              "?2J\xC2\xA0\xC2");
}

TEST(Output, JsonStaysJsonWhateverTheModemSays) {
    Json::Value document;
    document["text"] = std::string("a\"\n\x1b\xff");
    testing::internal::CaptureStdout();
    Print(document);
    Json::Value parsed;
    std::string errors;
    std::istringstream printed(testing::internal::GetCapturedStdout());
    EXPECT_TRUE(Json::parseFromStream(Json::CharReaderBuilder(), printed, &parsed, &errors));
    EXPECT_EQ(parsed["text"].asString().substr(0, 4), "a\"\n\x1b");
}

}  // namespace
}  // namespace taviwireless::cli
