// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_FLAG_FILE_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_FLAG_FILE_H

namespace taviwireless::wireless {

// A file that exists while a caller in some process does what only one should do. Compatible with
// earlier releases: a second caller, who is refused, removes the flag as well. So this is no lock,
// and a caller that hangs or was killed keeps one other caller from its work at most.
//
// It lies in a folder in which others can write. Only a regular file of root or of the own user is
// a flag; whatever else stands there is removed.
class FlagFile {
  public:
    explicit FlagFile(const char* path) : path_(path) {}
    ~FlagFile();
    FlagFile(const FlagFile&) = delete;
    FlagFile& operator=(const FlagFile&) = delete;

    static bool IsRaised(const char* path);

    // False when it is raised already. True when the file cannot be created: that is no reason not
    // to work.
    bool Raise() const;

  private:
    const char* path_;
};

}  // namespace taviwireless::wireless

#endif
