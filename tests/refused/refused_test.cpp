// SPDX-License-Identifier: MIT
// What happens when the system refuses something: every system call that can fail, and every
// allocation of C++, fails once in every public function and in every command that writes.
//
// What is looked at afterwards is the same for all of them, and what was done without a fault is
// the measure. Who gives the same result must have had the same effect. Who does not must leave
// each file as it was, or as it was to be, and no descriptor, no child and no file of his own; a
// command says one sentence.
//
// Each case prints what it tried, a line for each function and each command:
//   NAME  CALLS  TRIED  SAME  TOLD
// CALLS is the number of system calls that can fail, or of allocations, of a run without a fault;
// TRIED the number of runs with one; SAME those with the same result, TOLD those with another one.
//
// Tried is a sample: every second of the first calls of a name on a file in a case, of commands those that
// change something, and the first call of each row, with one error; and of allocations number 0, 1,
// 10, 100 and so on. With TAVI_REFUSED=all it is every call of each row, with several errors, and
// every allocation.
#include <gtest/gtest.h>
#include <sys/wait.h>

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <regex>
#include <set>

#include "base/split.h"
#include "tests/support/descriptors.h"
#include "tests/support/failing_memory.h"
#include "tests/support/public_calls.h"
#include "tests/support/system_calls.h"

namespace taviwireless::test {

// For the names of cases.
void PrintTo(Needs needs, std::ostream* out) {
    *out << "surroundings " << static_cast<int>(needs);
}

namespace {

const bool kAll = getenv("TAVI_REFUSED") != nullptr;

// ---- What is looked at ----

using State = std::map<std::string, std::string>;  // mode and content by path

constexpr const char* kFolders[] = {"/usr/tavi",  "/etc/hostapd", "/etc/sysconfig",    "/etc/dhcpd",
                                    "/etc/dhcpc", "/etc/ppp",     "/var/lib/usbmodem", "/var/tmp",
                                    "/tmp",       "/run",         "/dev/shm"};

// Process numbers and times differ from run to run, and the names of what stands for a descriptor.
std::string WithoutNumbers(const std::string& text, size_t shortest = 3) {
    constexpr char kDigits[] = "0123456789";
    std::string result;
    for (size_t begin = 0, end; begin < text.size(); begin = end) {
        const size_t digits = text.find_first_of(kDigits, begin);
        end = std::min(text.find_first_not_of(kDigits, digits), text.size());
        result += text.substr(begin, digits - begin);
        if (digits < text.size()) {
            result += end - digits < shortest ? text.substr(digits, end - digits) : "#";
        }
    }
    return result;
}

// Of the test's stand-ins: what they were asked, and the state of what they stand for.
bool IsOfTheTest(const std::string& path) {
    static const std::set<std::string> kFiles = {"/tmp/commands", "/tmp/arguments",
                                                 "/tmp/started",  "/tmp/associated",
                                                 "/tmp/master",   "/tmp/usbmodem.info1"};
    return kFiles.count(path) > 0 || path.find("/run/lock/LCK") == 0;
}

State LookAround() {
    State state;
    for (const char* folder : kFolders) {
        std::error_code gone;
        for (const auto& entry : std::filesystem::recursive_directory_iterator(folder, gone)) {
            struct stat status {};
            if (IsOfTheTest(entry.path()) || lstat(entry.path().c_str(), &status) != 0) {
                continue;
            }
            std::ostringstream mode, text;
            mode << std::oct << status.st_mode << ' ';
            std::ifstream file(S_ISREG(status.st_mode) ? entry.path().c_str() : "/dev/null");
            if (file.peek() != EOF) {
                text << file.rdbuf();
            }
            const bool isOfProcess = entry.path().string().find("pid") != std::string::npos;
            state[entry.path()] = mode.str() + WithoutNumbers(text.str(), isOfProcess ? 1 : 3);
        }
    }
    return state;
}

std::string EntryOf(const State& state, const std::string& path) {
    const auto found = state.find(path);
    return found == state.end() ? "" : found->second;
}

struct Result {
    std::string text;              // what is compared
    std::set<std::string> opened;  // descriptors: the bus keeps one
    std::string trouble;           // what may never be; empty: nothing
    WatchedRun run;
    State state;
};

// Whether the state of a file is one that a run which did not do its work may leave.
bool MayBeLeft(const std::string& path, const std::string& now, const std::string& before,
               const std::string& after) {
    // Its lines are set one by one.
    static const std::regex kSetByLines(
        "/etc/sysconfig/network-scripts/ifcfg-[^.]*|/var/lib/usbmodem/wvdial.log.*");
    // Made anew each time; half of one is none.
    static const std::regex kMadeAnew(
        "/etc/(hostapd|dhcpd|dhcpc)/[^.].*|/tmp/[^.].*|/run/.*|"
        "/var/tmp/.*|/usr/tavi/etc/wpa_supplicant.conf");
    if (now == before || (now.empty() && std::regex_match(path, kMadeAnew))) {
        return true;
    }
    std::istringstream lines(now);
    bool isMixed = std::regex_match(path, kSetByLines);
    for (std::string line; std::getline(lines, line);) {
        isMixed = isMixed && (before + '\n' + after).find(line) != std::string::npos;
    }
    return isMixed;
}

// What is wrong after a run with a fault; empty if nothing.
std::string Judge(const State& before, const Result& good, const Result& result) {
    const bool isSame = result.text == good.text;
    State paths = before;
    paths.insert(good.state.begin(), good.state.end());
    paths.insert(result.state.begin(), result.state.end());
    std::string trouble = result.trouble;
    for (const auto& entry : paths) {
        const std::string& path = entry.first;
        const std::string now = EntryOf(result.state, path);
        const std::string old = EntryOf(before, path);
        const std::string whole = EntryOf(good.state, path);
        if (now != whole && (isSame || !MayBeLeft(path, now, old, whole))) {
            trouble +=
                "  " + path + (isSame ? " is not as it should be: " : " is neither: ") + now + "\n";
        }
    }
    for (const std::string& descriptor : result.opened) {
        trouble += good.opened.count(descriptor) > 0 ? "" : "  " + descriptor + " was left open\n";
    }
    for (const std::string& left : result.run.left) {
        trouble += "  " + left + " was left running\n";
    }
    return trouble;
}

// ---- What is tried ----

// The first error is the most likely one.
const std::vector<int>& ErrorsOf(const std::string& call) {
    static const std::pair<std::set<std::string>, std::vector<int>> kErrors[] = {
        {{"open", "openat"}, {EMFILE, EIO, ENOSPC}},
        {{"write", "pwrite64", "writev", "ftruncate"}, {ENOSPC, EDQUOT, EIO}},
        {{"fsync", "fdatasync"}, {EIO, ENOSPC}},
        {{"rename", "renameat", "link", "linkat", "symlink", "mkdir", "mkdirat"}, {ENOSPC, EIO}},
        {{"unlink", "unlinkat", "rmdir", "kill", "chmod", "fchmod", "chown", "fchown"}, {EPERM}},
        {{"fork", "vfork", "clone", "clone3"}, {EAGAIN}},
        {{"execve"}, {ENOMEM, EACCES}},
        {{"pipe2", "socket", "socketpair", "memfd_create", "dup", "inotify_init1"}, {EMFILE}},
        {{"flock", "fcntl", "fcntl64"}, {ENOLCK}},
        {{"semget"}, {ENOSPC, EACCES}},
        {{"semop", "semtimedop", "semctl"}, {EIDRM}},
        {{"connect"}, {ECONNREFUSED}},
        {{"sendto", "sendmsg", "recvfrom", "recvmsg"}, {ENOBUFS}},
        {{"wait4"}, {EINTR}},
        {{"poll", "ppoll", "select", "pselect6"}, {ENOMEM, EINTR}},
    };
    static const std::vector<int> kUsual = {EIO};
    for (const auto& [calls, errors] : kErrors) {
        if (calls.count(call) > 0) {
            return errors;
        }
    }
    return kUsual;
}

// Of functions, the rest is seldom refused; of commands, functions that they call show it.
bool IsInSample(const std::string& call, bool isOfCommand) {
    static const std::set<std::string> kMinor = {"fcntl", "fcntl64", "newfstatat", "fstat",
                                                 "statx", "access",  "setsockopt", "chdir"};
    static const std::set<std::string> kChanging = {
        "write",  "fsync",  "rename", "renameat", "unlink", "unlinkat", "mkdir", "clone",
        "clone3", "execve", "pipe2",  "flock",    "fchmod", "fchown",   "vfork", "kill"};
    return isOfCommand ? kChanging.count(call) > 0 : kMinor.count(call) == 0;
}

// `tried` has the calls that were tried in the rows before.
std::vector<Fault> FaultsFor(const std::vector<SystemCall>& calls, std::set<std::string>& tried,
                             bool isOfCommand) {
    static int turn = 0;
    std::vector<Fault> faults;
    for (const SystemCall& call : calls) {
        const bool isFirst = tried.insert(call.name + WithoutNumbers(call.subject)).second;
        const bool isNext = isFirst && IsInSample(call.name, isOfCommand) && ++turn % 2 == 0;
        const bool isInSample = isNext || faults.empty();
        if ((kAll || isInSample) && !IsOfTheTest(call.subject)) {
            for (const int error : ErrorsOf(call.name)) {
                faults.push_back({call.name, call.number, error});
                if (!kAll) {
                    break;
                }
            }
        }
    }
    return faults;
}

// A row of the table.
class Tally {
  public:
    Tally(const std::string& name, const State& before, const Result& good, size_t calls)
        : name_(name), before_(before), good_(good), calls_(calls) {}
    ~Tally() {
        printf("%-52s %6zu %6d %6d %6d\n", name_.c_str(), calls_, tried_, same_, tried_ - same_);
    }

    void Add(const Result& result, const std::string& fault) {
        ++tried_;
        same_ += result.text == good_.text ? 1 : 0;
        const std::string trouble = Judge(before_, good_, result);
        EXPECT_TRUE(trouble.empty()) << name_ << ": " << fault << " gives " << result.text << "\n"
                                     << trouble;
    }

  private:
    const std::string name_;
    const State& before_;
    const Result& good_;
    const size_t calls_;
    int tried_ = 0;
    int same_ = 0;
};

// Results that say more than was done, on purpose: when that was refused, with these files.
struct Documented {
    std::regex names, subjects, files;
};

// Makes such files in `state` what they are without a fault.
void ForgetDocumented(const std::string& name, const std::string& subject, const State& good,
                      State& state) {
    static const Documented kRows[] = {
        // A radio whose setting cannot be read leaves nothing to do.
        {std::regex("TAVIWireless(NetworkConnect|AutoConnect)|.* wifi (connect|auto)"),
         std::regex("(/tmp/)?wireless.info|/tmp/?|/usr/tavi/etc/?|.*wireless_ap.conf|memory"),
         std::regex("/var/tmp/.wireless_current_connection|/usr/tavi/etc/wpa_supplicant.conf")},
        // A model that cannot be asked offers no network for guests.
        {std::regex("TAVIWirelessAPEnable|TAVIWirelessSetHostAPConf|.* ap enable"),
         std::regex("/etc.defaults.*|taviinfo.conf|memory"), std::regex("/etc/hostapd/.*-guest.*")},
        // Only the DHCP service can fail it: the command line looks what is left. A bridge that
        // comes up without members serves nobody.
        {std::regex("TAVIWirelessAPDisable"), std::regex(".*"),
         std::regex("/etc/(hostapd/.*|sysconfig/.*|dhcpd/.*)")},
        {std::regex(".* ap disable"), std::regex(".*ifcfg-lbr0.*|memory"),
         std::regex("/etc/(sysconfig|dhcpd)/.*")},
        // What cannot be looked at is not connected.
        {std::regex("TAVIWirelessNetworkDisconnect_core"),
         std::regex("(socket:.*)?|/sys/class/net.*|/etc/dhcpc.*|dhcpcd-wlan0.pid"),
         std::regex("/var/tmp/.wireless_current_connection|/etc/dhcpc/.*")},
        // A connection without a way back is better than none.
        {std::regex(".*::BackupDefaultRoute"), std::regex(".*"), std::regex("/etc/ppp/.*")},
        // There was a process; what became of it tells the log, or the next look at the link.
        {std::regex(".*(::NetConnect|::BackgroundExec| modem connect)"), std::regex(".*"),
         std::regex("/var/lib/usbmodem/(log|pid|usbmodem.pid.*|wvdial.log.*)")},
        // What the modem does not tell has no default.
        {std::regex(".*(::ResetProfile|::SetProfileToDefault| profile reset)"),
         std::regex("/dev/pts/.*|/usr/tavi/etc/usbmodem/.*|"), std::regex(".*/usbmodem.profile.*")},
        {std::regex(".*::TestConfToFile"), std::regex(".*"), std::regex(".*usbmodem.conf.1")},
    };
    for (const auto& [names, subjects, files] : kRows) {
        if (!std::regex_match(name, names) || !std::regex_match(subject, subjects)) {
            continue;
        }
        State copy;
        for (const State* of : {&std::as_const(state), &good}) {
            for (const auto& entry : *of) {
                if (std::regex_match(entry.first, files) == (of == &good)) {
                    copy.insert(entry);
                }
            }
        }
        state = copy;
    }
}

// What was to be removed and could not be: nobody can help that.
void ForgetRefusedRemoval(const SystemCall& struck, const State& good, State& state) {
    for (const char* call : {"unlink", "unlinkat", "rmdir"}) {
        for (auto entry = state.begin(); struck.name == call && entry != state.end();) {
            const size_t end = entry->first.rfind(struck.subject);
            const bool isIt = end != std::string::npos && good.count(entry->first) == 0 &&
                              end + struck.subject.size() == entry->first.size();
            entry = isIt ? state.erase(entry) : std::next(entry);
        }
    }
}

// Tries the calls behind the first `skipped`.
void RefuseEach(const std::string& name, const State& before, size_t skipped,
                std::set<std::string>& tried,
                const std::function<Result(const std::optional<Fault>&)>& attempt) {
    const Result good = attempt(std::nullopt);
    ASSERT_EQ(good.trouble, "") << name << " gives " << good.text;
    auto calls = good.run.calls;
    calls.erase(calls.begin(), calls.begin() + std::min(skipped, calls.size()));
    Tally tally(name, before, good, calls.size());
    for (const Fault& fault : FaultsFor(calls, tried, skipped > 0)) {
        Result result = attempt(fault);
        const SystemCall struck = result.run.struck.value_or(SystemCall{fault.call, 0, "never"});
        ForgetDocumented(name, struck.subject, good.state, result.state);
        if (name == "dbus::DBusServer::StartLoop" && struck.subject.find("socket:") == 0 &&
            result.trouble == "  ended with 256\n") {
            result.trouble.clear();  // without its bus a program of libdbus exits
        }
        ForgetRefusedRemoval(struck, good.state, result.state);
        tally.Add(result, fault.call + " " + std::to_string(fault.number) + " of " +
                              struck.subject + ": " + strerrorname_np(fault.error));
    }
}

// ---- Functions ----

constexpr char kNext = '\1';  // between what a call leaves

// What the function returns, and what it leaves in its process.
std::string CallAndLook(const PublicCall& call, Surroundings& around) {
    const auto before = OpenDescriptors();
    CountMyCalls(true);
    std::string text = call.run(around);
    CountMyCalls(false);
    text += kNext;
    text += waitpid(-1, nullptr, WNOHANG) >= 0 ? "  a child was left\n" : "";
    text += kNext;
    for (const auto& [number, target] : OpenDescriptors()) {
        if (before.count(number) == 0) {
            text += WithoutNumbers(target) + kNext;
        }
    }
    return text;
}

Result ResultOf(const ChildResult& child) {
    const std::vector<std::string> parts = Split(child.text, kNext);
    if (parts.size() < 2) {
        return {child.text, {}, "  ended with " + std::to_string(child.status) + "\n", {}, {}};
    }
    return {parts[0], {parts.begin() + 2, parts.end()}, parts[1], {}, {}};
}

// A dialler, a DHCP client.
const std::set<std::string> kMayStay = {"sleep", "udhcpc"};

class Refused : public testing::TestWithParam<Needs> {
  protected:
    Refused() : around_(GetParam()), before_(Look()) {}

    // Takes time, and most failures come before anything is changed.
    void Arrange(const std::string& sim) {
        const bool isAllInFiles = GetParam() == Needs::kAdapter;
        const bool isTouched = Exists("/tmp/started") || Exists("/tmp/associated") ||
                               Exists("/tmp/master") || Look() != before_;
        if (!isAllInFiles || isTouched) {
            around_.Arrange(sim);
        }
    }

    Result Call(const PublicCall& call, const std::optional<Fault>& fault) {
        Arrange(call.sim);
        ChildResult child;
        const WatchedRun run =
            WatchCalls([&] { child = InChild([&] { return CallAndLook(call, around_); }); }, fault,
                       "/proc/self/exe", kMayStay);
        Result result = ResultOf(child);
        result.run = run;
        result.state = Look();
        return result;
    }

    // The service's files are not the caller's doing.
    State Look() const {
        const bool isServed =
            GetParam() == Needs::kService || GetParam() == Needs::kServedConnection;
        return isServed ? State() : LookAround();
    }

    Surroundings around_;
    const State before_;
    std::set<std::string> tried_;
};

TEST_P(Refused, CallsOfFunctions) {
    for (const PublicCall& call : PublicCalls()) {
        if (call.needs == GetParam()) {
            RefuseEach(call.name, before_, 0, tried_,
                       [&](const auto& fault) { return Call(call, fault); });
        }
    }
}

// ---- Memory ----

struct MemoryResult {
    Result result;
    bool hasFailed;
    int left;  // allocations
};

// With that many allocations that succeed before one that does not, in a child.
std::string CallWithMemory(const PublicCall& call, Surroundings& around, int count) {
    std::string text, trouble;
    LogCapture* log = call.needs >= Needs::kAdapter ? &around.Adapter().log : nullptr;
    for (int line = 0; line < 100; ++line) {
        LogCapture::Record(0, "");  // so that it need not grow
    }
    if (log != nullptr) {
        log->Clear();
    }
    AllocationsLeft();
    FailAllocationAfter(count);
    try {
        text = call.run(around);
    } catch (const std::bad_alloc&) {
        trouble = call.name.find("TAVI") == 0 ? "  an exception left a C function\n" : "";
    }
    const bool hasFailed = HasAllocationFailed();
    if (log != nullptr) {
        log->Clear();
    }
    const int left = AllocationsLeft() - (text.capacity() > std::string().capacity() ? 1 : 0);
    return text + kNext + trouble + kNext + (hasFailed ? "1" : "0") + kNext + std::to_string(left);
}

MemoryResult ResultWithMemory(const ChildResult& child) {
    const std::vector<std::string> parts = Split(child.text, kNext);
    if (parts.size() < 4) {
        return {ResultOf(child), true, 0};
    }
    return {{parts[0], {}, parts[1], {}, {}}, parts[2] == "1", std::stoi(parts[3])};
}

// Until none fails.
void FailEachAllocation(const std::string& name, const State& before,
                        const std::function<MemoryResult(int)>& attempt) {
    const MemoryResult good = attempt(INT_MAX);
    std::vector<std::pair<int, MemoryResult>> tried;
    int step = 1;
    for (int count = 0; tried.empty() || tried.back().second.hasFailed; count += step) {
        tried.emplace_back(count, attempt(count));
        step = kAll ? 1 : std::max(1, 9 * count);
    }
    Tally tally(name, before, good.result, tried.back().first);
    tried.pop_back();
    for (auto& [count, run] : tried) {
        constexpr int kKeptIndex = 6;  // of the sections of a file, in each thread
        ForgetDocumented(name, "memory", good.result.state, run.result.state);
        if (run.left > std::max(good.left, kKeptIndex)) {
            run.result.trouble += "  leaks memory\n";
        }
        tally.Add(run.result, "allocation " + std::to_string(count));
    }
}

// Not with modems: the library of the serial line, which is linked into ours, ends the process
// where its destructors have no memory.
TEST_P(Refused, MemoryOfFunctions) {
    for (const PublicCall& call : PublicCalls()) {
        const bool hasChannel = GetParam() >= Needs::kModem && GetParam() <= Needs::kDialled;
        if (call.needs == GetParam() && !hasChannel) {
            FailEachAllocation(call.name, before_, [&](int count) {
                Arrange(call.sim);
                MemoryResult run =
                    ResultWithMemory(InChild([&] { return CallWithMemory(call, around_, count); }));
                run.result.state = Look();
                return run;
            });
        }
    }
}

// ---- Commands ----

std::string ProgramOf(const CommandCall& call) {
    return BuiltProgram(call.IsOfModems() ? "taviwireless" : "taviwireless_with_wifi");
}

// The calls that a program makes before its main(): those of libraries that begin by themselves.
size_t CallsBeforeMain(const CommandCall& call) {
    CommandCall nothing = call;
    nothing.arguments = {"--version"};
    const auto calls =
        WatchCalls([&] { RunProgram(nothing.Argv()); }, std::nullopt, ProgramOf(call)).calls;
    const auto isOutput = [](const SystemCall& made) { return made.subject.find("/memfd:") == 0; };
    return std::find_if(calls.begin(), calls.end(), isOutput) - calls.begin();
}

std::vector<std::string> ArgvOf(const CommandCall& call) {
    std::vector<std::string> argv = call.Argv();
    if (call.name == "modem connect") {
        argv.insert(argv.end(), {"--timeout", "15"});
    }
    return argv;
}

Result ResultOf(const RunResult& run, const std::optional<SystemCall>& struck, bool isFaulty) {
    Result result;
    result.text = run.status == 0 ? "done" : std::to_string(run.status) + ": " + run.err;
    static const std::regex kSentence("taviwireless: [^\n]+\n");
    constexpr int kNoService = 5;  // the last of the exit statuses
    const bool isSpeechless = struck && struck->subject.find("/memfd:") == 0;
    if (run.status > kNoService || (!isFaulty && run.status != 0)) {
        result.trouble = "  fails\n";
    } else if (run.status != 0 && !isSpeechless && !std::regex_match(run.err, kSentence)) {
        result.trouble = "  says no sentence: " + run.err + "\n";
    }
    return result;
}

Result RunCommand(const CommandCall& call, const std::optional<Fault>& fault) {
    RunResult run{};
    const WatchedRun watched = WatchCalls([&] { run = RunProgram(ArgvOf(call), call.input); },
                                          fault, ProgramOf(call), kMayStay);
    Result result = ResultOf(run, watched.struck, fault.has_value());
    result.run = watched;
    return result;
}

TEST_P(Refused, CallsOfCommands) {
    for (const CommandCall& call : CommandCalls()) {
        if (call.needs == GetParam() && call.writes) {
            RefuseEach("taviwireless " + call.name, before_, CallsBeforeMain(call), tried_,
                       [&](const auto& fault) {
                           Arrange(call.sim);
                           Result result = RunCommand(call, fault);
                           result.state = Look();
                           return result;
                       });
        }
    }
}

RunResult RunWithMemory(std::vector<std::string> argv, const std::string& input, int count) {
    const auto preload = std::find_if(argv.begin(), argv.end(), [](const std::string& argument) {
        return argument.find("LD_PRELOAD=") == 0;
    });
    *preload += ":libtavi_failing_memory_of_program.so";
    argv.insert(preload, "TAVI_ALLOCATIONS=" + std::to_string(count));
    return RunProgram(argv, input);
}

// How many allocations the command line makes before it turns to a command.
int AllocationsOfAnyCommand() {
    int tooFew = 0, enough = 1 << 16;
    while (enough - tooFew > 1) {
        const int count = (tooFew + enough) / 2;
        const std::vector<std::string> argv =
            WithShortWaits({BuiltProgram("taviwireless"), "--version"});
        (RunWithMemory(argv, "", count).status == 0 ? enough : tooFew) = count;
    }
    return enough;
}

TEST_P(Refused, MemoryOfCommands) {
    const int first = AllocationsOfAnyCommand();
    for (const CommandCall& call : CommandCalls()) {
        if (call.needs != GetParam() || !call.writes) {
            continue;
        }
        const std::string name = "taviwireless " + call.name;
        const auto attempt = [&](int count) {
            Arrange(call.sim);
            Result result =
                ResultOf(RunWithMemory(ArgvOf(call), call.input, count), {}, count < INT_MAX);
            result.state = Look();
            return result;
        };
        const Result good = attempt(INT_MAX);
        Tally tally(name, before_, good, 0);
        constexpr int kEnough = 10;  // that made no difference: there are no more
        for (int count = 1, same = 0; same < (kAll ? kEnough : 1); count *= kAll ? 1 : 8) {
            Result result = attempt(first + count);
            same = result.text == good.text ? same + 1 : 0;
            ForgetDocumented(name, "memory", good.state, result.state);
            tally.Add(result, "allocation " + std::to_string(count));
            count += kAll ? 1 : 0;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(With, Refused, testing::ValuesIn(kAllNeeds), [](const auto& needs) {
    return std::to_string(static_cast<int>(needs.param));
});

}  // namespace
}  // namespace taviwireless::test
