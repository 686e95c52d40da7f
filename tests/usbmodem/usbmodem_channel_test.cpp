// SPDX-License-Identifier: MIT
// The serial channel: opening, one command and its reply, modems that misbehave, and the lock between
// processes.
#include <sys/prctl.h>
#include <sys/sem.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <taviwireless/semaphore.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <ctime>

#include "tests/support/descriptors.h"
#include "tests/support/files.h"
#include "tests/usbmodem/opened_modem.h"

namespace taviwireless::test {
namespace {

using semaphore::Semaphore;
using testing::IsEmpty;
using usbmodem_lib::USBModem;

constexpr char kLockFile[] = "/var/lock/LCK..ttyUSB1";

template <typename Work>
bool EndsWithin(int seconds, Work work) {
    const auto begin = std::chrono::steady_clock::now();
    work();
    return std::chrono::steady_clock::now() - begin < std::chrono::seconds(seconds);
}

// Whether work takes little of the processor: less than 0.5 s, where spinning takes a second.
template <typename Work>
bool IsQuick(Work work) {
    const std::clock_t processor = std::clock();
    work();
    return std::clock() - processor < CLOCKS_PER_SEC / 2;
}

// The waits for silence as they are, where a case is about them: see tests/support/short_waits.cpp.
struct WholeWaits {
    WholeWaits() { setenv("TAVI_QUIET_WAITS", "whole", 1); }
    ~WholeWaits() { unsetenv("TAVI_QUIET_WAITS"); }
};

bool IsUnlocked() {
    return semctl(semget(1, 1, 0), 0, GETVAL) == 1;
}

TEST(Channel, IsKeptFromItsPortByALockFileWhoseProcessLives) {
    const struct {
        const char* made;  // by a command, with $f for the lock file
        bool counts;
    } kFiles[] = {
        {"true", false},          {"echo 4194305 >$f", false},  // no process has a number that high
        {"echo $PPID >$f", true}, {"touch $f", false},          // by who was killed before he wrote
        {"echo x >$f", true},
    };
    OpenedModem modem("generic");
    for (const auto& file : kFiles) {
        SCOPED_TRACE(file.made);
        modem.record.CloseFileDevice();
        ASSERT_FALSE(Exists(kLockFile));
        Shell(std::string("f=") + kLockFile + "; " + file.made);
        modem.log.Clear();
        EXPECT_EQ(modem.record.OpenFileDevice(kQueryPort), file.counts ? -1 : 0);
        EXPECT_EQ(modem.log.Has("modem Init failed: Device or resource busy"), file.counts);
        if (file.counts) {
            EXPECT_EQ(unlink(kLockFile), 0);  // it was left alone
        } else {
            EXPECT_EQ(std::stoi(ReadFile(kLockFile)), getpid());
        }
    }
}

TEST(Channel, HasItsPortForItselfWithoutALockFileToo) {
    OpenedModem modem("generic");
    ASSERT_EQ(unlink(kLockFile), 0);
    USBModem second(1, kInfo1);
    EXPECT_EQ(second.OpenFileDevice(kQueryPort), -1);
    EXPECT_TRUE(modem.log.Has("modem Init failed: Device or resource busy")) << modem.log.Text();
    std::string reply;
    EXPECT_EQ(modem.record.ModemCmd("AT", reply), 0);
    modem.record.CloseFileDevice();
    EXPECT_EQ(second.OpenFileDevice(kQueryPort), 0);
}

TEST(Command, FailsWhileAStrangerKeepsTheLockAndFreesIt) {
    OpenedModem modem;
    std::string reply;
    ASSERT_EQ(modem.record.ModemCmd("AT", reply), 0);
    ASSERT_EQ(semctl(semget(1, 1, 0), 0, SETVAL, 0), 0);
    modem.Received();
    EXPECT_EQ(modem.record.ModemCmd("AT", reply), -1);
    EXPECT_TRUE(modem.log.Has(" errno " + std::to_string(EAGAIN))) << modem.log.Text();
    EXPECT_TRUE(modem.log.Has("Error on enter Semaphore"));
    EXPECT_THAT(modem.Received(), IsEmpty());
    EXPECT_EQ(modem.record.ModemCmd("AT", reply), 0);
}

TEST(Reply, HasNeitherBlankNorCutLinesNorEchoes) {
    const struct {
        bool echo;
        std::string sent;
        const char* reply;
    } kReplies[] = {
        // The late echo of a PIN.
        {true, Framed({"AT+CPIN=1357", "OK"}), "AT+CPIN=1357\nOK\n"},
        {true, Framed({"A", "AT+CSQ", "B", "xAT+CSQ=y", "OK"}), "A\nB\nOK\n"},
        {true, Framed({"^RSSI:21", "+CSQ: 17,99", "OK"}), "^RSSI:21\n+CSQ: 17,99\nOK\n"},
        {true, "\r\nA\r\n\nB\r\n", "A\n"},
        {true, {"\r\nA\r\nB\0C\r\n", 10}, "A\n"},
        {true, "\r\n+CSQ: 17,99\r\n\r\n4669201", "+CSQ: 17,99\n"},
        {true, "\r\nA\r\n\r\nOK\r", "A\nOK\n"},
        {false, Framed({"+CSQ: 17,99", "OK"}), "+CSQ: 17,99\nOK\n"},
        {false, "A\nOK\n", "A\nOK\n"},
        {false, "\nOK\r\n", ""},
        {false, "OK", ""},
        {false, {"\0\r\nOK\r\n", 7}, ""},
    };
    OpenedModem modem;
    for (const auto& row : kReplies) {
        SCOPED_TRACE(row.sent);
        modem.simulator.Fault("1", row.echo ? "off" : "noecho");
        modem.simulator.Reply("1", "AT+CSQ", row.sent);
        std::string reply = "to be replaced";
        EXPECT_EQ(modem.record.ModemCmd("AT+CSQ", reply), 0);
        EXPECT_EQ(reply, row.reply);
    }
    EXPECT_EQ(modem.log.Text(), "");
}

TEST(TestDialogue, PrintsTheReplyOrWhatFailedAndClosesThePort) {
    OpenedModem modem("generic");
    modem.record.CloseFileDevice();
    const auto before = OpenDescriptors();
    modem.simulator.Reply("1", "AT+CSQ", Framed({"\033[2Jat+cpin=1357", "OK"}));
    testing::internal::CaptureStdout();
    EXPECT_EQ(modem.record.TestATCmd("AT+CSQ", kQueryPort), 0);
    EXPECT_EQ(modem.record.TestATCmd("AT+CSQ", "/dev/ttyUSB9"), -1);
    modem.simulator.Fault("1", "silent");
    EXPECT_EQ(modem.record.TestATCmd("AT+CSQ", kQueryPort), -1);
    EXPECT_EQ(testing::internal::GetCapturedStdout(),
              R"(Initializing Modem for node /dev/ttyUSB1
Send command AT+CSQ
Get return string as follow:
?[2Jat+cpin=***
OK

Initializing Modem for node /dev/ttyUSB9
modem Init failed: No such file or directory
Initializing Modem for node /dev/ttyUSB1
Send command AT+CSQ
Error return on modem cmd: -1
)");
    EXPECT_EQ(OpenDescriptors(), before);
}

TEST(Babble, IsGivenUpInsteadOfHoldingTheLockForLong) {
    const WholeWaits waits;
    OpenedModem modem;
    modem.simulator.Fault("1.1", "babble");
    std::string reply;
    // On a loaded machine the babble may pause long enough to count as quiet: then once more.
    int result = 0;
    for (int tries = 0; tries < 3 && result == 0; ++tries) {
        EXPECT_TRUE(EndsWithin(6, [&] { result = modem.record.ModemCmd("AT+CSQ", reply); }));
    }
    EXPECT_EQ(result, -1);
    EXPECT_TRUE(modem.log.Has("failed on drain buffer"));
    EXPECT_TRUE(IsUnlocked());
}

TEST(Babble, ThatACommandSetsOffIsCutOffInItsReply) {
    const WholeWaits waits;
    OpenedModem modem;
    modem.simulator.Fault("1.1", "pieces=1/100");  // would go on for 50 s
    modem.simulator.Fault("1.1", "long=500");
    std::string reply;
    EXPECT_TRUE(EndsWithin(8, [&] { EXPECT_EQ(modem.record.ModemCmd("AT+CSQ", reply), 0); }));
    EXPECT_TRUE(IsUnlocked());
}

TEST(Unplugging, WithinAReplyEndsIt) {
    const WholeWaits waits;
    const struct {
        const char* fault;
        bool echo;  // without one nothing at all comes
        int result;
        const char* reply;
    } kFaults[] = {{"vanish=15", true, 0, "+CSQ: 17,99\n"},  // behind its first line
                   {"vanish=9", true, -1, ""},
                   {"vanish=0", false, -1, ""}};
    for (const auto& row : kFaults) {
        SCOPED_TRACE(row.fault);
        OpenedModem modem;
        modem.simulator.Fault("1", row.echo ? "off" : "noecho");
        modem.simulator.Fault("1.1", row.fault);
        std::string reply;
        EXPECT_TRUE(
            IsQuick([&] { EXPECT_EQ(modem.record.ModemCmd("AT+CSQ", reply), row.result); }));
        EXPECT_EQ(reply, row.reply);
        EXPECT_TRUE(IsUnlocked());
    }
}

constexpr int kCommands = 25;

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

constexpr unsigned int kKey = 7;  // the appliance root has semaphores of its own

TEST(Semaphore, IsOneSetOfOneSemaphoreWithValueOneForEverybody) {
    umask(077);  // permissions do not depend on who comes first
    int first = -1;
    int second = -1;
    EXPECT_EQ(Semaphore(kKey).Get(&first), 0);
    EXPECT_EQ(Semaphore(kKey).Get(&second), 0);
    EXPECT_EQ(first, second);
    EXPECT_EQ(first, semget(kKey, 1, 0));
    semid_ds description{};
    ASSERT_EQ(semctl(first, 0, IPC_STAT, &description), 0);
    EXPECT_EQ(description.sem_nsems, 1u);
    EXPECT_EQ(description.sem_perm.mode & 0777, 0666);
    EXPECT_EQ(semctl(first, 0, GETVAL), 1);
}

TEST(Semaphore, IsNotWaitedForForEver) {
    ASSERT_EQ(Semaphore(kKey).Enter(), 0);
    LogCapture log;
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_EQ(Semaphore(kKey).Enter(), -1);
    const auto waited = std::chrono::steady_clock::now() - begin;
    EXPECT_TRUE(log.Has(" errno " + std::to_string(EAGAIN))) << log.Text();
    EXPECT_GE(waited, std::chrono::seconds(4));  // an exchange that takes its time
    EXPECT_LT(waited, std::chrono::seconds(15));
}

}  // namespace
}  // namespace taviwireless::test
