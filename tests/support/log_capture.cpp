// SPDX-License-Identifier: MIT
#include "tests/support/log_capture.h"

#include <algorithm>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <mutex>
#include <new>

namespace taviwireless::test {
namespace {

std::mutex mutex;
std::vector<LogCapture*> captures;

}  // namespace

LogCapture::LogCapture() {
    const std::lock_guard<std::mutex> lock(mutex);
    captures.push_back(this);
}

LogCapture::~LogCapture() {
    const std::lock_guard<std::mutex> lock(mutex);
    captures.erase(std::find(captures.begin(), captures.end(), this));
}

std::vector<LogLine> LogCapture::Lines() const {
    const std::lock_guard<std::mutex> lock(mutex);
    return lines_;
}

int LogCapture::Count(const std::string& part) const {
    const auto lines = Lines();
    return std::count_if(lines.begin(), lines.end(), [&part](const LogLine& line) {
        return line.text.find(part) != std::string::npos;
    });
}

std::string LogCapture::Text() const {
    std::string text;
    for (const auto& line : Lines()) {
        text += line.text + "\n";
    }
    return text;
}

void LogCapture::Clear() {
    const std::lock_guard<std::mutex> lock(mutex);
    lines_.clear();
}

void LogCapture::Record(int priority, const std::string& text) {
    const std::lock_guard<std::mutex> lock(mutex);
    for (LogCapture* capture : captures) {
        capture->lines_.push_back({priority, text});
    }
}

}  // namespace taviwireless::test

// The C library's functions, taken over for the whole program. <syslog.h> is not included: with
// _FORTIFY_SOURCE it defines these names inline. The __..._chk names are what callers compiled with
// it use.
#define TAKEN_OVER __attribute__((visibility("default")))
extern "C" {

TAKEN_OVER void vsyslog(int priority, const char* format, va_list arguments) {
    constexpr int kMaxLine = 4096;
    const int savedErrno = errno;
    char line[kMaxLine];
    vsnprintf(line, sizeof line, format, arguments);
    try {
        taviwireless::test::LogCapture::Record(priority, line);
    } catch (const std::bad_alloc&) {
        // The C library's throws nothing either: a line more or less.
    }
    errno = savedErrno;
}

TAKEN_OVER void syslog(int priority, const char* format, ...) {
    va_list arguments;
    va_start(arguments, format);
    vsyslog(priority, format, arguments);
    va_end(arguments);
}

TAKEN_OVER void __vsyslog_chk(int priority, int, const char* format, va_list arguments) {
    vsyslog(priority, format, arguments);
}

TAKEN_OVER void __syslog_chk(int priority, int, const char* format, ...) {
    va_list arguments;
    va_start(arguments, format);
    vsyslog(priority, format, arguments);
    va_end(arguments);
}

}  // extern "C"
