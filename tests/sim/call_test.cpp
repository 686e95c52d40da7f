// The command at the far end of a data connection.
#include <gmock/gmock.h>

#include "tests/sim/client.h"
#include "tests/support/files.h"
#include "tests/support/modem_simulator.h"

namespace taviwireless::test {
namespace {

using testing::EndsWith;

// Everything up to these words.
std::string ReadUntil(Client& client, const std::string& last) {
    std::string text;
    while (text.find(last) == std::string::npos && client.ReadMore(Client::kPatience, &text)) {
    }
    return text;
}

TEST(Call, CommandHasTheLineUntilItEndsAndThenTheModemHangsUp) {
    ModemSimulator simulator(
        {"--on-dial", "echo welcome; read -r line; echo \"heard $line\"; exit 3"});
    Client client(0);
    for (int round = 0; round < 2; ++round) {
        client.Write("ATD*99#\r");
        EXPECT_THAT(ReadUntil(client, "welcome\n"), EndsWith("\r\nCONNECT\r\nwelcome\n"));
        simulator.Received("0");
        client.Write("AT+CSQ\n");  // is the command's now
        EXPECT_EQ(ReadUntil(client, "NO CARRIER\r\n"), "heard AT+CSQ\n\r\nNO CARRIER\r\n");
        EXPECT_THAT(simulator.Received("0"), testing::IsEmpty());
        EXPECT_THAT(client.Ask("AT"), EndsWith("OK\r\n"));
    }
}

TEST(Call, CommandEndsWithTheModem) {
    ModemSimulator simulator({"--on-dial",
                              "trap 'echo gone >/tmp/call; exit' TERM; echo welcome; "
                              "while :; do sleep 0.1; done"});
    Client client(0);
    client.Write("ATD*99#\r");
    ReadUntil(client, "welcome\n");
    simulator.Unplug("0");
    EXPECT_EQ(ReadFile("/tmp/call"), "gone\n");
}

}  // namespace
}  // namespace taviwireless::test
