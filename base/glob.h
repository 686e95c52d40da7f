// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_GLOB_H
#define TAVIWIRELESS_BASE_GLOB_H

#include <glob.h>

namespace taviwireless {

// The folders whose paths match a pattern; frees itself.
class FolderMatches {
  public:
    explicit FolderMatches(const char* pattern)
        : result_(glob(pattern, GLOB_ONLYDIR, nullptr, &matches_)) {}
    ~FolderMatches() { globfree(&matches_); }
    FolderMatches(const FolderMatches&) = delete;
    FolderMatches& operator=(const FolderMatches&) = delete;

    // What went wrong, as a sentence; null when nothing did. That nothing matches is no fault.
    const char* Fault() const {
        return result_ == GLOB_NOSPACE   ? "Failed to allocate memory to hold the result"
               : result_ == GLOB_ABORTED ? "There was an error opening a directory"
                                         : nullptr;
    }
    char** begin() const { return matches_.gl_pathv; }
    char** end() const { return matches_.gl_pathv + matches_.gl_pathc; }

  private:
    glob_t matches_{};
    int result_;
};

}  // namespace taviwireless

#endif
