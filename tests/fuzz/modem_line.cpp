// SPDX-License-Identifier: MIT
#include "tests/fuzz/modem_line.h"

#include <dlfcn.h>
#include <fcntl.h>
#include <poll.h>
#include <sys/select.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <ctime>
#include <utility>

#include "tests/fuzz/fuzz.h"
#include "tests/support/files.h"

namespace taviwireless::fuzz {
namespace {

using usbmodem_lib::USBModem;

constexpr char kPort[] = "/dev/ttyUSB1";
constexpr char kInfo[] = "/tmp/usbmodem.info1";
constexpr long long kSecond = 1000000000;       // ns
constexpr long long kByteTime = kSecond / 960;  // at 9600 baud

ModemLine* line = nullptr;
int port = -1;         // the record's descriptor of kPort, which stays open
dev_t device{};        // what that is known by
long long waited = 0;  // ns

bool IsPort(int descriptor) {
    struct stat status {};
    if (port < 0 && line != nullptr && fstat(descriptor, &status) == 0 &&
        status.st_rdev == device) {
        port = descriptor;
    }
    return line != nullptr && descriptor >= 0 && descriptor == port;
}

dbus::USBModemObject* MakeService() {
    const int modemEnd = posix_openpt(O_RDWR | O_NOCTTY);
    struct stat status {};
    Demand(unlockpt(modemEnd) == 0 && symlink(ptsname(modemEnd), kPort) == 0 &&
               stat(kPort, &status) == 0,
           "there is a port");
    device = status.st_rdev;
    test::WriteFile(kInfo, "CONNECTNODE=0\n");
    auto* service =
        static_cast<dbus::USBModemObject*>(g_object_new(dbus::usbmodem_object_get_type(), nullptr));
    service->list.SearchInfoPath();
    return service;
}

dbus::USBModemObject* Service() {
    static auto* const service = MakeService();
    return service;
}

// The record as it is for each vendor.
std::vector<USBModem> MakeRecords(USBModem record) {
    Demand(record.InitInfo(kPort) == 0, "the modem can be initialised");
    std::vector<USBModem> records;
    for (const std::string vendor : ModemLine::kVendors) {
        test::WriteFile(kInfo, "CONNECTNODE=0\nUSB_ID_VENDOR=" + vendor + "\n");
        record.SetATInterface();
        records.push_back(record);
    }
    return records;
}

}  // namespace

ModemLine::ModemLine(unsigned vendor, Answer answerOfModem)
    : answer([](const std::string&) { return "+CPIN: READY\r\nOK\r\n"; }),
      service(Service()),
      record(service->list.FindUSBModem(1)) {
    line = this;
    static const std::vector<USBModem> records = MakeRecords(record);
    record = records[vendor];
    answer = std::move(answerOfModem);
    written.clear();
}

ModemLine::~ModemLine() {
    line = nullptr;
}

}  // namespace taviwireless::fuzz

#define TAKEN_OVER extern "C" __attribute__((visibility("default")))

using namespace taviwireless::fuzz;

TAKEN_OVER int select(int count, fd_set* readable, fd_set* writable, fd_set* exceptional,
                      timeval* timeout) {
    static const auto next = reinterpret_cast<decltype(select)*>(dlsym(RTLD_NEXT, "select"));
    if (!IsPort(count - 1)) {
        return next(count, readable, writable, exceptional, timeout);
    }
    FD_ZERO(readable);
    if (!line->coming.empty() && line->coming[0] != ModemLine::kPause) {
        FD_SET(port, readable);
        return 1;
    }
    waited += timeout->tv_sec * kSecond + timeout->tv_usec * 1000;
    return 0;
}

// The last bit of a wait.
TAKEN_OVER int ppoll(pollfd* polled, nfds_t count, const timespec* limit, const sigset_t* mask) {
    static const auto next = reinterpret_cast<decltype(ppoll)*>(dlsym(RTLD_NEXT, "ppoll"));
    if (!IsPort(polled->fd)) {
        return next(polled, count, limit, mask);
    }
    if (!line->coming.empty() && line->coming[0] != ModemLine::kPause) {
        return 1;
    }
    waited += limit->tv_nsec;
    line->coming.erase(0, 1);  // the pause
    return 0;
}

TAKEN_OVER ssize_t read(int descriptor, void* buffer, size_t size) {
    if (!IsPort(descriptor)) {
        return syscall(SYS_read, descriptor, buffer, size);
    }
    std::string& text = line->coming;
    const size_t count = std::min({size, text.size(), text.find(ModemLine::kPause)});
    text.copy(static_cast<char*>(buffer), count);
    text.erase(0, count);
    waited += static_cast<long long>(count) * kByteTime;
    errno = EAGAIN;
    return count > 0 ? static_cast<ssize_t>(count) : -1;
}

TAKEN_OVER ssize_t write(int descriptor, const void* data, size_t size) {
    if (!IsPort(descriptor)) {
        return syscall(SYS_write, descriptor, data, size);
    }
    line->written.emplace_back(static_cast<const char*>(data), size);
    const std::string& text = line->written.back();
    const size_t end = text.find_last_not_of('\r');
    line->coming += end == text.npos ? "" : line->answer(text.substr(0, end + 1));
    return static_cast<ssize_t>(size);
}

TAKEN_OVER int clock_gettime(clockid_t clock, timespec* time) {
    static const auto next =
        reinterpret_cast<decltype(clock_gettime)*>(dlsym(RTLD_NEXT, "clock_gettime"));
    if (line == nullptr || clock != CLOCK_MONOTONIC) {
        return next(clock, time);
    }
    *time = {static_cast<time_t>(waited / kSecond), static_cast<long>(waited % kSecond)};
    return 0;
}
