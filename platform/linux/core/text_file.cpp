// Whole text files: read, and replaced in one step.
#include "text_file.h"

#include <fcntl.h>
#include <sys/file.h>

#include <climits>
#include <optional>

#include "failure.h"

namespace tavicore {
namespace {

// For whatever a foreign hand may have put at the path: no waiting for a fifo's or a serial line's
// other end, no terminal taken over.
constexpr int kCarefully = O_CLOEXEC | O_NONBLOCK | O_NOCTTY;
constexpr int kMostLinks = 40;  // as the kernel follows

void WriteAll(int descriptor, std::string_view text) {
    while (!text.empty()) {
        const ssize_t count = write(descriptor, text.data(), text.size());
        if (count < 0 && errno != EINTR) {
            throw Failure{VEXAC_ERR_IO};
        }
        text.remove_prefix(count > 0 ? count : 0);
    }
}

std::string DirectoryOf(const std::string& path) {
    return path.substr(0, path.rfind('/') + 1);
}

// Where the path leads when it is a symbolic link, also when nothing is there yet.
std::string FollowLinks(std::string path) {
    for (int links = 0; links < kMostLinks; ++links) {
        char target[PATH_MAX];
        const ssize_t length = readlink(path.c_str(), target, sizeof target);
        if (length < 0) {
            return path;
        }
        const std::string text(target, length);
        path = text.front() == '/' ? text : DirectoryOf(path) + text;
    }
    throw Failure{VEXAC_ERR_IO};
}

// The place of a file that is to be replaced. The lock is on its directory: a lock on the file
// would be on the file that is being replaced, and a file to lock would be one more to leave
// behind.
class LockedPlace {
  public:
    LockedPlace(const char* path, IfMissing ifMissing) {
        const std::string place = FollowLinks(path);
        const std::string directory = DirectoryOf(place);
        name_ = place.substr(directory.size());
        newName_ = "." + name_ + ".new";
        directory_ = UniqueFd(
            open(directory.empty() ? "." : directory.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
        if (!directory_) {
            throw ifMissing == IfMissing::kFail ? FileFailure() : Failure{VEXAC_ERR_IO};
        }
        if (name_.empty()) {
            throw Failure{VEXAC_ERR_IO};
        }
        while (flock(directory_.Get(), LOCK_EX) != 0) {
            if (errno != EINTR) {
                throw Failure{VEXAC_ERR_IO};
            }
        }
    }
    // Closing alone would not unlock while a child that another thread forked has the descriptor.
    ~LockedPlace() { flock(directory_.Get(), LOCK_UN); }
    LockedPlace(const LockedPlace&) = delete;
    LockedPlace& operator=(const LockedPlace&) = delete;

    // Nothing when there is no file.
    std::optional<TextFile> Read() const {
        UniqueFd file(openat(directory_.Get(), name_.c_str(), O_RDONLY | O_NOFOLLOW | kCarefully));
        if (!file && errno == ENOENT) {
            return std::nullopt;
        }
        return TextFile(std::move(file));
    }

    // `like`, when it is not null, gives the new file's mode and owner.
    void Replace(const std::string& text, const struct stat* like) const {
        try {
            WriteNew(text, like);
            if (renameat(directory_.Get(), newName_.c_str(), directory_.Get(), name_.c_str()) !=
                0) {
                throw Failure{VEXAC_ERR_IO};
            }
        } catch (...) {
            unlinkat(directory_.Get(), newName_.c_str(), 0);
            throw;
        }
        fsync(directory_.Get());  // a failure here cannot take the new text back
    }

  private:
    void WriteNew(const std::string& text, const struct stat* like) const {
        unlinkat(directory_.Get(), newName_.c_str(), 0);
        // The old file may hold a key that only its owner may read: 0600 until it has its own mode.
        UniqueFd file(openat(directory_.Get(), newName_.c_str(),
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

    std::string name_;
    std::string newName_;
    UniqueFd directory_;
};

}  // namespace

TextFile::TextFile(const char* path) : TextFile(UniqueFd(open(path, O_RDONLY | kCarefully))) {}

TextFile::TextFile(UniqueFd file) : file_(std::move(file)) {
    if (!file_) {
        throw FileFailure();
    }
    if (fstat(file_.Get(), &status_) != 0 || !S_ISREG(status_.st_mode)) {
        throw Failure{VEXAC_ERR_IO};
    }
}

std::string TextFile::Read() const {
    std::string text;
    size_t end = status_.st_size + 1;  // one byte more than expected, so that the end shows
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
            throw Failure{VEXAC_ERR_IO};
        }
        if (count == 0) {
            break;
        }
        length += count > 0 ? count : 0;
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
    std::string text = oldText;
    change(&text);
    if (!old || text != oldText) {
        place.Replace(text, old ? &old->Status() : nullptr);
    }
}

void ReplaceFile(const char* path, const std::string& text) {
    const LockedPlace place(path, IfMissing::kCreate);
    place.Read();  // refuses what is no regular file
    place.Replace(text, nullptr);
}

}  // namespace tavicore
