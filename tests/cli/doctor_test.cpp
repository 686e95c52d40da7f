// SPDX-License-Identifier: MIT
// taviwireless doctor in situations that each make one line of it go wrong.
#include "base/split.h"
#include "tests/cli/cli_runs.h"
#include "tests/support/bus.h"
#include "tests/support/wait.h"
#include "tests/wireless/wifi_fixture.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;

RunResult Doctor(std::vector<std::string> options = {}) {
    options.insert(options.begin(), {BuiltProgram("taviwireless_with_wifi"), "doctor"});
    return RunProgram(options);
}

// "SUBJECT STATE: TEXT; ADVICE" of each line that is neither "ok" nor "unknown".
std::string Complaints() {
    const RunResult doctor = Doctor({"--json"});
    std::string complaints;
    for (const Json::Value& line : Parse(doctor.out)) {
        if (line["state"] == "warning" || line["state"] == "failed") {
            complaints += line["subject"].asString() + ' ' + line["state"].asString() + ": " +
                          line["text"].asString() + "; " + line["advice"].asString() + '\n';
        }
    }
    EXPECT_EQ(doctor.status, complaints.find(" failed: ") == std::string::npos ? 0 : kFailure);
    return complaints;
}

// A machine of which nothing is wrong: adapter, modem with its SIM, service, address and route.
struct HealthyMachine {
    HealthyMachine() {
        SetSupport("yes");
        WriteFile("/tmp/wireless.info", "PRODUCT=stick\nAP_SUPPORT=yes\n");
        WriteFile("/usr/tavi/etc/wireless_ap.conf", "[stick]\n\tenable=no\n\tunblock=yes\n");
        WriteFile("/usr/tavi/etc/wireless.conf", "[Home_00:11:22:33:44:55]\n\tessid=Home\n");
        WriteFile("/dev/kmsg", "6,1,1,-;usb 1-1: new high-speed USB device\n");
        WriteFile("/etc/resolv.conf", "nameserver 192.168.9.1\n");
        WriteProgram("/etc/rc.network", "#!/bin/sh\n");
        WriteProgram("/sbin/iwlist", "#!/bin/sh\n");
        // The machine's own are not every user's to run, or to change.
        WriteProgram("/usr/sbin/pppd", "#!/bin/sh\n");
        WriteProgram("/usr/sbin/wpa_supplicant", "#!/bin/sh\n");
        WriteProgram("/sbin/iwconfig", "#!/bin/sh\n");
        InstallDialler();
        Shell(
            "chmod 600 /usr/tavi/etc/wireless*; mkdir -p /etc/dhcpd; rm -rf /tmp/class; mkdir "
            "/tmp/class");
        Shell("cp -a /sys/class/net /tmp/class; cp --remove-destination /bin/sleep /tmp/iwd");
        Shell("cp /bin/sleep /tmp/minicom; ip address add 192.168.9.20/24 dev wlan0");
        interface.Up();
        Shell("ip route add default via 192.168.9.1 dev wlan0");
    }
    WirelessInterface interface;
    ServedModems served{"12d1,pin=1234"};
};

TEST(Doctor, NamesWhatIsWrongAndWhatToDo) {
    const struct {
        const char *arrange, *undo, *complaint;
    } kCases[] = {
        {"chmod a-x /usr/sbin/wpa_supplicant", "chmod a+x /usr/sbin/wpa_supplicant",
         "Wi-Fi programs failed: missing: /usr/sbin/wpa_supplicant; install wpasupplicant"},
        {"rm /etc/rc.network", "install -m 755 /sbin/iwlist /etc/rc.network",
         "access point programs failed: missing: /etc/rc.network; "},
        {"mv /usr/sbin/pppd /tmp", "mv /tmp/pppd /usr/sbin",
         "modem programs failed: missing: pppd; install ppp"},
        {"chmod 644 /usr/tavi/etc/wireless.conf", "chmod 600 /usr/tavi/etc/wireless.conf",
         "files warning: others can read the keys in /usr/tavi/etc/wireless.conf; chmod go-r "},
        {"chmod o+w /tmp/wireless.info", "chmod o-w /tmp/wireless.info",
         "files failed: others can write in /tmp/wireless.info; chmod go-w "},
        {"mount --bind /etc /etc; mount -o remount,bind,ro /etc", "umount /etc",
         "folders failed: on a read-only file system: /etc, "},
        {"mount -t tmpfs -o nr_inodes=1 tmpfs /etc/dhcpd", "umount /etc/dhcpd",
         "disk space failed: none is left for files in /etc/dhcpd; "},
        {"echo support_wireless=no > /etc.defaults/taviinfo.conf",
         "echo support_wireless=yes > /etc.defaults/taviinfo.conf",
         "model warning: does not support"},
        {"echo '3,2,2,-;rtl8192cu: Direct firmware load for x.bin failed with error -2' >> "
         "/dev/kmsg",
         "sed -i 2d /dev/kmsg",
         "firmware warning: the kernel says: rtl8192cu: Direct firmware load"},
        {"mkdir -p /tmp/class/rfkill/rfkill0; cd /tmp/class/rfkill/rfkill0; echo wlan > type\n"
         "echo 1 > soft; echo 0 > hard; mount --bind /tmp/class /sys/class",
         "umount /sys/class",
         "radio failed: Wi-Fi is switched off by software; rfkill unblock wlan"},
        {"sed -i s/unblock=yes/unblock=no/ /usr/tavi/etc/wireless_ap.conf",
         "sed -i s/unblock=no/unblock=yes/ /usr/tavi/etc/wireless_ap.conf",
         "radio failed: unblock=no is set for this adapter; "},
        {"/tmp/iwd 1000 > /dev/null 2>&1 &", "pkill -x iwd",
         "other managers warning: iwd runs (process "},
        {"sed -i s/enable=no/enable=yes/ /usr/tavi/etc/wireless_ap.conf",
         "sed -i s/enable=yes/enable=no/ /usr/tavi/etc/wireless_ap.conf",
         "access point failed: to be on, but hostapd does not serve it; taviwireless ap enable"},
        {"mv /dev/ttyUSB0 /dev/away", "mv /dev/away /dev/ttyUSB0",
         "modem ports failed: /dev/ttyUSB0 of usbmodem0 does not exist; unplug the modem"},
        {"/tmp/minicom 1000 < /dev/ttyUSB0 > /dev/null 2>&1 &", "pkill -x minicom",
         "modem ports failed: /dev/ttyUSB0 of usbmodem0 is held by minicom (process "},
        {"ip route delete default", "ip route add default via 192.168.9.1 dev wlan0",
         "route failed: there is no default route; "},
        {": > /etc/resolv.conf", "echo nameserver 192.168.9.1 > /etc/resolv.conf",
         "name servers failed: /etc/resolv.conf names none; "},
        {"ip address flush dev wlan0",
         "ip address add 192.168.9.20/24 dev wlan0; ip route add default via 192.168.9.1 dev wlan0",
         "address failed: no interface has one; connect"},
    };
    HealthyMachine machine;
    EXPECT_EQ(Complaints(),
              "SIM failed: that of usbmodem0 waits for its PIN; taviwireless modem "
              "unlock usbmodem0\n");
    EXPECT_EQ(CallService({"UnlockSIM", "usbmodem0", "1234"}).status, 0);
    ASSERT_TRUE(Eventually([] { return Complaints().empty(); })) << Complaints();
    for (const auto& row : kCases) {
        SCOPED_TRACE(row.complaint);
        Shell(row.arrange);
        const std::string complaints = Complaints();
        Shell(row.undo);
        EXPECT_THAT(complaints, testing::StartsWith(row.complaint));
        EXPECT_EQ(Lines(complaints).size(), 1u) << complaints;
    }
    EXPECT_THAT(
        RunAsNobody({BuiltProgram("taviwireless_with_wifi"), "doctor"}).out,
        HasSubstr("\n-   access point           only root may read its settings; look as root\n"));
    machine.served.service.End();
    EXPECT_THAT(Complaints(),
                HasSubstr("modem service warning: does not run, and this bus cannot"));
    EXPECT_THAT(Doctor().out, HasSubstr("\n!   modem service          does not run, and "));
    setenv("DBUS_SESSION_BUS_ADDRESS", "unix:path=/tmp/nobody", 1);
    EXPECT_THAT(Complaints(),
                testing::StartsWith("session bus failed: unix:path=/tmp/nobody cannot"));
    machine.served.simulator.Unplug("0");
    EXPECT_THAT(Complaints(), HasSubstr("modems warning: none is plugged in: there is no file "));
}

}  // namespace
}  // namespace taviwireless::test
