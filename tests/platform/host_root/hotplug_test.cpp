// SPDX-License-Identifier: MIT
// The hot-plug scripts. What is plugged in is laid out over the folders of /sys that they look at.
#include <gmock/gmock.h>
#include <sys/mount.h>

#include "tests/platform/host_root/root_scripts.h"
#include "tests/platform/veth.h"
#include "tests/support/files.h"
#include "tests/wireless/wifi_fixture.h"

namespace taviwireless::test {
namespace {

namespace fs = std::filesystem;

struct Hotplug : testing::Test {
    void SetUp() override {
        InstallRootScripts();
        for (const char* folder : {"/sys/class/tty", "/sys/class/net"}) {
            ASSERT_EQ(mount("none", folder, "tmpfs", 0, nullptr), 0);
        }
        tools_.Add("/usr/sbin/iw", "[ \"$2\" = phy0 ] && cat /tmp/modes");
    }
    void TearDown() override {
        umount("/sys/class/tty");
        umount("/sys/class/net");
    }

    static void Plug() { Shell("/usr/tavi/hotplug/usb.plug"); }

    // A serial port at /tmp/usb/DEVICE, interface 1.N of it.
    static void AddPort(int number, const std::string& device, const std::string& vendor,
                        const std::string& driver, int endpoints) {
        const std::string root = "/tmp/usb/" + device;
        const std::string usb = root + "/1." + std::to_string(number);
        const std::string tty = "ttyUSB" + std::to_string(number);
        WriteFile(root + "/idVendor", vendor + "\n");
        WriteFile(usb + "/bNumEndpoints", "0" + std::to_string(endpoints) + "\n");
        MakeDirectories(usb + '/' + tty);
        fs::create_directory_symlink("/drivers/" + driver, usb + "/driver");
        MakeDirectories("/sys/class/tty/" + tty);
        fs::create_directory_symlink(usb + '/' + tty, "/sys/class/tty/" + tty + "/device");
    }

    ToolStandIns tools_;
};

TEST_F(Hotplug, ModemHasItsInfoFileWhileItIsPluggedIn) {
    AddPort(9, "1-1", "12d1", "option", 2);
    AddPort(10, "1-1", "12d1", "option", 3);
    AddPort(11, "1-1", "12d1", "option", 2);
    AddPort(2, "1-2", "0403", "ftdi_sio", 2);  // a cable
    AddPort(3, "1-3", "1199", "sierra", 2);
    // While one looks and another waits, a third leaves it to that.
    Shell("cd /var/run; flock usb.plug.lock flock usb.plug.lock.next /usr/tavi/hotplug/usb.plug");
    EXPECT_FALSE(Exists("/tmp/usbmodem.info0"));
    Plug();
    EXPECT_EQ(ReadFile("/tmp/usbmodem.info0"),
              "USB_ID_VENDOR=12d1\nCONNECTNODE=10\nDEVICENODE=9,10,11\nUSB_DEVICE=/tmp/usb/1-1\n");
    EXPECT_EQ(FileMode("/tmp/usbmodem.info0"), 0644);
    EXPECT_EQ(ReadFile("/tmp/usbmodem.info1"),
              "USB_ID_VENDOR=1199\nCONNECTNODE=3\nDEVICENODE=3\nUSB_DEVICE=/tmp/usb/1-3\n");
    EXPECT_FALSE(Exists("/tmp/usbmodem.info2"));

    // The other one keeps its number, and a modem of another maker of such files keeps its file.
    WriteFile("/tmp/usbmodem.info7", "CONNECTNODE=77\n");
    const auto written = fs::last_write_time("/tmp/usbmodem.info1");
    Shell("rm -r /sys/class/tty/ttyUSB9 /sys/class/tty/ttyUSB1?");
    Plug();
    EXPECT_FALSE(Exists("/tmp/usbmodem.info0"));
    EXPECT_EQ(fs::last_write_time("/tmp/usbmodem.info1"), written);
    EXPECT_TRUE(Exists("/tmp/usbmodem.info7"));
    Shell("rm -r /sys/class/tty/ttyUSB*");
    Plug();
    EXPECT_FALSE(Exists("/tmp/usbmodem.info1"));
    EXPECT_EQ(Shell("find /tmp -maxdepth 1 -name '*usb.plug*'"), "");
}

TEST_F(Hotplug, AdapterIsDescribedWhileItIsPluggedIn) {
    const struct {
        const char *uevent, *modes, *info;
    } kRows[] = {
        {"DEVTYPE=usb_interface\nPRODUCT=148f/5370/101\n", "\t\t * managed\n\t\t * AP\n",
         "PRODUCT=148f/5370/101\nAP_SUPPORT=yes\n"},
        {"PCI_ID=8086:2723\n", "\t\t * managed\n\t\t * AP/VLAN\n",
         "PRODUCT=8086:2723\nAP_SUPPORT=no\n"},
        {"MODALIAS=x\n", "", "PRODUCT=some_driver\nAP_SUPPORT=no\n"},
    };
    WriteFile("/sys/class/net/wlan0/phy80211/name", "phy0\n");
    fs::create_directory("/sys/class/net/wlan0/device");
    fs::create_directory_symlink("/drivers/some_driver", "/sys/class/net/wlan0/device/driver");
    for (const auto& row : kRows) {
        WriteFile("/sys/class/net/wlan0/device/uevent", row.uevent);
        WriteFile("/tmp/modes", row.modes);
        Plug();
        EXPECT_EQ(ReadFile("/tmp/wireless.info"), row.info);
    }
    Shell("rm -r /sys/class/net/wlan0");
    Plug();
    EXPECT_FALSE(Exists("/tmp/wireless.info"));
}

// Whoever is on the machine may be first at these names.
TEST_F(Hotplug, WhatStandsAtTheNamesOfInfoFilesIsReplaced) {
    TAVI_NEEDS_A_STRANGER()
    WriteFile("/sys/class/net/wlan0/phy80211/name", "phy0\n");
    WriteFile("/sys/class/net/wlan0/device/uevent", "PRODUCT=1/2/3\n");
    WriteFile("/tmp/modes", "\t\t * AP\n");
    AddPort(0, "1-1", "12d1", "option", 3);
    MakeDirectories("/etc/cron.d");
    WriteFile("/tmp/mine", "mine\n");
    const std::string before = Shell("ls -A /etc /etc/cron.d; cat /tmp/mine");
    for (const char* command :
         {"mkdir -p $0/in; touch $0/in/file; chown -R nobody $0", "mkfifo $0; chown nobody $0",
          "ln -s /etc/cron.d $0", "ln -s /tmp/mine $0", "ln -s /etc/nologin $0",
          "echo USB_DEVICE=/tmp/usb/1-1 > $0; chown nobody $0"}) {
        SCOPED_TRACE(command);
        for (const std::string path :
             {"/tmp/wireless.info", "/tmp/usbmodem.info0", "/tmp/usbmodem.infoXYZ"}) {
            Shell("rm -rf " + path);
            ASSERT_EQ(RunProgram({"sh", "-c", command, path}).status, 0);
        }
        Plug();
        EXPECT_EQ(ReadFile("/tmp/wireless.info"), "PRODUCT=1/2/3\nAP_SUPPORT=yes\n");
        EXPECT_THAT(ReadFile("/tmp/usbmodem.info0"), testing::HasSubstr("CONNECTNODE=0\n"));
        EXPECT_EQ(Shell("find /tmp -maxdepth 1 -type f -user root '(' -name '*.info?' -o -name "
                        "'.usb.plug*' ')'"),
                  "/tmp/usbmodem.info0\n");
        EXPECT_EQ(Shell("ls -A /etc /etc/cron.d; cat /tmp/mine"), before);
    }
    Shell("rm -r /sys/class/net/wlan0; rm /tmp/wireless.info; mkdir /tmp/wireless.info");
    Plug();
    EXPECT_FALSE(Exists("/tmp/wireless.info"));
    EXPECT_EQ(FileMode("/var/run/usb.plug.lock"), 0600);
    Shell("mkdir /tmp/wireless.info; mount -t tmpfs none /tmp/wireless.info");
    EXPECT_EQ(RunProgram({"/usr/tavi/hotplug/usb.plug"}).status, 1);  // that it cannot
    Shell("umount /tmp/wireless.info");
}

// The first process of a namespace cannot be killed from within, like one that a driver holds.
TEST(StopProgram, GivesUpOnAProcessThatIsNeverLetGo) {
    InstallRootScripts();
    InstallScript("/bin/true", "/usr/local/bin/sleep");  // its ten seconds are not slept
    WriteFile("/tmp/pid", "1\n");
    const RunResult result = RunProgram({"unshare", "--pid", "--fork", "--mount-proc", "sh", "-c",
                                         "/usr/tavi/bin/stop-program sh /tmp/pid; echo status $?"});
    EXPECT_EQ(result.out, "status 1\n");
    EXPECT_EQ(result.err, "stop-program: sh (process 1) does not end, even when it is killed\n");
    EXPECT_TRUE(Exists("/tmp/pid"));
}

TEST(WirelessFunction, FreesTheAdapter) {
    InstallRootScripts();
    const std::string script = "/usr/tavi/hotplug/usb.wireless.function";
    EXPECT_EQ(RunProgram({script, "change-mode", "ap"}).status, 1);  // there is none
    WirelessInterface adapter;
    Shell("ip link add lbr0 type bridge; ip link set wlan0 master lbr0");
    Shell("cp -L /bin/sleep /tmp/hostapd");
    Process accessPoint({"/tmp/hostapd", "60"});
    WriteFile("/var/run/hostapd-wlan0.pid", std::to_string(accessPoint.Pid()));
    for (const char* mode : {"ap", "client"}) {
        adapter.Up();
        Shell("ip address replace 10.7.0.2/24 dev wlan0");
        Shell(script + " change-mode " + mode);
        EXPECT_EQ(Ip("-4 address show wlan0"), "");
        EXPECT_THAT(Ip("address show wlan0"), testing::HasSubstr("state DOWN"));
    }
    EXPECT_EQ(accessPoint.Wait(Process::Milliseconds(0)), 128 + SIGTERM);
    EXPECT_FALSE(Exists("/sys/class/net/wlan0/master"));
    EXPECT_EQ(RunProgram({script, "change-mode", "apx"}).status, 2);
    EXPECT_EQ(RunProgram({script, "change-mode"}).status, 2);
}

}  // namespace
}  // namespace taviwireless::test
