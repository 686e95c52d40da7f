// SPDX-License-Identifier: MIT
// What the service lives through on a customer's appliance at 3 a.m.
#include <taviwireless/usbmodem_client.h>

#include <algorithm>
#include <future>

#include "tests/support/bus.h"
#include "tests/support/files.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;

// What the modems are asked is counted here, so nothing else is to ask them.
std::vector<std::string> WithoutLooks() {
    return WithShortWaits({BuiltProgram("usbmodemd"), "--foreground", "--refresh", "0"});
}

// Short waits for silence would take a modem that babbles for a quiet one.
std::vector<std::string> WithQuietWaits() {
    setenv("TAVI_QUIET_WAITS", "whole", 1);
    return WithoutLooks();
}

struct RunningService : ServedModems {
    RunningService() : ServedModems("12d1,ports=dial/at", WithoutLooks()) {}
};

TEST(Survival, AModemThatBeginsToBabbleKeepsOneCallWaiting) {
    ServedModems served("generic,ports=dial/at", WithQuietWaits());
    served.simulator.Fault("0.1", "babble");
    // Of these only the first is asked of the modem.
    std::vector<std::future<RunResult>> calls;
    for (int i = 0; i < 3; ++i) {
        calls.push_back(std::async(std::launch::async, [] {
            return CallService({"GetUSBModem", "usbmodem0"});
        }));
    }
    int refused = 0;
    for (auto& call : calls) {
        refused += call.get().err.find("not inited") != std::string::npos;
    }
    EXPECT_EQ(refused, 2);
}

// Calls that wait behind another are dropped when their caller has left, unless it wants no reply.
TEST(Survival, CallersThatDoNotWaitForTheirReply) {
    RunningService running;
    // So that a caller has left before its second call.
    running.simulator.Fault("0", "noecho");
    running.simulator.Fault("0", "slow=200");
    for (const bool wantsReply : {true, false}) {
        SCOPED_TRACE(wantsReply);
        running.simulator.Received("0");
        DBusConnection* bus = dbus_bus_get_private(DBUS_BUS_SESSION, nullptr);
        dbus_connection_set_exit_on_disconnect(bus, FALSE);
        for (int i = 0; i < 3; ++i) {
            DBusMessage* call = dbus_message_new_method_call("com.merilond.usbmodem", "/",
                                                             "com.merilond.usbmodem", "UnlockSIM");
            const char* devid = "usbmodem0";
            const char* pin = "1234";
            dbus_message_append_args(call, DBUS_TYPE_STRING, &devid, DBUS_TYPE_STRING, &pin,
                                     DBUS_TYPE_INVALID);
            dbus_message_set_no_reply(call, wantsReply ? FALSE : TRUE);
            dbus_connection_send(bus, call, nullptr);
            dbus_message_unref(call);
        }
        dbus_connection_flush(bus);
        dbus_connection_close(bus);
        dbus_connection_unref(bus);
        EXPECT_TRUE(running.service.Lists({"usbmodem0"}));  // once all others are through
        const size_t received = running.simulator.Received("0").size();
        constexpr size_t kPerCall = 2;
        // Of those that want a reply only the first may be served before the caller has left.
        EXPECT_TRUE(wantsReply ? received <= kPerCall : received == 3 * kPerCall) << received;
    }
}

TEST(Survival, ABusThatIsRestartedEndsItWithAMessage) {
    PrivateBus bus;
    ModemService service(LoggingCommand());
    bus.Restart();
    EXPECT_TRUE(service.Says("the session bus has gone away; ending"));
    EXPECT_EQ(service.Daemon().Wait(), 1);
}

// The sets are removed even while calls are waiting all the time.
TEST(Survival, ALowLimitOnSemaphoreSets) {
    // Enough for one call and, beside it, looks of the service's own.
    WriteFile("/proc/sys/kernel/sem", "32000 1024000 500 32");
    RunningService running;
    std::vector<std::future<void>> callers;
    for (int i = 0; i < 6; ++i) {  // together far more commands, of two sets each
        callers.push_back(std::async(std::launch::async, [] {
            EXPECT_THAT(CallService({"GetUSBModem", "usbmodem0"}).out,
                        HasSubstr("\"pin_remains\": 3"));
        }));
    }
    callers.clear();             // waits for each
    EXPECT_TRUE(Eventually([] {  // behind the reply to the last call
        const std::string sets = ReadFile("/proc/sysvipc/sem");
        return std::count(sets.begin(), sets.end(), '\n') == 1;  // the heading alone
    })) << ReadFile("/proc/sysvipc/sem");
}

}  // namespace
}  // namespace taviwireless::test
