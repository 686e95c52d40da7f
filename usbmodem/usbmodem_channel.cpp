// SPDX-License-Identifier: MIT
// The serial channel to the modem's AT port, and one command and its reply over it.
#include <poll.h>
#include <sys/file.h>
#include <taviwireless/usbmodem.h>
#include <wvmodem.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <optional>

#include "base/split.h"
#include "common/log.h"
#include "usbmodem/loggable.h"
#include "usbmodem/rules/trace.h"
#include "usbmodem/wvstreams_log.h"

namespace taviwireless::usbmodem_lib {

namespace {

using std::chrono::milliseconds;
using std::chrono::nanoseconds;
using Clock = std::chrono::steady_clock;

constexpr int kBaud = 9600;
constexpr milliseconds kFirstByteWait{1000};  // until a reply begins
constexpr milliseconds kReplyQuiet{200};      // without input: the reply has ended
constexpr milliseconds kDrainQuiet{100};      // without input: the modem is quiet
constexpr milliseconds kLastWait{2};          // of these, waited for by itself
constexpr size_t kMaxReply = 1024;            // bytes
// Bytes. What the line does not take at once would be kept, and sent for hours.
constexpr size_t kMaxCommand = 1024;
// A modem that never stops talking must not hold the lock, and its caller, for longer.
constexpr milliseconds kDrainLimit{1000};
constexpr milliseconds kReplyLimit{2000};

enum class Input { kCame, kTimeOut, kHungUp };

// Waits until there is input, or for a while, for patience at most. The kernel may stretch a wait by
// a thousandth, so the last bit of a long one is waited for by itself, which takes more precision
// than WvStreams has.
bool WaitForInput(WvModem& modem, Clock::duration patience) {
    milliseconds wait{0};
    if (patience > kLastWait) {
        wait = std::chrono::floor<milliseconds>(patience) - milliseconds(1);
    } else if (patience > Clock::duration::zero()) {
        pollfd port{modem.getrfd(), POLLIN, 0};
        const timespec limit{0, static_cast<long>(nanoseconds(patience).count())};
        if (ppoll(&port, 1, &limit, nullptr) <= 0) {
            return false;
        }
    }
    return modem.select(static_cast<time_t>(wait.count()), /*readable=*/true, /*writable=*/false);
}

// Waits for input and reads what has come behind text, at most kMaxReply bytes in all. Only the
// deadline ends the wait: WvStreams' own wait is over at any signal that was caught.
Input Receive(WvModem& modem, milliseconds patience, std::string& text) {
    const auto deadline = Clock::now() + patience;
    while (modem.isok()) {
        if (WaitForInput(modem, deadline - Clock::now())) {
            char buffer[kMaxReply];
            const size_t count = modem.read(buffer, kMaxReply - text.size());
            text.append(buffer, count);
            if (count > 0) {
                return Input::kCame;
            }
        }
        if (Clock::now() >= deadline) {
            return Input::kTimeOut;
        }
    }
    return Input::kHungUp;
}

// Returns what was read until the reply ended, at most kMaxReply bytes; nothing when no byte came,
// or when the modem was unplugged within a line.
std::optional<std::string> ReadReply(WvModem& modem) {
    std::string reply;
    Input input = Receive(modem, kFirstByteWait, reply);
    const auto limit = Clock::now() + kReplyLimit;
    while (input == Input::kCame && reply.size() < kMaxReply && Clock::now() < limit) {
        input = Receive(modem, kReplyQuiet, reply);
    }
    if (reply.empty() || (input == Input::kHungUp && reply.back() != '\n')) {
        return std::nullopt;
    }
    return reply.substr(0, reply.find('\0'));  // a zero byte ends the reply
}

// Without signals meanwhile: writing to a serial line is given up for one that is caught, and
// WvStreams never writes to a line again that failed once.
void Write(WvModem& modem, const std::string& data) {
    sigset_t all;
    sigset_t before;
    sigfillset(&all);
    pthread_sigmask(SIG_SETMASK, &all, &before);
    modem.write(data.data(), data.size());
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
}

// Returns the lines of data that are neither blank nor the echo of cmd, each ended by a line feed.
// A line may end in a line feed alone. Two line feeds in a row end the reply.
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
        // A cut line is dropped: half a number would pass for a whole one.
        if (isCut || line.find(cmd) != std::string::npos || line[0] == '\r') {
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

// Gives a modem's lock back, on whatever way out, and after an Enter that failed as well.
// Compatible with other processes that use the lock in this way: so a lock that its holder never
// gives back is free again. If the holder does give it back later, two holders may be in until
// this process ends.
class Release {
  public:
    explicit Release(semaphore::Semaphore& semaphore) : semaphore_(semaphore) {}
    Release(const Release&) = delete;
    Release& operator=(const Release&) = delete;
    ~Release() {
        if (semaphore_.Release() != 0) {
            TAVI_LOG_ERROR("Error on release Semaphore");
        }
    }

  private:
    semaphore::Semaphore& semaphore_;
};

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
    Write(*device_, "\r\r\r\r\r");
    const auto limit = Clock::now() + kDrainLimit;
    for (std::string discarded; Receive(*device_, kDrainQuiet, discarded) == Input::kCame;
         discarded.clear()) {
        if (Clock::now() >= limit) {
            return -1;
        }
    }
    return 0;
}

int USBModem::ModemCmd(const std::string& cmd, std::string& reply) {
    const Release release(semaphore_);
    if (semaphore_.Enter() != 0) {
        TAVI_LOG_ERROR("Error on enter Semaphore");
        return -1;
    }
    return Exchange(cmd, reply);
}

int USBModem::Exchange(const std::string& cmd, std::string& reply) {
    if (!device_ || cmd.empty()) {
        TAVI_LOG_ERROR("Error on executing modem cmd with a null modem or null command");
        return -1;
    }
    if (cmd.size() > kMaxCommand) {
        TAVI_LOG_ERROR("Error on executing modem cmd of %zu bytes", cmd.size());
        return -1;
    }
    if (DrainDeviceBuffer() != 0) {
        TAVI_LOG_ERROR("failed on drain buffer");
        while (!IsError()) {  // nothing can be asked of a modem that never stops talking
            IncreaseErrorCounter();
        }
        return -1;
    }
    const bool isTraced = IsTraced();
    if (isTraced) {
        TAVI_LOG_DEBUG("%s <- %s", GetDevId().c_str(), LoggableCommand(cmd).c_str());
    }
    const std::string line = cmd + '\r';
    Write(*device_, line);
    const std::optional<std::string> data = ReadReply(*device_);
    if (!data) {  // also when the modem was unplugged
        TAVI_LOG_ERROR("No respond on modem cmd %s", LoggableCommand(cmd).c_str());
        return -1;
    }
    reply = CleanReply(*data, cmd);
    if (isTraced) {
        TAVI_LOG_DEBUG("%s -> %s", GetDevId().c_str(), LoggableReplyTo(cmd, reply).c_str());
    }
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
        std::printf("Get return string as follow:\n");
        for (std::string printed : Lines(LoggableCommand(reply))) {
            MakePrintable(printed.data());
            std::printf("%s\n", printed.c_str());
        }
        std::printf("\n");
    }
    CloseFileDevice();
    return result;
}

}  // namespace taviwireless::usbmodem_lib
