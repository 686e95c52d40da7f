// SPDX-License-Identifier: MIT
// Files and folders, and files that are lists of lines.
#include <dirent.h>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <tavicore/file.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "failure.h"
#include "line.h"
#include "place.h"
#include "text_file.h"

using namespace tavicore;

namespace {

constexpr mode_t kNewFileMode = 0644;

void RequirePath(const char* path) {
    if (path == nullptr || *path == '\0') {
        throw Failure{VEXAC_ERR_BAD_PARAMETER};
    }
}

void RequireLine(const char* line) {
    if (line == nullptr || HasLineBreak(line)) {
        throw Failure{VEXAC_ERR_BAD_PARAMETER};
    }
}

// Runs a system call that reports through errno; 0 when it succeeds.
template <typename Call>
int Try(Call call) {
    return Guarded(-1, [&] {
        if (!call()) {
            throw FileFailure();
        }
        return 0;
    });
}

// What stands at the path, where links lead; throws when there is nothing or it cannot be told.
struct stat LookAt(const char* path) {
    RequireAll(path);
    struct stat status {};
    if (stat(path, &status) != 0) {
        throw FileFailure();
    }
    return status;
}

struct CloseDirectory {
    void operator()(DIR* directory) const { closedir(directory); }
};

bool IsDirectory(int parent, const char* name) {
    struct stat status {};
    return fstatat(parent, name, &status, 0) == 0 && S_ISDIR(status.st_mode);
}

std::vector<std::string> FileNames(const char* directory, const char* prefix) {
    const std::unique_ptr<DIR, CloseDirectory> open(opendir(directory));
    if (!open) {
        throw FileFailure();
    }
    std::vector<std::string> names;
    for (;;) {
        errno = 0;
        const dirent* entry = readdir(open.get());
        if (entry == nullptr && errno != 0) {
            throw Failure{VEXAC_ERR_IO};
        }
        if (entry == nullptr) {
            break;
        }
        if (std::strncmp(entry->d_name, prefix, std::strlen(prefix)) == 0 &&
            !IsDirectory(dirfd(open.get()), entry->d_name)) {
            names.emplace_back(entry->d_name);
        }
    }
    std::sort(names.begin(), names.end(), [](const std::string& a, const std::string& b) {
        return strverscmp(a.c_str(), b.c_str()) < 0;
    });
    return names;
}

}  // namespace

int VEXACFileExist(const char* path) {
    return Guarded(0, [&] {
        LookAt(path);
        return 1;
    });
}

int VEXACFileCheckDir(const char* path) {
    return Guarded(0, [&] {
        if (!S_ISDIR(LookAt(path).st_mode)) {
            throw Failure{VEXAC_ERR_NOT_FOUND};
        }
        return 1;
    });
}

int VEXACFileTouch(const char* path) {
    return Try([path] {
        RequirePath(path);
        const Place place = FindPlace(path);
        const UniqueFd file(openat(
            place.directory.Get(), place.name.c_str(),
            O_WRONLY | O_CREAT | O_NOFOLLOW | O_CLOEXEC | O_NONBLOCK | O_NOCTTY, kNewFileMode));
        return file && futimens(file.Get(), nullptr) == 0;
    });
}

int VEXACSysUnlink(const char* path) {
    return Try([path] {
        RequirePath(path);
        return unlink(path) == 0;
    });
}

int VEXACSysRename(const char* oldPath, const char* newPath) {
    return Try([=] {
        RequirePath(oldPath);
        RequirePath(newPath);
        return rename(oldPath, newPath) == 0;
    });
}

int VEXACFileEnumDir(const char* directory, const char* name, VEXACSzList** list, int flags) {
    return Guarded(-1, [&] {
        RequirePath(directory);
        RequireAll(name, list);
        if (flags != VEXAC_ENUM_FILES) {
            throw Failure{VEXAC_ERR_BAD_PARAMETER};
        }
        const std::vector<std::string> names = FileNames(directory, name);
        for (const std::string& found : names) {
            if (VEXACSzListPush(list, found.c_str()) < 0) {
                return -1;
            }
        }
        return static_cast<int>(names.size());
    });
}

int VEXACFileRemoveLine(const char* file, const char* line) {
    return Guarded(-1, [&] {
        RequirePath(file);
        RequireLine(line);
        int removed = 0;
        ChangeText(file, IfMissing::kFail, [&](std::string* text) {
            std::string kept;
            for (std::string_view rest = *text; !rest.empty();) {
                const std::string_view candidate = TakeLine(&rest);
                if (candidate.substr(0, candidate.find('\n')) == line) {
                    ++removed;
                } else {
                    kept += candidate;
                }
            }
            *text = kept;
        });
        return removed;
    });
}

int VEXACFileAddLine(const char* file, const char* after, const char* line, int /*flags*/) {
    return Guarded(-1, [&] {
        RequirePath(file);
        RequireLine(line);
        if (after != nullptr) {
            throw Failure{VEXAC_ERR_BAD_PARAMETER};
        }
        ChangeText(file, IfMissing::kCreate, [line](std::string* text) {
            EndLastLine(text);
            *text += std::string(line) + '\n';
        });
        return 1;
    });
}

int VEXACFileCloseLock(int descriptor) {
    return Try([descriptor] { return flock(descriptor, LOCK_UN) == 0; });
}
