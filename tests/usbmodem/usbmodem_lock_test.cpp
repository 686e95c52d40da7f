// Two processes that talk to one modem at the same time; see tests/support/short_waits.cpp for the
// waits.
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>

#include "tests/usbmodem/opened_modem.h"

namespace taviwireless::test {
namespace {

constexpr int kCommands = 100;

// Sends the command over and over and ends with the number of replies that were not the right one.
[[noreturn]] void Ask(usbmodem_lib::USBModem& record, const char* command,
                      const std::string& expected) {
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    int wrong = 0;
    for (int i = 0; i < kCommands; ++i) {
        std::string reply;
        wrong += record.ModemCmd(command, reply) != 0 || reply != expected;
    }
    _exit(wrong);
}

// The processes share one open line, as the lock file keeps the port from being opened twice.
TEST(TwoProcesses, NeverGetEachOthersReplies) {
    OpenedModem modem("generic");
    const pid_t first = fork();
    if (first == 0) {
        Ask(modem.record, "AT+CGMI", "Generic\nOK\n");
    }
    const pid_t second = fork();
    if (second == 0) {
        Ask(modem.record, "AT+CGMM", "3G Modem\nOK\n");
    }
    for (const pid_t child : {first, second}) {
        int status = -1;
        EXPECT_EQ(waitpid(child, &status, 0), child);
        EXPECT_EQ(status, 0) << "wrong replies: " << WEXITSTATUS(status);
    }
    EXPECT_EQ(modem.Received().size(), 2u * kCommands);
}

}  // namespace
}  // namespace taviwireless::test
