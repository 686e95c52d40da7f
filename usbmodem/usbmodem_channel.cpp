// The serial channel to the modem's AT port, and one command and its reply over it.
#include <sys/file.h>
#include <taviwireless/usbmodem.h>
#include <wvmodem.h>

#include <cerrno>
#include <chrono>
#include <cstdio>
#include <optional>

#include "common/log.h"
#include "usbmodem/loggable.h"
#include "usbmodem/wvstreams_log.h"

namespace taviwireless::usbmodem_lib {

namespace {

using Clock = std::chrono::steady_clock;

constexpr int kBaud = 9600;
constexpr time_t kFirstByteWait = 1000;  // ms until a reply begins
constexpr time_t kReplyQuiet = 200;      // ms without input that end a reply
constexpr time_t kDrainQuiet = 100;      // ms without input after which the modem is quiet
constexpr size_t kMaxReply = 1024;       // bytes
// A modem that never stops talking must not hold the lock, and its caller, for ever.
constexpr std::chrono::seconds kTalkLimit{10};

bool WaitReadable(WvModem& modem, time_t milliseconds) {
    return modem.select(milliseconds, true, false);
}

// Reads until the reply ends or kMaxReply bytes are there, and returns what was read; nothing when
// no byte came.
std::optional<std::string> ReadReply(WvModem& modem) {
    const auto limit = Clock::now() + kTalkLimit;
    char buffer[kMaxReply + 1] = {};
    size_t count = modem.read(buffer, kMaxReply);
    while (count < kMaxReply && modem.isok() && Clock::now() < limit &&
           WaitReadable(modem, kReplyQuiet)) {
        count += modem.read(buffer + count, kMaxReply - count);
    }
    if (count == 0) {
        return std::nullopt;
    }
    return buffer;  // a zero byte ends the reply
}

// Returns the lines of data that are neither blank nor the echo of cmd, each ended by a line feed.
// Two line feeds in a row end the reply.
std::string CleanReply(const std::string& data, const std::string& cmd) {
    std::string reply;
    for (size_t begin = 0; begin < data.size();) {
        const size_t end = data.find('\n', begin);
        std::string line = data.substr(begin, end - begin);
        if (line.empty()) {
            break;
        }
        const bool isCut = end == std::string::npos && line.find('\r') == std::string::npos;
        begin = end == std::string::npos ? data.size() : end + 1;
        // A cut line is dropped: half a number would pass for a whole one. So is the late echo of
        // an earlier command with a PIN, which would reach the log with the reply.
        if (isCut || line.find(cmd) != std::string::npos || line[0] == '\r' ||
            CarriesSecret(line)) {
            continue;
        }
        const size_t carriageReturn = line.find('\r');
        if (carriageReturn == std::string::npos) {
            line += '\n';
        } else {
            line[carriageReturn] = '\n';
        }
        reply += line;
    }
    return reply;
}

}  // namespace

int USBModem::OpenFileDevice(const std::string& node) {
    std::string error;
    return Open(node, error) ? 0 : -1;
}

bool USBModem::Open(const std::string& node, std::string& error) {
    SendWvStreamsMessagesToLog();
    if (device_) {
        TAVI_LOG_ERROR("Open device warning: new a modem which is not null");
        replacedDevices_.push_back(device_);  // another record may be using it
    }
    device_ = std::make_shared<WvModem>(node.c_str(), kBaud, /*rtscts=*/true, /*no_reset=*/false);
    if (device_->isok()) {
        // Besides the lock file, whose folder is open to everybody. Not TIOCEXCL: root is let in
        // all the same, and a pseudo-terminal keeps it when its holder is killed.
        if (flock(device_->getfd(), LOCK_EX | LOCK_NB) == 0) {
            return true;
        }
        device_->seterr(EBUSY);
    }
    error = device_->errstr().cstr();
    TAVI_LOG_ERROR("modem Init failed: %s", error.c_str());
    CloseFileDevice();
    return false;
}

void USBModem::CloseFileDevice() {
    device_.reset();
    replacedDevices_.clear();
}

int USBModem::DrainDeviceBuffer() {
    if (!device_) {
        TAVI_LOG_ERROR("Error when cleaning device buffer, modem is null");
        return -1;
    }
    device_->write("\r\r\r\r\r");
    const auto limit = Clock::now() + kTalkLimit;
    char discarded[kMaxReply];
    while (device_->isok() && WaitReadable(*device_, kDrainQuiet)) {
        if (Clock::now() > limit) {
            return -1;
        }
        device_->read(discarded, sizeof discarded);
    }
    return 0;
}

int USBModem::ModemCmd(const std::string& cmd, std::string& reply) {
    int result = -1;
    if (semaphore_.Enter() == 0) {
        result = Exchange(cmd, reply);
    } else {
        TAVI_LOG_ERROR("Error on enter Semaphore");
    }
    // Also after a failed Enter. Kept: other processes count on the same arithmetic.
    if (semaphore_.Release() != 0) {
        TAVI_LOG_ERROR("Error on release Semaphore");
    }
    return result;
}

int USBModem::Exchange(const std::string& cmd, std::string& reply) {
    if (!device_ || cmd.empty()) {
        TAVI_LOG_ERROR("Error on executing modem cmd with a null modem or null command");
        return -1;
    }
    if (DrainDeviceBuffer() != 0) {
        TAVI_LOG_ERROR("failed on drain buffer");
        return -1;
    }
    const std::string line = cmd + '\r';
    device_->write(line.data(), line.size());
    const std::optional<std::string> data =
        WaitReadable(*device_, kFirstByteWait) ? ReadReply(*device_) : std::nullopt;
    if (!data) {  // also when the modem was unplugged, which wakes the wait
        TAVI_LOG_ERROR("No respond on modem cmd %s", LoggableCommand(cmd).c_str());
        return -1;
    }
    reply = CleanReply(*data, cmd);
    return 0;
}

int USBModem::TestATCmd(const std::string& cmd, const std::string& node) {
    std::printf("Initializing Modem for node %s\n", node.c_str());
    std::string error;
    if (!Open(node, error)) {
        std::printf("modem Init failed: %s\n", error.c_str());
        return -1;
    }
    std::printf("Send command %s\n", LoggableCommand(cmd).c_str());
    std::string reply;
    const int result = ModemCmd(cmd, reply);
    if (result != 0) {
        std::printf("Error return on modem cmd: %d\n", result);
    } else {
        std::printf("Get return string as follow:\n%s\n", reply.c_str());
    }
    CloseFileDevice();
    return result;
}

}  // namespace taviwireless::usbmodem_lib
