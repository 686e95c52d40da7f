// SPDX-License-Identifier: MIT
#include "tests/support/surroundings.h"

#include <sys/wait.h>
#include <unistd.h>

#include "base/memory_file.h"
#include "base/process_handle.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

using usbmodem_lib::USBModem;

constexpr char kId[] = "usbmodem1";
constexpr char kInfo[] = "/tmp/usbmodem.info1";
constexpr char kQueryPort[] = "/dev/ttyUSB1";

// The folders that calls change, and a copy of what was in them at the start.
constexpr char kFolders[] =
    " /usr/tavi /etc/hostapd /etc/sysconfig /etc/dhcpd /etc/dhcpc /etc/ppp /var/lib/usbmodem ";
constexpr char kCopy[] = "/var/copy.tar";

// What calls leave elsewhere.
constexpr char kTraces[] =
    " /tmp/associated /tmp/master /var/run/wpa_supplicant.pid"
    " /var/tmp/.wireless_connecting /var/tmp/.wireless_ap_connecting"
    " /var/tmp/.wireless_current_connection ";

constexpr char kJoin[] =
    "touch /tmp/associated; /usr/sbin/udhcpc\n"
    "printf 'My Net\\n5\\n8\\n10\\n0:11:22:aa:bb:cc\\n' > /var/tmp/.wireless_current_connection";
constexpr char kServe[] =
    "cd /etc/sysconfig; mkdir -p network-scripts; echo BRIDGE=lbr0 > network-scripts/ifcfg-wlan0\n"
    "touch /tmp/master; echo enable=yes > /etc/hostapd/hostapd-wlan0.info";

void PrepareAdapter(ToolStandIns& tools) {
    SetSupport("yes\nsupport_pci_wifi=yes");  // the model serves guests, too
    WriteFile("/tmp/wireless.info", "PRODUCT=stick\nAP_SUPPORT=yes\n");
    WriteFile("/tmp/table",
              "\n\n" + ScanLine(1, "My Net", "00:11:22:aa:bb:cc", 70, "11b/g/n", "WPA2PSK/AES"));
    tools.Add("/sbin/iwlist", "[ \"$3\" = tavi ] && cat /tmp/table || echo '11 channels'");
    tools.Add("/usr/sbin/wpa_supplicant", "touch /tmp/associated");
    tools.Add("/usr/sbin/wpa_cli",
              "[ $1 = status ] || { rm -f /var/run/wpa_supplicant.pid; exit; }\n"
              "until [ -e /tmp/associated ]; do sleep 0.01; done; echo wpa_state=COMPLETED");
    tools.Add("/sbin/iwconfig", "[ \"$*\" != 'wlan0 essid off' ] || rm -f /tmp/associated");
    Shell("cp --remove-destination /bin/sleep /tmp/udhcpc");
    tools.Add("/usr/sbin/udhcpc",
              "printf 'IPADDR=192.168.9.30\\nNETMASK=255.255.255.0\\nGATEWAY=192.168.9.1\\n'"
              " > /etc/dhcpc/dhcpcd-wlan0.info\n"
              "/tmp/udhcpc 1000 > /dev/null 2>&1 & echo $! > /etc/dhcpc/dhcpcd-wlan0.pid");
    tools.Add("/usr/sbin/hostapd_cli", "[ -e /tmp/master ] && echo PONG");
    tools.Add("/usr/tavi/hotplug/usb.wireless.function");
    tools.Add("/etc/rc.network",
              "rm -f /tmp/master\n"
              "[ ! -e /etc/hostapd/hostapd-wlan0.info ] || touch /tmp/master");
    const WirelessConf conf = MakeConf();
    EXPECT_EQ(TAVIWirelessConfSet(&conf), 0);
    WirelessAPSettings settings;
    TAVIWirelessGetAPConfig("stick", &settings);
    settings.enabled = 1;
    CopyField(settings.name, "stick");
    settings.ap.security = settings.ap.guestSecurity = WIRELESS_AP_WPA;
    settings.ap.secret.wpa = {2, {}, WIRELESS_AP_CCMP};
    CopyField(settings.ap.secret.wpa.passphrase, "a pass phrase");
    CopyField(settings.ap.guestSsid, "Guests");
    settings.ap.guestSecret = settings.ap.secret;
    settings.ap.guestEnabled = 1;
    EXPECT_EQ(TAVIWirelessSetAPConfig(&settings), 1);
}

void PrepareModem() {
    InstallDialler(kSaysConnected);
    WriteProgram("/sbin/insmod", "#!/bin/sh\n");
    WriteFile("/etc/ppp/usbmodem_backup_gw", "192.168.9.1\n");
    WriteFile("/usr/tavi/etc/usbmodem/wcdma_list.json", "[]");
    Shell("ip address replace 192.168.9.2/24 dev lo");
    USBModem modem(1, kInfo);
    EXPECT_EQ(modem.InitInfo(kQueryPort), 0);
    EXPECT_EQ(modem.PINUnlock("1234"), 0);
    EXPECT_EQ(modem.InitProfile(), 0);
}

// Dials, and returns the state of the link.
std::string Dial(USBModem& modem) {
    bool err = false;
    if (modem.InitInfo(kQueryPort) != 0 || modem.NetConnect() != 1) {
        return "not dialled";
    }
    Eventually([&] { return modem.UpdateNetStatus() != 2; });
    return modem.GetNetStatus(err);
}

// Waits until the service answers with this text in it.
bool ServiceSays(const std::vector<std::string>& call, const std::string& text) {
    return Eventually([&] { return CallService(call).out.find(text) != std::string::npos; });
}

}  // namespace

Surroundings::Surroundings(Needs needs) : needs_(needs) {
    Shell("mkdir -p " + std::string(kFolders));
    if (needs >= Needs::kAdapter) {
        station_.emplace();
        PrepareAdapter(station_->tools);
    } else if (needs != Needs::kNothing) {
        const char* kModem = "12d1,id=1,ports=dial/at,pin=1234,puk=12345678";
        simulator_.emplace(std::vector<std::string>{"--modem", kModem});
        PrepareModem();
    }
    if (needs == Needs::kModem) {
        modem_.emplace(1, kInfo);
        EXPECT_EQ(modem_->InitInfo(kQueryPort), 0);
    } else if (needs == Needs::kService || needs == Needs::kServedConnection) {
        bus_.emplace();
        service_.emplace(WithShortWaits({BuiltProgram("usbmodemd"), "--foreground"}));
        EXPECT_TRUE(ServiceSays({"GetUSBModemList"}, kId));
    }
    // An ordinary user cannot read the machine's own secrets, and needs none.
    Shell("tar --ignore-failed-read -cf " + std::string(kCopy) + kFolders + "2> /dev/null");
    Arrange();
}

Surroundings::~Surroundings() {
    RunProgram({"pkill", "-KILL", "-x", "sleep|udhcpc"});  // dialler and DHCP client
}

void Surroundings::Arrange(const std::string& sim) {
    Shell("pkill -KILL -x 'sleep|udhcpc'; rm -rf" + std::string(kFolders) + kTraces + "; tar -xf " +
          kCopy + " -C /");
    if (station_) {
        station_->tools.ForgetCommands();
        station_->driver.accessPoint.fill(needs_ == Needs::kJoined ? 0x11 : 0);
        station_->driver.mode = needs_ == Needs::kAccessPoint ? IW_MODE_MASTER : IW_MODE_INFRA;
        Shell(needs_ == Needs::kJoined ? kJoin : needs_ == Needs::kAccessPoint ? kServe : "");
    }
    if (simulator_) {
        Shell("ip route replace default via 192.168.9.1 dev lo");
        for (const std::string& setting : {std::string("pin 1234"), std::string("pin_attempts 3"),
                                           std::string("lock on"), sim}) {
            simulator_->Command("set 1 " + setting);
        }
    }
    if (needs_ == Needs::kModem) {
        modem_->UpdateSIMStatus();
    } else if (needs_ == Needs::kConnection) {
        EXPECT_TRUE(Eventually([&] {
            modem_.reset();
            return Dial(modem_.emplace(1, kInfo)) == "connected";
        }));
    } else if (needs_ == Needs::kDialled) {
        const auto dial = [] {
            USBModem modem(1, kInfo);
            return Dial(modem);
        };
        EXPECT_TRUE(Eventually([&] { return InChild(dial).text == "connected"; }));
    } else if (service_) {
        EXPECT_TRUE(ServiceSays({"GetUSBModem", kId}, kId));
    }
    if (needs_ == Needs::kServedConnection) {
        EXPECT_EQ(CallService({"Connect", kId}).status, 0);
        EXPECT_TRUE(ServiceSays({"GetUSBModem", kId}, "\"connected\""));
    }
}

ChildResult InChild(const std::function<std::string()>& call, std::chrono::milliseconds patience) {
    const UniqueFd text = MemoryFile();
    const pid_t child = fork();
    if (child == 0) {
        const std::string result = call();
        _exit(write(text.Get(), result.data(), result.size()) < 0 ? 1 : 0);
    }
    const ProcessHandle process(child);
    if (!process.AwaitEnd(patience)) {
        process.Signal(SIGKILL);
    }
    int status = 0;
    waitpid(child, &status, 0);
    return {TextOf(text), status};
}

}  // namespace taviwireless::test
