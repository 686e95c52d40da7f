// SPDX-License-Identifier: MIT
// Whole text files: read, and replaced in one step.
#include "text_file.h"

#include <fcntl.h>

#include <optional>

#include "base/trusted_file.h"
#include "failure.h"
#include "file_lock.h"

namespace tavicore {
namespace {

// For whatever may be at the path: no waiting for a fifo's or a serial line's other end, no
// terminal taken over.
constexpr int kCarefully = O_RDONLY | O_NOFOLLOW | O_CLOEXEC | O_NONBLOCK | O_NOCTTY;

// Bytes that a changed text is mostly longer than the old one at most.
constexpr size_t kRoomForMore = 4096;

void WriteAll(int descriptor, std::string_view text) {
    while (!text.empty()) {
        const ssize_t count = write(descriptor, text.data(), text.size());
        if (count < 0 && errno != EINTR) {
            throw Failure{VEXAC_ERR_IO};
        }
        text.remove_prefix(count > 0 ? static_cast<size_t>(count) : 0);
    }
}

// Whether a file that is no link would be read wherever it stood, or does not stand where others
// can put it.
bool IsPlain(const struct stat& status, const std::string& path) {
    struct stat folder {};
    return taviwireless::IsTrustedOwner(status.st_uid) &&
           (status.st_size <= taviwireless::kTrustedFileLimit ||
            (stat(path.substr(0, path.rfind('/') + 1).c_str(), &folder) == 0 && !IsShared(folder)));
}

Place FindForWriting(const char* path, IfMissing ifMissing) {
    try {
        return FindPlace(path);
    } catch (const Failure&) {
        if (ifMissing == IfMissing::kFail) {
            throw;
        }
        throw Failure{VEXAC_ERR_IO};  // no folder to create it in
    }
}

// The place of a file that is to be replaced, which no other writer replaces meanwhile.
class LockedPlace {
  public:
    LockedPlace(const char* path, IfMissing ifMissing)
        : place_(FindForWriting(path, ifMissing)),
          newName_("." + place_.name + ".new"),
          lock_(place_, path) {}

    // Nothing when there is no file.
    std::optional<TextFile> Read() const {
        try {
            return TextFile(place_);
        } catch (const Failure& failure) {
            if (failure.code != VEXAC_ERR_NOT_FOUND) {
                throw;
            }
            return std::nullopt;
        }
    }

    // Throws when something stands there that is no regular file, whoever's it is.
    void RequireReplaceable() const {
        struct stat status {};
        const int result = fstatat(Directory(), place_.name.c_str(), &status, AT_SYMLINK_NOFOLLOW);
        if (result == 0 ? !S_ISREG(status.st_mode) : errno != ENOENT) {
            throw Failure{VEXAC_ERR_IO};
        }
    }

    // `like`, when it is not null, gives the new file's mode and owner.
    void Replace(const std::string& text, const struct stat* like) const {
        if (!lock_.IsTaken()) {
            throw Failure{VEXAC_ERR_IO};
        }
        try {
            WriteNew(text, like);
            if (renameat(Directory(), newName_.c_str(), Directory(), place_.name.c_str()) != 0) {
                throw Failure{VEXAC_ERR_IO};
            }
        } catch (...) {
            unlinkat(Directory(), newName_.c_str(), 0);
            throw;
        }
        const UniqueFd folder(openat(Directory(), ".", O_RDONLY | O_DIRECTORY | O_CLOEXEC));
        fsync(folder.Get());  // a failure here cannot take the new text back
    }

  private:
    int Directory() const { return place_.directory.Get(); }

    void WriteNew(const std::string& text, const struct stat* like) const {
        unlinkat(Directory(), newName_.c_str(), 0);
        // The old file may hold a key that only its owner may read: 0600 until it has its own mode.
        UniqueFd file(openat(Directory(), newName_.c_str(),
                             O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC,
                             like != nullptr ? 0600 : 0644));
        // The owner first, since giving a file away takes set-id bits off its mode.
        if (!file || (like != nullptr && (fchown(file.Get(), like->st_uid, like->st_gid) != 0 ||
                                          fchmod(file.Get(), like->st_mode & 07777) != 0))) {
            throw Failure{VEXAC_ERR_IO};
        }
        WriteAll(file.Get(), text);
        if (fsync(file.Get()) != 0) {
            throw Failure{VEXAC_ERR_IO};
        }
    }

    const Place place_;
    const std::string newName_;
    const FileLock lock_;
};

}  // namespace

// Most files are plain, and then there is no place to be found.
TextFile::TextFile(const char* path) : file_(open(path, kCarefully)) {
    const bool isPlain = file_ && fstat(file_.Get(), &status_) == 0 && S_ISREG(status_.st_mode) &&
                         IsPlain(status_, path);
    if (!isPlain) {
        *this = TextFile(FindPlace(path));
    }
}

TextFile::TextFile(const Place& place)
    : file_(place.isShared
                ? taviwireless::OpenTrustedAt(place.directory.Get(), place.name)
                : UniqueFd(openat(place.directory.Get(), place.name.c_str(), kCarefully))) {
    if (!file_) {
        throw FileFailure();
    }
    if (fstat(file_.Get(), &status_) != 0 || !S_ISREG(status_.st_mode)) {
        throw Failure{VEXAC_ERR_IO};
    }
}

std::string TextFile::Read() const {
    std::string text;
    // One byte more than expected, so that the end shows.
    size_t end = static_cast<size_t>(status_.st_size) + 1;
    for (;;) {
        text += Read(text.size(), end);
        if (text.size() < end) {
            return text;
        }
        end *= 2;
    }
}

std::string TextFile::Read(size_t begin, size_t end) const {
    std::string text(end - begin, '\0');
    size_t length = 0;
    while (length < text.size()) {
        const ssize_t count = pread(file_.Get(), &text[length], text.size() - length,
                                    static_cast<off_t>(begin + length));
        if (count < 0 && errno != EINTR) {
            throw FileFailure();
        }
        if (count == 0) {
            break;
        }
        length += count > 0 ? static_cast<size_t>(count) : 0;
    }
    text.resize(length);
    return text;
}

std::string ReadText(const char* path) {
    return TextFile(path).Read();
}

void ChangeText(const char* path, IfMissing ifMissing,
                const std::function<void(std::string* text)>& change) {
    const LockedPlace place(path, ifMissing);
    const auto old = place.Read();
    if (!old && ifMissing == IfMissing::kFail) {
        throw Failure{VEXAC_ERR_NOT_FOUND};
    }
    const std::string oldText = old ? old->Read() : std::string();
    std::string text;
    text.reserve(oldText.size() + kRoomForMore);
    text = oldText;
    change(&text);
    if (!old || text != oldText) {
        place.Replace(text, old ? &old->Status() : nullptr);
    }
}

void ReplaceFile(const char* path, const std::string& text) {
    const LockedPlace place(path, IfMissing::kCreate);
    place.RequireReplaceable();
    place.Replace(text, nullptr);
}

}  // namespace tavicore
