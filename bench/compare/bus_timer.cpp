// SPDX-License-Identifier: MIT
// Times services on the session bus, ours and others alike:
//   bus_timer start NAME COMMAND...   from starting the command to its name being owned, in ms; then
//                                     its process id. It goes on running.
//   bus_timer call NAME PATH INTERFACE METHOD [STRING...]
//                                     the median of 301 calls, in ms
#include <dbus/dbus.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

using Clock = std::chrono::steady_clock;
using Message = std::unique_ptr<DBusMessage, void (*)(DBusMessage*)>;

constexpr int kCalls = 301;
constexpr int kLimit = 20;  // seconds

double MillisecondsSince(Clock::time_point begin) {
    return std::chrono::duration<double, std::milli>(Clock::now() - begin).count();
}

DBusConnection* Connect() {
    DBusConnection* bus = dbus_bus_get(DBUS_BUS_SESSION, nullptr);
    if (bus == nullptr) {
        throw std::runtime_error("there is no session bus");
    }
    return bus;
}

bool IsOwnedNow(DBusMessage* message, const char* name) {
    const char* of = nullptr;
    const char* before = nullptr;
    const char* now = nullptr;
    return dbus_message_is_signal(message, DBUS_INTERFACE_DBUS, "NameOwnerChanged") &&
           dbus_message_get_args(message, nullptr, DBUS_TYPE_STRING, &of, DBUS_TYPE_STRING, &before,
                                 DBUS_TYPE_STRING, &now, DBUS_TYPE_INVALID) &&
           strcmp(of, name) == 0 && *now != '\0';
}

pid_t Run(char** command) {
    const pid_t process = fork();
    if (process == 0) {
        setsid();
        (void)!freopen("/dev/null", "w", stdout);
        (void)!freopen("/dev/null", "w", stderr);
        execvp(*command, command);
        _exit(127);
    }
    return process;
}

void Start(const char* name, char** command) {
    DBusConnection* bus = Connect();
    const std::string match =
        std::string("type='signal',member='NameOwnerChanged',arg0='") + name + "'";
    dbus_bus_add_match(bus, match.c_str(), nullptr);
    dbus_connection_flush(bus);
    const auto begin = Clock::now();
    const pid_t process = Run(command);
    while (MillisecondsSince(begin) < kLimit * 1000) {
        dbus_connection_read_write(bus, 1000);
        while (const Message message{dbus_connection_pop_message(bus), dbus_message_unref}) {
            if (IsOwnedNow(message.get(), name)) {
                std::printf("%.3f %d\n", MillisecondsSince(begin), process);
                return;
            }
        }
    }
    throw std::runtime_error(std::string("nobody owns ") + name);
}

Message NewCall(char** words, int count) {
    Message call(dbus_message_new_method_call(words[0], words[1], words[2], words[3]),
                 dbus_message_unref);
    for (int i = 4; i < count; ++i) {
        dbus_message_append_args(call.get(), DBUS_TYPE_STRING, &words[i], DBUS_TYPE_INVALID);
    }
    return call;
}

void Call(char** words, int count) {
    DBusConnection* bus = Connect();
    std::vector<double> times;
    for (int i = 0; i < kCalls; ++i) {
        const Message call = NewCall(words, count);
        DBusError error = DBUS_ERROR_INIT;
        const auto begin = Clock::now();
        const Message reply(
            dbus_connection_send_with_reply_and_block(bus, call.get(), kLimit * 1000, &error),
            dbus_message_unref);
        times.push_back(MillisecondsSince(begin));
        if (!reply) {
            throw std::runtime_error(error.message);
        }
    }
    std::nth_element(times.begin(), times.begin() + kCalls / 2, times.end());
    std::printf("%.4f\n", times[kCalls / 2]);
}

}  // namespace

int main(int argc, char** argv) {
    const std::string what = argc > 1 ? argv[1] : "";
    try {
        if (what == "start" && argc > 3) {
            Start(argv[2], argv + 3);
        } else if (what == "call" && argc > 5) {
            Call(argv + 2, argc - 2);
        } else {
            std::fputs("bus_timer: start NAME COMMAND..., or call NAME PATH INTERFACE METHOD\n",
                       stderr);
            return 2;
        }
    } catch (const std::exception& error) {
        std::fprintf(stderr, "bus_timer: %s\n", error.what());
        return 1;
    }
}
