// SPDX-License-Identifier: MIT
// Somebody without rights who is on the machine, too, is first at every path of ours in a folder in
// which he may write. Nobody may notice: what is called gives what it gives without him.
#include <fcntl.h>
#include <sys/file.h>
#include <sys/sem.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <regex>
#include <set>

#include "base/split.h"
#include "base/unique_pipe.h"
#include "platform/host_root/network/paths.h"
#include "tests/support/public_calls.h"
#include "usbmodem/rules/paths.h"
#include "wireless/rules/paths.h"

namespace taviwireless::test {
namespace {

using testing::AnyOf;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;
namespace fs = std::filesystem;

constexpr uid_t kNeighbour = 65534;
constexpr key_t kKey = 1;          // of the lock of modem 1
constexpr char kSeconds[] = "15";  // that a call may take, as busy as the machine may be
constexpr size_t kParts = 3;       // of the calls, tried beside each other
constexpr char kNowhere[] = "/etc/nowhere";
constexpr char kVictim[] = "/etc/victim";

// What would be believed if it counted: an info file, an adapter, a network, a gateway. It begins
// with what a lock file would have, the number of a process that lives.
const std::string kLies =
    "10.66.66.66\n2\n5\n8\n0:1:2:3:4:5\nPRODUCT=foreign\nAP_SUPPORT=yes\nCONNECTNODE=0\n"
    "DEVICENODE=0,1\nUSB_ID_VENDOR=2001\n";

std::string LiesFor(const std::string& path) {
    return (path.find("LCK") != std::string::npos ? "         1\n" : "") + kLies;
}

// Every path of ours that others could have, too: of two modems, one of which is plugged in.
std::set<std::string> OurPaths() {
    std::set<std::string> paths(std::begin(wireless::kPathsAmongOthers),
                                std::end(wireless::kPathsAmongOthers));
    for (const auto& more : {usbmodem_lib::PathsAmongOthers(1, "ttyUSB1"),
                             usbmodem_lib::PathsAmongOthers(2, "ttyUSB0"),
                             network::PathsAmongOthers("wlan0", "lbr0")}) {
        paths.insert(more.begin(), more.end());
    }
    return paths;
}

// Those in folders in which others can write, with something at them or without.
std::set<std::string> ShakyPaths(bool isTaken) {
    std::set<std::string> paths;
    for (const std::string& path : OurPaths()) {
        if ((FileMode(fs::path(path).parent_path()) & S_IWOTH) != 0 && Exists(path) == isTaken) {
            paths.insert(path);
        }
    }
    return paths;
}

void TakeSemaphore(const std::string& /*path*/) {
    sembuf take{0, -1, 0};
    const int set = semget(kKey, 1, IPC_CREAT | 0666);
    semctl(set, 0, SETVAL, 1);
    semop(set, &take, 1);
}

const struct Obstacle {
    const char* name;
    void (*put)(const std::string& path);
} kObstacles[] = {
    {"Pipe", [](const std::string& path) { mkfifo(path.c_str(), 0666); }},
    {"Folder", [](const std::string& path) { WriteFile(path + "/in", kLies); }},
    {"Link", [](const std::string& path) { fs::create_symlink(kVictim, path); }},
    {"DanglingLink", [](const std::string& path) { fs::create_symlink(kNowhere, path); }},
    {"File", [](const std::string& path) { WriteFile(path, LiesFor(path)); }},
    {"HugeFile",
     [](const std::string& path) {
         WriteFile(path, LiesFor(path));
         fs::resize_file(path, 3LL << 30);
     }},
    {"HeldLock",
     [](const std::string& path) {
         WriteFile(path, LiesFor(path));
         const int file = open(path.c_str(), O_RDWR);
         struct flock whole {};
         whole.l_type = F_WRLCK;
         fcntl(file, F_SETLK, &whole);
         flock(file, LOCK_EX);
     }},
    {"TakenSemaphore", TakeSemaphore},
};

// The neighbour, who has put his obstacle at these paths and lives on. What is left of it goes with
// him.
class Siege {
  public:
    Siege(const Obstacle& obstacle, const std::set<std::string>& paths) : paths_(paths) {
        Clear();
        UniquePipe done;
        pid_ = fork();
        if (pid_ == 0) {
            umask(0);
            if (setgid(kNeighbour) == 0 && setuid(kNeighbour) == 0) {
                PutAll(obstacle);
                [[maybe_unused]] const ssize_t count = write(done.writeEnd.Get(), "", 1);
                pause();
            }
            _exit(1);
        }
        char byte;
        done.writeEnd.Close();
        EXPECT_EQ(read(done.readEnd.Get(), &byte, 1), 1) << obstacle.name;
    }
    ~Siege() {
        kill(pid_, SIGKILL);
        waitpid(pid_, nullptr, 0);
        semctl(semget(kKey, 1, 0), 0, IPC_RMID);
        Clear();
    }

  private:
    void Clear() const {
        for (const std::string& path : paths_) {
            fs::remove_all(path);
        }
    }
    void PutAll(const Obstacle& obstacle) const noexcept {
        std::for_each(paths_.begin(), paths_.end(), obstacle.put);
    }

    const std::set<std::string> paths_;
    pid_t pid_;
};

// All that a call gives, or a command tells.
std::string Result(const PublicCall& call, Surroundings& around) {
    const ChildResult result =
        InChild([&] { return call.run(around); }, std::chrono::seconds(atoi(kSeconds)));
    // These tell whether there is anything, whoever's.
    const bool isAsked =
        call.name == "TAVIWirelessTestAPMode" || call.name == "usbmodem_lib::USBModem::IsInfoExist";
    EXPECT_EQ(result.status, 0);
    return isAsked ? "" : result.text;
}

std::string Result(const CommandCall& command, Surroundings&) {
    std::vector<std::string> argv = command.Argv();
    argv.insert(argv.begin(), {"timeout", kSeconds});
    const RunResult result = RunProgram(argv, command.input);
    EXPECT_LT(result.status, 6);
    // The first two may be ended before they have shown anything, the third tells of obstacles.
    if (command.name == "modem watch" || command.name == "wifi watch" || command.name == "doctor") {
        return "";
    }
    // A failure looks like that of a function.
    const std::string text = std::to_string(-result.status) + ' ' + result.out + result.err;
    return std::regex_replace(text, std::regex("after [0-9.]+ s"), "");
}

struct BesiegedMachine : testing::Test {
    BesiegedMachine() {
        for (const char* folder : {"/tmp", "/var/tmp", "/var/lock"}) {
            chmod(folder, 0777);  // the kernel protects links and pipes in sticky folders alone
        }
        WriteFile(kVictim, kLies);
        chmod(kVictim, 0640);
        setenv("TAVI_LOCK_IS_KEPT", "yes", 1);
    }
};

// Calls meet obstacles in turns, unless all are wanted.
const bool kAll = getenv("TAVI_NEIGHBOUR") != nullptr;
constexpr int kEachOf = 3;
int turn = 0;

struct Besieged : BesiegedMachine, testing::WithParamInterface<std::tuple<Needs, size_t>> {
    template <typename Call>
    void TryThose(const std::vector<Call>& calls) {
        TAVI_NEEDS_A_STRANGER()
        const auto [needs, begin] = GetParam();
        std::optional<Surroundings> around;
        for (size_t i = begin; i < calls.size(); i += kParts) {
            if (calls[i].needs == needs) {
                Try(calls[i], around ? *around : around.emplace(needs));
            }
        }
    }
    // With the neighbour at all names that are free, and then at one more, which a file of ours
    // had, if the call looks at it: what it gives without that file is then expected.
    template <typename Call>
    void Try(const Call& call, Surroundings& around) {
        around.Arrange(call.sim);
        const std::set<std::string> free = ShakyPaths(false);
        const std::string usual = Try(call, around, free);
        EXPECT_THAT(usual, Not(AnyOf(StartsWith("-"), HasSubstr("(err)")))) << call.name;
        for (const std::string& path : ShakyPaths(true)) {
            around.Arrange(call.sim);
            const std::string text = ReadFile(path);
            fs::remove(path);
            if (around.Service() == nullptr && Result(call, around) != usual) {
                std::set<std::string> paths = free;
                paths.insert(path);
                Try(call, around, paths);
            }
            WriteFile(path, text);
        }
    }
    template <typename Call>
    std::string Try(const Call& call, Surroundings& around, const std::set<std::string>& paths) {
        const std::string expected = Result(call, around);
        // Where a network is joined already, there is nothing to join.
        const bool isRepeatable = Result(call, around) == expected && call.name != "wifi auto";
        for (const Obstacle& obstacle : kObstacles) {
            if (!kAll && ++turn % kEachOf != 0) {
                continue;
            }
            SCOPED_TRACE(call.name + " " + obstacle.name);
            if (!isRepeatable) {
                around.Arrange(call.sim);
            }
            const Siege siege(obstacle, paths);
            const std::string result = Result(call, around);
            if (obstacle.put != TakeSemaphore) {  // then a modem cannot be asked
                EXPECT_EQ(result, expected);
            }
            EXPECT_EQ(ReadFile(kVictim), kLies);
            EXPECT_EQ(FileMode(kVictim), 0640u);
            EXPECT_FALSE(Exists(kNowhere));
        }
        return expected;
    }
};

TEST_P(Besieged, FunctionsGiveTheSame) {
    TryThose(PublicCalls());
}
TEST_P(Besieged, CommandsTellTheSame) {
    TryThose(CommandCalls());
}
std::string NameOf(const testing::TestParamInfo<Besieged::ParamType>& info) {
    const auto [needs, part] = info.param;
    return std::to_string(static_cast<int>(needs)) + "Part" + std::to_string(part);
}
INSTANTIATE_TEST_SUITE_P(Needs, Besieged,
                         testing::Combine(testing::ValuesIn(kAllNeeds),
                                          testing::Range<size_t>(0, kParts)),
                         NameOf);

TEST_F(BesiegedMachine, AServiceStartsAndServesTheModemThatIsThere) {
    TAVI_NEEDS_A_STRANGER()
    PrivateBus bus;
    ModemSimulator simulator({"--modem", "12d1,id=1,ports=dial/at"});
    for (const Obstacle& obstacle : kObstacles) {
        SCOPED_TRACE(obstacle.name);
        const Siege siege(obstacle, ShakyPaths(false));
        ModemService service;
        EXPECT_TRUE(service.Lists({"usbmodem1"}));
        EXPECT_EQ(service.End(), 0);
    }
}

TEST(OurPaths, HoldAllThatStandsInTheSources) {
    const std::set<std::string> paths = OurPaths();
    const std::string named = Shell(
        "cd '" TAVI_SOURCE_DIR
        "' && grep -rhoE --include='*.cpp' --include='*.h' '\"[^\"]*\"' base"
        " cli common daemon dbus include platform/host_root platform/linux usbmodem wireless |"
        " grep -oE '/(tmp|var/tmp|var/lock|var/run|run|dev/shm)/[a-zA-Z0-9._-]*[a-zA-Z0-9]' | sort "
        "-u");
    for (const std::string& path : Lines(named)) {
        if (path.find("XXXXXX") != path.npos || path == "/run/user") {
            continue;  // a name that nobody knows before; where everybody has a folder of his own
        }
        const auto next = paths.lower_bound(path);
        EXPECT_TRUE(next != paths.end() && next->rfind(path, 0) == 0) << path;
    }
}

}  // namespace
}  // namespace taviwireless::test
