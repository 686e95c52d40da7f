// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_CORE_TEXT_FILE_H
#define TAVIWIRELESS_PLATFORM_LINUX_CORE_TEXT_FILE_H

#include <sys/stat.h>

#include <functional>
#include <string>

#include "place.h"

// Whole text files: read, and replaced in one step. Everything here throws Failure.
namespace tavicore {

// A regular file that is open for reading. Anything else at the path is a failure and is never
// waited for; so is, in a folder that others can write in, a file that is neither root's nor one's
// own, or one of more than 64 KB.
class TextFile {
  public:
    explicit TextFile(const char* path);
    explicit TextFile(const Place& place);

    // As it was when the file was opened.
    const struct stat& Status() const { return status_; }
    std::string Read() const;
    // The bytes from begin up to end; fewer when the file has become shorter.
    std::string Read(size_t begin, size_t end) const;

  private:
    UniqueFd file_;
    struct stat status_ {};
};

std::string ReadText(const char* path);

enum class IfMissing { kFail, kCreate };

// Replaces the text of a file by what `change` makes of it; a missing file that is to be created is
// the empty text. The file keeps its mode and owner, a new one has 0644 less the umask; a symbolic
// link stays and leads to the new text. A text that `change` leaves alone is not written. While it
// runs, every other writer of the file waits.
//
// The new text is written and synced beside the file as ".NAME.new" and renamed, so at any moment
// the path names the old or the new text. What a killed writer leaves of ".NAME.new", the next one
// removes.
void ChangeText(const char* path, IfMissing ifMissing,
                const std::function<void(std::string* text)>& change);

// Puts a new file with this text in the place of what regular file stands there.
void ReplaceFile(const char* path, const std::string& text);

}  // namespace tavicore

#endif
