// SPDX-License-Identifier: MIT
// What is being waited for, and for how long: on standard error, while a call of the library blocks.
#include <unistd.h>

#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <mutex>
#include <system_error>

#include "base/terminal_columns.h"
#include "cli/signal_free_thread.h"
#include "cli/terminal.h"
#include "cli/text_width.h"

namespace taviwireless::cli {

namespace {

class Progress {
  public:
    // The text, and from its first second on the seconds since it was shown first.
    void Show(const std::string& text) {
        const std::lock_guard lock(mutex_);
        if (text == text_) {
            return;
        }
        text_ = text;
        begin_ = Clock::now();
        if (!TakesEscapes(STDERR_FILENO)) {  // nothing can be replaced
            Write(text.empty() ? "" : text + "\n");
            return;
        }
        Draw();
        if (!text.empty() && !ticker_.joinable()) {
            StartTicking();
        }
        changed_.notify_one();
    }

    void End() {
        Show("");
        if (ticker_.joinable()) {
            {
                const std::lock_guard lock(mutex_);
                isOver_ = true;
            }
            changed_.notify_one();
            ticker_.join();
            isOver_ = false;
        }
    }

  private:
    using Clock = std::chrono::steady_clock;

    static void Write(const std::string& text) { std::fputs(text.c_str(), stderr); }

    void Draw() const {
        const auto seconds =
            std::chrono::duration_cast<std::chrono::seconds>(Clock::now() - begin_).count();
        const std::string line =
            text_.empty() || seconds == 0 ? text_ : text_ + " " + std::to_string(seconds) + " s";
        const int columns = ColumnsOf(STDERR_FILENO);
        Write("\r\033[K" + Cut(line, static_cast<size_t>(columns - 1)));
    }

    void StartTicking() {
        try {
            ticker_ = StartBeside([this] { Tick(); });
        } catch (const std::system_error&) {  // then the text stands there alone
        }
    }

    void Tick() {
        std::unique_lock lock(mutex_);
        while (!isOver_) {
            if (text_.empty()) {
                changed_.wait(lock);
            } else if (changed_.wait_for(lock, std::chrono::seconds(1)) ==
                           std::cv_status::timeout &&
                       !text_.empty()) {
                Draw();
            }
        }
    }

    std::mutex mutex_;
    std::condition_variable changed_;
    std::string text_;
    Clock::time_point begin_;
    bool isOver_ = false;
    std::thread ticker_;
};

Progress& TheProgress() {
    static auto* const progress = new Progress;  // its thread goes on until the program ends
    return *progress;
}

}  // namespace

void ShowProgress(const std::string& text) {
    if (isatty(STDERR_FILENO) != 0) {
        TheProgress().Show(text);
    }
}

void EndProgress() {
    if (isatty(STDERR_FILENO) != 0) {
        TheProgress().End();
    }
}

}  // namespace taviwireless::cli
