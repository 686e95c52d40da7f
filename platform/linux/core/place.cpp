// SPDX-License-Identifier: MIT
#include "place.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <climits>
#include <optional>

#include "base/trusted_file.h"
#include "failure.h"

namespace tavicore {
namespace {

constexpr int kMostLinks = 40;  // as the kernel follows

// The text of the link at the place; nothing when there is none.
std::optional<std::string> ReadLink(const Place& place) {
    // The owner and the text are of one and the same link, whatever is put in its place meanwhile.
    const UniqueFd link(
        openat(place.directory.Get(), place.name.c_str(), O_PATH | O_NOFOLLOW | O_CLOEXEC));
    struct stat status {};
    if (!link || fstat(link.Get(), &status) != 0 || !S_ISLNK(status.st_mode)) {
        return std::nullopt;
    }
    if (place.isShared && !taviwireless::IsTrustedOwner(status.st_uid)) {
        throw Failure{VEXAC_ERR_IO};
    }
    char target[PATH_MAX];
    const ssize_t length = readlinkat(link.Get(), "", target, sizeof target);
    if (length < 0) {
        throw FileFailure();
    }
    return std::string(target, static_cast<size_t>(length));
}

Place EntryOf(const std::string& directory, const std::string& path) {
    Place place;
    place.directory = UniqueFd(
        open(directory.empty() ? "." : directory.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC));
    struct stat status {};
    if (!place.directory || fstat(place.directory.Get(), &status) != 0) {
        throw FileFailure();
    }
    place.owner = status.st_uid;
    place.isShared = IsShared(status);
    place.name = path.substr(directory.size());
    if (place.name.empty()) {
        throw Failure{VEXAC_ERR_IO};  // a folder
    }
    return place;
}

}  // namespace

Place FindPlace(const std::string& path) {
    std::string current = path;
    for (int links = 0; links < kMostLinks; ++links) {
        const std::string directory = current.substr(0, current.rfind('/') + 1);
        Place place = EntryOf(directory, current);
        const auto target = ReadLink(place);
        if (!target) {
            return place;
        }
        current = target->front() == '/' ? *target : directory + *target;
    }
    throw Failure{VEXAC_ERR_IO};
}

}  // namespace tavicore
