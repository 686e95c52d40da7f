// SPDX-License-Identifier: MIT
// Programs that are killed at any of their system calls: stores are the old ones or the new ones
// whole, and the next command works. Programs that stop with a lock: others end with a sentence.
#include <fcntl.h>
#include <sys/file.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <taviwireless/usbmodem_client.h>

#include <random>
#include <set>

#include "base/split.h"
#include "tests/platform/host_root/root_scripts.h"
#include "tests/support/public_calls.h"
#include "tests/support/system_calls.h"
#include "tests/support/wait.h"

namespace taviwireless::test {

static void PrintTo(const CommandCall& command, std::ostream* text) {
    *text << command.name;
}

namespace {

// The calls at which a program is killed: those that change something outside of it, of those that
// make files one of each kind; with TAVI_EVERY_CALL=N every Nth call of all, from a random one on.
std::vector<SystemCall> Chosen(const std::vector<SystemCall>& calls) {
    std::vector<SystemCall> chosen;
    if (const char* every = getenv("TAVI_EVERY_CALL")) {
        const size_t step = std::stoul(every);
        for (size_t i = std::random_device()() % step; i < calls.size(); i += step) {
            chosen.push_back(calls[i]);
        }
        return chosen;
    }
    static const std::set<std::string> kChanging = {"rename", "renameat", "vfork"};
    static const std::set<std::string> kMaking = {"write", "unlink", "unlinkat", "fchmod",
                                                  "mkdir", "kill",   "semctl",   "semtimedop"};
    std::set<std::string> kinds;
    for (const auto& [name, number, subject] : calls) {
        // Every file is replaced by the same calls.
        const bool isDraft =
            subject.find(".lock") != std::string::npos || subject.find(".new") != std::string::npos;
        const bool isOwn = subject.find("pipe:") == 0 || subject.find("/memfd") == 0;
        const bool isNew = kMaking.count(name) != 0 && !isOwn &&
                           kinds.insert(name + (isDraft ? "" : subject)).second;
        const bool isToKernel = name == "sendmsg" && number % 6 == 0;
        if (isNew || isToKernel || kChanging.count(name) != 0) {
            chosen.push_back({name, number, subject});
        }
    }
    return chosen;
}

// What is killed, over and over.
struct Victim {
    std::string program;
    std::function<void()> arrange;
    std::function<void()> run;
    std::function<void()> inspect;  // what was left
};

void KillEverywhere(const Victim& victim, const std::vector<SystemCall>& calls) {
    const auto chosen = Chosen(calls);
    printf("killed at %zu of %zu calls\n", chosen.size(), calls.size());
    for (const auto& [name, number, subject] : chosen) {
        SCOPED_TRACE("killed at " + name + ' ' + std::to_string(number) + ' ' + subject);
        victim.arrange();
        WatchCalls(victim.run, Fault{name, number, kKill}, victim.program);
        victim.inspect();
    }
}

// All that commands change but the time of the last access, sorted. Locks and drafts of killed
// writers may be left; udhcpd's settings are made anew before it runs.
std::string State() {
    return Shell(
        "cd /; { tail -n +1 $(find usr/tavi/etc etc/ppp var/lib/usbmodem etc/hostapd etc/sysconfig "
        "etc/dhcpd etc/resolv.conf* tmp/.usb* tmp/wireless.info var/tmp run/rc.network* run/lock "
        "-type f "
        "-not "
        "-name '*.lock' -not -name '*.new' -not -name '*.pid.*' -not -name 'dhcpd*.conf' -not "
        "-name "
        "'*.tar' 2>/dev/null); ip -oneline address show scope global; ip route; } | "
        "sed '/ACCESS_TIME/d; s/\"//g; s/^[0-9]*: //; s/valid_lft.*//' | sort");
}

std::vector<std::string> Stores() {
    std::vector<std::string> texts;
    for (const char* store : {"/usr/tavi/etc/wireless.conf", "/usr/tavi/etc/wireless_ap.conf",
                              "/var/lib/usbmodem/usbmodem.profile.001010123456789"}) {
        texts.push_back(RunProgram({"sed", "/ACCESS_TIME/d", store}).out);
    }
    return texts;
}

std::vector<CommandCall> WritingCommands() {
    std::vector<CommandCall> commands;
    for (const CommandCall& command : CommandCalls()) {
        const bool isOfService =
            command.needs == Needs::kService || command.needs == Needs::kServedConnection;
        if (command.writes && !isOfService) {
            commands.push_back(command);
        }
    }
    return commands;
}

struct KilledCommand : testing::TestWithParam<CommandCall> {
    void Run() { result = RunProgram(GetParam().Argv(), GetParam().input); }
    void RunAgain() {
        constexpr int kBusy = 4;  // compatible: an attempt that was killed lets one be refused
        Run();
        if (result.status == kBusy) {
            Run();
        }
    }
    // That works after any other one.
    RunResult RunAnother() const {
        const std::string cli = BuiltProgram("taviwireless_with_wifi");
        return GetParam().IsOfModems()
                   ? RunProgram(WithShortWaits({cli, "modem", "--direct", "show", "usbmodem1"}))
                   : RunProgram(WithShortWaits({cli, "wifi", "connect", "My Net"}));
    }

    RunResult result;
};

// An adapter without address, and an access point that is off, with a DHCP service.
constexpr char kArrange[] =
    "f=/usr/tavi/etc/wireless_ap.conf; [ ! -e $f ] || sed -i s/enable=yes/enable=no/ $f;"
    "echo enable=yes >/etc/dhcpd/dhcpd-lbr0-lbr0.info;"
    "[ ! -e /sys/class/net/wlan0 ] || ip address flush dev wlan0";

TEST_P(KilledCommand, LetsTheNextOneWork) {
    Surroundings surroundings(GetParam().needs);
    const Victim victim = {
        BuiltProgram(GetParam().IsOfModems() ? "taviwireless" : "taviwireless_with_wifi"),
        [&] {
            surroundings.Arrange(GetParam().sim);
            Shell(kArrange);
        },
        [&] {
            Run();
            // What goes on in the background is watched as well, and would be waited for.
            RunProgram({"pkill", "-KILL", "-x", "sleep|udhcpc"});
        },
        {}};
    victim.arrange();
    const auto olds = Stores();
    const auto calls = WatchCalls(victim.run, {}, victim.program).calls;
    ASSERT_EQ(result.status, 0) << result.err;
    const auto news = Stores();
    RunAgain();
    const bool worksAgain = result.status == 0;
    const std::string wanted = State();
    const auto inspect = [&] {
        for (int i = 0; i < 2 && GetParam().IsOfModems(); ++i) {
            surroundings.Simulator().Received("1");  // it has answered whom was killed
        }
        const auto left = Stores();
        for (size_t i = 0; i < left.size(); ++i) {
            EXPECT_TRUE(left[i] == olds[i] || left[i] == news[i]) << left[i];
        }
        RunAgain();
        if (result.status == 0 || worksAgain) {
            EXPECT_EQ(result.err, "");
            EXPECT_EQ(State(), wanted);
        } else {  // it was done already
            EXPECT_TRUE(Eventually([this] { return RunAnother().status == 0; })) << result.err;
        }
    };
    KillEverywhere({victim.program, victim.arrange, victim.run, inspect}, calls);
}

std::string NameOf(const testing::TestParamInfo<CommandCall>& info) {
    std::string name = info.param.name;
    std::replace(name.begin(), name.end(), ' ', '_');
    return name;
}

INSTANTIATE_TEST_SUITE_P(Of, KilledCommand, testing::ValuesIn(WritingCommands()), NameOf);

// Runs argv over and over, killed; the next run gives what one gives that is not.
void ExpectTheSameOnceKilled(const std::vector<std::string>& argv, const std::string& program,
                             const std::string& arrangement) {
    const auto arrange = [&] { Shell(arrangement); };
    const auto run = [&] { RunProgram(argv); };
    arrange();
    const auto calls = WatchCalls(run, {}, program).calls;
    const std::string wanted = State();
    const auto inspect = [&] {
        EXPECT_EQ(RunProgram(argv).err, "");
        EXPECT_EQ(State(), wanted);
    };
    KillEverywhere({program, arrange, run, inspect}, calls);
}

// The interface has addresses and routes that another tool gave it.
TEST(KilledNetworkProgram, LosesNoAddressAndNoRoute) {
    InstallRootScripts();
    const std::string program = BuiltProgram("rc.network");
    const std::string wired =
        "ip link delete br0; ip link delete eth0; rm -f /run/rc.network*; set -e; ip link add eth0 "
        "type "
        "veth peer name eth0-far; ip address add 10.9.0.5/16 dev eth0; ip link set eth0 up; ip "
        "link set "
        "eth0-far up; ip address add fd00::5/64 dev eth0 nodad; ip route add 10.98.0.0/24 dev "
        "eth0; ip "
        "route add default via 10.9.0.1 dev eth0 metric 9; mkdir -p "
        "/etc/sysconfig/network-scripts; cd "
        "/etc/sysconfig/network-scripts; printf 'ONBOOT=yes\nPRIMARY=eth0\n' >ifcfg-br0;";
    const std::vector<std::string> restart = {program, "restart", "wlan0", "br0"};
    ExpectTheSameOnceKilled(restart, program, wired);
    ExpectTheSameOnceKilled(
        restart, program,
        wired + '\'' + program + "' restart wlan0 br0; echo ONBOOT=no >ifcfg-br0");
}

TEST(KilledService, LeavesItsModemsToTheNextOne) {
    const PrivateBus bus;
    const ModemSimulator simulator({"--modem", "12d1,id=1,ports=dial/at"});
    const std::string program = BuiltProgram("usbmodemd");
    const auto serve = [&] {
        Process service(WithShortWaits({program, "--foreground"}));
        Eventually([&] {
            std::string list;
            return service.Wait(Process::Milliseconds(0)) ||
                   (dbus::USBModemClient().GetUSBModemList(list) == 0 && !list.empty());
        });
        service.Signal(SIGTERM);
        service.Wait();
    };
    const auto inspect = [] { EXPECT_TRUE(ModemService().Lists({"usbmodem1"})); };
    KillEverywhere({program, [] {}, serve, inspect}, WatchCalls(serve, {}, program).calls);
}

// A process that took a lock and stopped.
class Stopped {
  public:
    explicit Stopped(const std::function<void()>& take) : pid_(fork()) {
        if (pid_ == 0) {
            prctl(PR_SET_PDEATHSIG, SIGKILL);
            take();
            raise(SIGSTOP);
            _exit(0);
        }
        waitpid(pid_, nullptr, WUNTRACED);
    }
    ~Stopped() {
        kill(pid_, SIGKILL);
        waitpid(pid_, nullptr, 0);
    }
    Stopped(const Stopped&) = delete;
    Stopped& operator=(const Stopped&) = delete;

  private:
    pid_t pid_;
};

struct StoppedHolder : testing::Test {
    // What others say meanwhile.
    static std::string Others(const std::function<void()>& take,
                              const std::vector<std::string>& argv) {
        const Stopped holder(take);
        const RunResult result = RunProgram(WithShortWaits(argv), "another key\n");
        EXPECT_EQ(result.status, 1);
        return result.err;
    }
    static std::string OthersIn(const std::string& file, const std::vector<std::string>& argv) {
        const auto lock = [&file] { flock(open(file.c_str(), O_RDWR | O_CREAT, 0600), LOCK_EX); };
        return Others(lock, argv);
    }
    const std::string cli = BuiltProgram("taviwireless_with_wifi");
};

TEST_F(StoppedHolder, OfAWifiStoreKeepsOthersForASentence) {
    const Surroundings surroundings(Needs::kAdapter);
    EXPECT_THAT(
        OthersIn("/usr/tavi/etc/.wireless_ap.conf.lock", {cli, "ap", "set", "ssid=New"}),
        testing::HasSubstr("cannot store the settings in /usr/tavi/etc/wireless_ap.conf; "));
    EXPECT_THAT(OthersIn("/usr/tavi/etc/.wireless.conf.lock", {cli, "wifi", "connect", "My Net"}),
                testing::HasSubstr("connected to My Net but could not save it; "));
    InstallRootScripts();
    WriteProgram("/usr/local/bin/flock",  // not a minute
                 "#!/bin/sh\nfor file; do :; done\nexec /usr/bin/flock -n $file\n");
    EXPECT_EQ(OthersIn("/var/run/usb.plug.lock", {"/usr/tavi/hotplug/usb.plug"}),
              "usb.plug: another usb.plug has had /var/run/usb.plug.lock for a minute\n");
}

TEST_F(StoppedHolder, OfAProfileOrAPortKeepsOthersForASentence) {
    const Surroundings surroundings(Needs::kPlugged);
    EXPECT_THAT(OthersIn("/var/lib/usbmodem/.usbmodem.profile.001010123456789.lock",
                         {cli, "modem", "--direct", "profile", "set", "usbmodem1", "apn=new"}),
                testing::HasSubstr("cannot change the profile of usbmodem1; the system log"));
    usbmodem_lib::USBModem modem(1, "/tmp/usbmodem.info1");
    EXPECT_THAT(Others([&modem] { modem.OpenFileDevice("/dev/ttyUSB1"); },
                       {cli, "modem", "--direct", "show", "usbmodem1"}),
                testing::HasSubstr(") holds /dev/ttyUSB1 of usbmodem1; end it"));
}

}  // namespace
}  // namespace taviwireless::test
