// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_LOG_CAPTURE_H
#define TAVIWIRELESS_TESTS_SUPPORT_LOG_CAPTURE_H

#include <string>
#include <vector>

namespace taviwireless::test {

// One call of syslog().
struct LogLine {
    int priority;      // as passed: LOG_ERR, LOG_INFO, ...
    std::string text;  // formatted
};

// Records what is written to the system log while it lives.
//
// A program linked with tavi_test_support defines syslog() and vsyslog() itself, and the calls of
// the shared libraries it loads end up there too: no line reaches the machine's log, and one that
// is logged while no LogCapture lives is dropped. Captures may overlap; each gets every line.
class LogCapture {
  public:
    LogCapture();
    ~LogCapture();
    LogCapture(const LogCapture&) = delete;
    LogCapture& operator=(const LogCapture&) = delete;

    std::vector<LogLine> Lines() const;
    bool Has(const std::string& part) const { return Count(part) > 0; }
    int Count(const std::string& part) const;  // lines that contain `part`
    std::string Text() const;                  // every line followed by "\n", to print or search
    void Clear();

    // Adds a line to every live capture; syslog() calls it.
    static void Record(int priority, const std::string& text);

  private:
    std::vector<LogLine> lines_;
};

}  // namespace taviwireless::test

#endif
