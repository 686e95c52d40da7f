#ifndef TAVIWIRELESS_WIRELESS_FLAG_FILE_H
#define TAVIWIRELESS_WIRELESS_FLAG_FILE_H

#include <tavicore/file.h>

namespace taviwireless::wireless {

// A file that exists while a caller in some process does what only one should do. A second caller
// that is refused takes the flag away as well, so this is no lock: whoever hangs or is killed
// leaves nothing behind that keeps the next but one from its work.
class FlagFile {
  public:
    explicit FlagFile(const char* path) : path_(path) {}
    ~FlagFile() { VEXACSysUnlink(path_); }
    FlagFile(const FlagFile&) = delete;
    FlagFile& operator=(const FlagFile&) = delete;

    // False when it is raised already.
    bool Raise() const {
        if (VEXACFileExist(path_)) {
            return false;
        }
        VEXACFileTouch(path_);
        return true;
    }

  private:
    const char* path_;
};

}  // namespace taviwireless::wireless

#endif
