#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_FLAG_FILE_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_FLAG_FILE_H

namespace taviwireless::wireless {

// A file that exists while a caller in some process does what only one should do. A second caller
// that is refused takes the flag away as well, so this is no lock: whoever hangs or is killed
// leaves nothing behind that keeps the next but one from its work.
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

    // False when it is raised already. One that cannot be created keeps nobody from the work.
    bool Raise() const;

  private:
    const char* path_;
};

}  // namespace taviwireless::wireless

#endif
