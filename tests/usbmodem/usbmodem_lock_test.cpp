// Two processes that talk to one modem at the same time.
#include <dlfcn.h>
#include <sys/prctl.h>
#include <sys/select.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>

#include "tests/usbmodem/opened_modem.h"

namespace {

constexpr suseconds_t kLongestQuietWait = 200000;  // µs
constexpr suseconds_t kShortWait = 10000;          // µs

}  // namespace

// In place of the C library's, for the libraries as well: the waits for silence, before a command
// and behind a reply, are cut to 10 ms, which saves a minute. What is checked stays as it was: the
// simulated modem sends a reply in one piece, so no wait decides where a reply ends, and the wait
// for its beginning (1 s) is not cut.
extern "C" __attribute__((visibility("default"))) int select(int count, fd_set* readable,
                                                             fd_set* writable, fd_set* exceptional,
                                                             timeval* timeout) {
    static const auto next = reinterpret_cast<decltype(&select)>(dlsym(RTLD_NEXT, "select"));
    timeval shortened{0, kShortWait};
    const bool isQuietWait = timeout != nullptr && timeout->tv_sec == 0 &&
                             timeout->tv_usec > kShortWait && timeout->tv_usec <= kLongestQuietWait;
    return next(count, readable, writable, exceptional, isQuietWait ? &shortened : timeout);
}

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
