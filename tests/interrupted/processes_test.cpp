// Programs that are killed at any of their system calls: stores are the old ones or the new ones
// whole, and the next command works. Programs that stop with a lock: others end with a sentence.
#include <fcntl.h>
#include <sys/file.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <taviwireless/usbmodem.h>
#include <taviwireless/usbmodem_client.h>

#include <set>

#include "base/split.h"
#include "tests/platform/host_root/root_scripts.h"
#include "tests/support/bus.h"
#include "tests/support/system_calls.h"
#include "tests/support/wait.h"
#include "tests/wireless/wifi_fixture.h"

namespace taviwireless::test {
namespace {

struct Command {
    std::string name, program, words;
    std::string before{};    // a script that makes the files before it
    std::string store{};     // a file that is never anything else than the old or the new one
    std::string input{};     // of this and the next command
    std::string next{};      // if it is another one
    std::string whenBusy{};  // what ends the attempt that was killed, if the next command does not
    std::string links{};     // a script that makes the network before it
};

void PrintTo(const Command& command, std::ostream* text) {
    *text << command.name;
}

// The calls at which the program is killed: with TAVI_EVERY_CALL all of them, else those that change
// something outside of it, one of each kind.
std::vector<SystemCall> Chosen(const std::vector<SystemCall>& calls, bool isOfNetwork) {
    static const std::set<std::string> kChanging = {"write",    "rename", "renameat",  "unlink",
                                                    "unlinkat", "fchmod", "fchown",    "mkdir",
                                                    "kill",     "semctl", "semtimedop"};
    if (getenv("TAVI_EVERY_CALL") != nullptr) {
        return calls;
    }
    std::vector<SystemCall> chosen;
    std::set<std::string> kinds;
    for (const SystemCall& call : calls) {
        // Every file is replaced by the same calls. Numbers are those of pipes.
        const bool isDraft = call.subject.find(".lock") != std::string::npos ||
                             call.subject.find(".new") != std::string::npos;
        const std::string subject =
            call.subject.substr(0, call.subject.find_first_of("0123456789"));
        const std::string kind = call.name + (isDraft && call.name != "renameat" ? "" : subject);
        const bool isChange = call.name == "vfork" ||  // a script's
                              (call.name == "sendmsg" && isOfNetwork && call.number % 6 == 0) ||
                              (kChanging.count(call.name) != 0 && kinds.insert(kind).second);
        if (isChange && subject != "pipe:[" && subject.find("/memfd") != 0) {
            chosen.push_back(call);
        }
    }
    return chosen;
}

// All that commands change, from the root.
constexpr char kFiles[] =
    "usr/tavi/etc etc/ppp var/lib/usbmodem etc/hostapd etc/sysconfig etc/dhcpd etc/resolv.conf* "
    "tmp/associated tmp/.usb* tmp/wireless.info var/tmp/.w* run/rc.network*";
constexpr char kForget[] =
    "cd /; rm -rf $files; mkdir -p usr/tavi/etc etc/sysconfig/network-scripts etc/dhcpd "
    "etc/ppp/peers; echo noauth >etc/ppp/peers/wvdial;"
    "printf 'PRODUCT=stick\nAP_SUPPORT=yes\n' >tmp/wireless.info;";
constexpr char kKeep[] = "cd /; tar -cf tmp/kept.tar $(ls -d $files 2>/dev/null)";
constexpr char kPutBack[] =
    "cd /; pkill -x sleep; ipcrm --all=sem; ip address flush dev wlan0; rm -rf $files;"
    "tar -xf tmp/kept.tar;";
// Locks and drafts of killed writers may be left; udhcpd's settings are made anew before it runs.
constexpr char kState[] =
    "cd /; { tail -n +1 $(find $files -type f -not -name '*.lock' -not -name '*.new' -not -name "
    "'*.pid.*' -not -name 'dhcpd*.conf' 2>/dev/null); ip -oneline address show scope global;"
    "ip route; } | sed '/ACCESS_TIME/d; s/\"//g; s/^[0-9]*: //; s/valid_lft.*//' | sort";

// An appliance with an adapter that joins whatever it is asked to, and a modem.
struct Appliance {
    explicit Appliance(const std::string& modem = "")
        : simulator({"--modem", "12d1,id=1,ports=dial/at" + modem}) {
        setenv("files", kFiles, 1);
        interface.Up();
        WriteFile("/etc.defaults/taviinfo.conf", "support_wireless=yes\nsupport_pci_wifi=yes\n");
        const std::string home =
            ScanLine(1, "Home", "00:11:22:33:44:55", 9, "11b/g", "WPA2PSK/AES");
        tools.Add("/sbin/iwlist", "printf 'Channels\\n--------\\n" + home + "'");
        tools.Add("/usr/sbin/wpa_supplicant", "touch /tmp/associated /var/run/wpa_supplicant.pid");
        tools.Add(
            "/usr/sbin/wpa_cli",
            "[ $1 = status ] || { rm -f /tmp/associated /var/run/wpa_supplicant.pid; exit; }\n"
            "until [ -e /tmp/associated ]; do sleep 0.01; done; echo wpa_state=COMPLETED");
        tools.Add("/sbin/iwconfig");
        InstallRootScripts();
        tools.Add("/etc/rc.network");
        InstallDialler(kSaysConnected);
    }

    ToolStandIns tools;
    WirelessInterface interface;
    ModemSimulator simulator;
};

struct Killed : testing::TestWithParam<Command>, Appliance {
    Killed() : Appliance(GetParam().name == "Unlocking" ? ",pin=1234" : "") {}

    static std::string Text(const std::string& store) {
        return RunProgram({"sed", "/ACCESS_TIME/d", store}).out;
    }
    void Run(const std::string& words) {
        std::vector<std::string> argv = Split(words, ' ');
        argv.insert(argv.begin(), program);
        result = RunProgram(WithShortWaits(argv), GetParam().input);
    }
    // Compatible: an attempt that was killed lets one other be refused.
    void RunNext() {
        const std::string next = GetParam().next.empty() ? GetParam().words : GetParam().next;
        constexpr int kBusy = 4;
        Run(next);
        if (result.status == kBusy) {
            Run(GetParam().whenBusy.empty() ? next : GetParam().whenBusy);
            Run(next);
        }
    }

    std::string program;
    RunResult result;
};

TEST_P(Killed, NextCommandWorks) {
    const Command& command = GetParam();
    const bool isScript = command.program[0] == '/';
    program = isScript ? command.program : BuiltProgram(command.program);
    setenv("program", program.c_str(), 1);
    const std::string watched = isScript ? "/bin/sh" : program;
    const auto run = [&] { Run(command.words); };
    Shell(kForget + command.before);
    Shell(kKeep);
    Shell(kPutBack + command.links);
    const std::string old = Text(command.store);
    const auto calls = WatchCalls(run, {}, watched).calls;
    ASSERT_EQ(result.status, 0) << result.err;
    const std::string done = Text(command.store);
    RunNext();
    const std::string wanted = Shell(kState);
    const auto chosen = Chosen(calls, command.program == "rc.network");
    printf("killed at %zu of %zu calls\n", chosen.size(), calls.size());
    for (const auto& [name, number, subject] : chosen) {
        SCOPED_TRACE("killed at " + name + ' ' + std::to_string(number) + ' ' + subject);
        Shell(kPutBack + command.links);
        WatchCalls(run, Fault{name, number, kKill}, watched);
        const std::string left = Text(command.store);
        EXPECT_TRUE(left == old || left == done) << left;
        RunNext();
        EXPECT_EQ(result.status, 0) << result.err;
        EXPECT_EQ(Shell(kState), wanted);
    }
}

const std::string kRestart = "restart wlan0 br0";
const std::string kCli = "taviwireless_with_wifi";
const std::string kOff =
    "printf '[stick]\\n\\tenable=no\\n\\tencryption=0\\n' >usr/tavi/etc/wireless_ap.conf;";
const std::string kOn = kOff + "\"$program\" ap enable";
const std::string kJoin = "wifi connect Home --new-key --static 192.168.9.20/24,192.168.9.1";
const std::string kJoined = "echo old right key | \"$program\" " + kJoin;
const std::string kProfiled = "\"$program\" modem --direct profile set usbmodem1 user=me";
const std::string kProfile = "/var/lib/usbmodem/usbmodem.profile.001010123456789";
const std::string kSettings = "/usr/tavi/etc/wireless_ap.conf";
const std::string kSaved = "/usr/tavi/etc/wireless.conf";
// An interface with addresses and routes that another tool gave it.
const std::string kWired =
    "ip link delete br0 2>/dev/null; ip link delete eth0 2>/dev/null; ip link add eth0 type veth "
    "peer "
    "name eth0-far; ip address add 10.9.0.5/16 dev eth0; ip link set eth0 up; ip link set eth0-far "
    "up;"
    "ip address add fd00::5/64 dev eth0 nodad; ip route add default via 10.9.0.1 dev eth0 metric "
    "100;"
    "ip route add 10.98.0.0/24 dev eth0; cd etc/sysconfig/network-scripts;"
    "printf 'ONBOOT=yes\\nPRIMARY=eth0\\n' >ifcfg-br0;";
const std::string kPlugged =
    "mount -t tmpfs none /sys/class/net; mkdir -p /sys/class/net/wlan0/phy80211 "
    "/sys/class/net/wlan0/device;"
    "echo PRODUCT=1/2/3 >/sys/class/net/wlan0/device/uevent; echo phy0 "
    ">/sys/class/net/wlan0/phy80211/name;";

INSTANTIATE_TEST_SUITE_P(
    In, Killed,
    testing::Values(Command{"StoringFirstSettings", kCli, "ap set ssid=New"},
                    Command{"StoringSettings", kCli, "ap set ssid=New", kOff, kSettings},
                    Command{"SwitchingOn", kCli, "ap enable", kOff, kSettings},
                    Command{"SwitchingOff", kCli, "ap disable", kOn, kSettings},
                    Command{"Joining", kCli, kJoin, "", "", "right key\n"},
                    Command{"JoiningAgain", kCli, kJoin, kJoined, kSaved, "newer key\n"},
                    Command{"Leaving", kCli, "wifi disconnect", kJoined, kSaved, "right key\n",
                            kJoin},
                    Command{"Unlocking", kCli, "modem --direct unlock usbmodem1", "", "", "1234\n"},
                    Command{"SettingAProfile", kCli, "modem --direct profile set usbmodem1 apn=new",
                            kProfiled, kProfile},
                    Command{"ResettingAProfile", kCli, "modem --direct profile reset usbmodem1",
                            kProfiled, kProfile},
                    Command{"Dialling", kCli, "modem --direct connect usbmodem1", kProfiled,
                            kProfile, "", "", "modem --direct disconnect usbmodem1"},
                    Command{"MakingABridge", "rc.network", kRestart, "", "", "", "", "", kWired},
                    Command{"RemovingABridge", "rc.network", kRestart, "", "", "", "", "",
                            kWired + "\"$program\" " + kRestart + "; echo ONBOOT=no >ifcfg-br0"},
                    Command{"Plugging", "/usr/tavi/hotplug/usb.plug", "", kPlugged}),
    [](const auto& info) { return info.param.name; });

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
    const auto chosen = Chosen(WatchCalls(serve, {}, program).calls, false);
    printf("killed at %zu calls\n", chosen.size());
    for (const auto& [name, number, subject] : chosen) {
        SCOPED_TRACE("killed at " + name + ' ' + std::to_string(number) + ' ' + subject);
        WatchCalls(serve, Fault{name, number, kKill}, program);
        EXPECT_TRUE(ModemService().Lists({"usbmodem1"}));
    }
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

void Lock(const std::string& file) {
    flock(open(file.c_str(), O_RDWR | O_CREAT, 0600), LOCK_EX);
}

TEST(StoppedHolder, KeepsOthersNoLongerThanASentenceTakes) {
    Appliance appliance;
    usbmodem_lib::USBModem modem(1, "/tmp/usbmodem.info1");
    const std::string cli = BuiltProgram(kCli);
    const struct {
        std::function<void()> take;
        std::string command, sentence;
    } kRows[] = {
        {[] { Lock("/usr/tavi/etc/.wireless_ap.conf.lock"); }, cli + " ap set ssid=New",
         "cannot store the settings in /usr/tavi/etc/wireless_ap.conf; the system log tells why"},
        {[] { Lock("/usr/tavi/etc/.wireless.conf.lock"); }, cli + ' ' + kJoin,
         "connected to Home but could not save it; the system log tells why"},
        {[] { Lock("/var/lib/usbmodem/.usbmodem.profile.001010123456789.lock"); },
         cli + " modem --direct profile set usbmodem1 apn=new",
         "cannot set apn in the profile of usbmodem1"},
        {[&] { modem.OpenFileDevice("/dev/ttyUSB1"); }, cli + " modem --direct show usbmodem1",
         "is not ready"},
        {[] { Lock("/var/run/usb.plug.lock"); }, "/usr/tavi/hotplug/usb.plug",
         "another usb.plug has had /var/run/usb.plug.lock for a minute"},
    };
    Shell(kForget);
    RunProgram(WithShortWaits({cli, "modem", "--direct", "profile", "show", "usbmodem1"}));
    appliance.tools.Add("/usr/local/bin/flock", "exec /usr/bin/flock -n 9");  // instead of a minute
    for (const auto& row : kRows) {
        const Stopped holder(row.take);
        const RunResult result = RunProgram(WithShortWaits(Split(row.command, ' ')), "right key\n");
        EXPECT_EQ(result.status, 1) << row.command;
        EXPECT_THAT(result.err, testing::HasSubstr(row.sentence));
    }
}

}  // namespace
}  // namespace taviwireless::test
