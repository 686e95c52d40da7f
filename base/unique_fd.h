// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_UNIQUE_FD_H
#define TAVIWIRELESS_BASE_UNIQUE_FD_H

#include <unistd.h>

#include <utility>

namespace taviwireless {

// A descriptor that closes itself; negative when there is none.
class UniqueFd {
  public:
    explicit UniqueFd(int number = -1) : number_(number) {}
    UniqueFd(UniqueFd&& other) noexcept : number_(other.Release()) {}
    UniqueFd& operator=(UniqueFd&& other) noexcept {
        std::swap(number_, other.number_);
        return *this;
    }
    ~UniqueFd() { Close(); }

    explicit operator bool() const { return number_ >= 0; }
    int Get() const { return number_; }
    int Release() { return std::exchange(number_, -1); }
    void Close() {
        if (number_ >= 0) {
            close(Release());
        }
    }

  private:
    int number_;
};

}  // namespace taviwireless

#endif
