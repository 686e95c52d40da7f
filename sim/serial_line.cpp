// SPDX-License-Identifier: MIT
#include "sim/serial_line.h"

#include <fcntl.h>
#include <poll.h>
#include <stdlib.h>
#include <sys/inotify.h>
#include <termios.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <stdexcept>
#include <utility>

namespace taviwireless::sim {
namespace {

namespace fs = std::filesystem;

[[noreturn]] void Fail(const std::string& what) {
    throw std::runtime_error(what + ": " + std::strerror(errno) + ".");
}

// Through either end of a pseudo-terminal this sets what its clients see.
void SetRaw(int descriptor) {
    termios settings{};
    if (tcgetattr(descriptor, &settings) == 0) {
        cfmakeraw(&settings);
        settings.c_cflag |= CLOCAL | CREAD;
        tcsetattr(descriptor, TCSANOW, &settings);
    }
}

}  // namespace

OpenWatch::OpenWatch() : inotify_(inotify_init1(IN_NONBLOCK | IN_CLOEXEC)) {
    if (inotify_.Get() < 0) {
        Fail("Cannot watch files (inotify)");
    }
}

void OpenWatch::ReadEvents() {
    alignas(inotify_event) char buffer[4096];
    for (ssize_t size; (size = read(inotify_.Get(), buffer, sizeof buffer)) > 0;) {
        for (ssize_t at = 0; at < size;) {
            const void* const next = buffer + at;
            const auto* event = static_cast<const inotify_event*>(next);
            const auto file = files_.find(event->wd);
            if (file != files_.end()) {
                file->second.news = true;
                file->second.closed |= (event->mask & IN_CLOSE) != 0;
                file->second.reopened |= file->second.closed && (event->mask & IN_OPEN) != 0;
            }
            at += static_cast<ssize_t>(sizeof(inotify_event) + event->len);
        }
    }
}

bool OpenWatch::TakeReopened(int watch) {
    ReadEvents();
    File& file = files_.at(watch);
    file.news = false;
    const bool reopened = file.reopened;
    if (reopened) {
        file = File();  // else a close still waits for its open
    }
    return reopened;
}

bool OpenWatch::HasNews(int watch) {
    ReadEvents();
    return files_.at(watch).news;
}

bool OpenWatch::HasNews() const {
    return std::any_of(files_.begin(), files_.end(),
                       [](const auto& file) { return file.second.news; });
}

void OpenWatch::Reset(int watch) {
    ReadEvents();
    files_.at(watch) = File();
}

int OpenWatch::Add(const std::string& path) {
    const int watch = inotify_add_watch(inotify_.Get(), path.c_str(), IN_OPEN | IN_CLOSE);
    if (watch < 0) {
        Fail("Cannot watch " + path);
    }
    files_[watch] = File();
    return watch;
}

void OpenWatch::Remove(int watch) {
    inotify_rm_watch(inotify_.Get(), watch);
    files_.erase(watch);
}

SerialLine::SerialLine(const std::string& tty, const std::string& link, OpenWatch& watch)
    : isGiven_(!tty.empty()), path_(tty), link_(link), watch_(watch) {
    if (isGiven_) {
        OpenGiven();
    } else {
        OpenPseudoTerminal();
        watchId_ = watch_.Add(path_);
        MakeLink();
    }
}

SerialLine::~SerialLine() {
    if (watchId_ >= 0) {
        watch_.Remove(watchId_);
    }
    std::error_code ignored;
    if (!link_.empty() && fs::read_symlink(link_, ignored) == path_) {
        fs::remove(link_, ignored);
    }
}

void SerialLine::OpenPseudoTerminal() {
    modemEnd_ = UniqueFd(posix_openpt(O_RDWR | O_NOCTTY | O_NONBLOCK | O_CLOEXEC));
    char path[64];
    if (modemEnd_.Get() < 0 || grantpt(modemEnd_.Get()) != 0 || unlockpt(modemEnd_.Get()) != 0 ||
        ptsname_r(modemEnd_.Get(), path, sizeof path) != 0) {
        Fail("Cannot make a pseudo-terminal");
    }
    path_ = path;
    // The system tells that nobody has it open only once somebody had.
    const UniqueFd first(open(path, O_RDWR | O_NOCTTY | O_CLOEXEC));
    if (first.Get() < 0) {
        Fail("Cannot open " + path_);
    }
    SetRaw(modemEnd_.Get());
    hasClient_ = false;
}

void SerialLine::OpenGiven() {
    modemEnd_ = UniqueFd(open(path_.c_str(), O_RDWR | O_NOCTTY | O_NONBLOCK | O_CLOEXEC));
    if (modemEnd_.Get() < 0) {
        Fail("Cannot open " + path_);
    }
    if (isatty(modemEnd_.Get()) == 0) {
        Fail("Cannot use " + path_);
    }
    SetRaw(modemEnd_.Get());
}

// A link that leads nowhere is what a killed simulator left, and is replaced.
void SerialLine::MakeLink() {
    if (link_.empty()) {
        return;
    }
    std::error_code error;
    if (fs::is_symlink(link_, error) && !fs::exists(link_, error)) {
        fs::remove(link_, error);
    }
    fs::create_symlink(path_, link_, error);
    if (error) {
        const std::string link = std::exchange(link_, "");
        throw std::runtime_error("Cannot link " + link + " to " + path_ + ": " + error.message() +
                                 ".");
    }
}

SerialLine::Input SerialLine::Read() {
    Input input;
    char buffer[4096];
    ssize_t count;
    while ((count = read(modemEnd_.Get(), buffer, sizeof buffer)) > 0) {
        input.bytes.append(buffer, static_cast<size_t>(count));
    }
    if (isGiven_) {
        input.isHungUp = count == 0 || (errno != EAGAIN && errno != EINTR);
        return input;
    }
    // Looked at after reading: who sent something had opened the line before.
    const bool hadNews = watch_.HasNews(watchId_);
    input.hasNewClient = watch_.TakeReopened(watchId_);
    const bool hadClient = std::exchange(hasClient_, IsOpened());
    input.isReleased = !hasClient_;
    input.mayBeLate = input.isReleased && (hadClient || hadNews);
    if (input.hasNewClient || (hadClient && !hasClient_)) {
        Refresh();
        hasClient_ = IsOpened();  // perhaps by the next one already
    }
    return input;
}

bool SerialLine::IsOpened() const {
    pollfd state{modemEnd_.Get(), 0, 0};
    poll(&state, 1, 0);
    return (state.revents & POLLHUP) == 0;
}

// What a client left unread is lost when it closes the line, and its settings are undone. Only the
// clients' end can do the first; opening it must not pass for another client.
void SerialLine::Refresh() {
    {
        const UniqueFd clientEnd(open(path_.c_str(), O_RDWR | O_NOCTTY | O_CLOEXEC));
        tcflush(clientEnd.Get(), TCIFLUSH);
    }
    SetRaw(modemEnd_.Get());
    watch_.Reset(watchId_);
}

void SerialLine::Restart() {
    tcflush(modemEnd_.Get(), TCIFLUSH);
    SetRaw(modemEnd_.Get());
}

size_t SerialLine::Write(const std::string& bytes) {
    const ssize_t count = write(modemEnd_.Get(), bytes.data(), bytes.size());
    return count > 0 ? static_cast<size_t>(count) : 0;
}

}  // namespace taviwireless::sim
