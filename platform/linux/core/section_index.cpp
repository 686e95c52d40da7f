// SPDX-License-Identifier: MIT
// Where the sections of a text stand.
#include "section_index.h"

#include <strings.h>
#include <time.h>

#include <optional>

#include "line.h"

namespace tavicore {

namespace {

struct KeptIndex {
    struct stat status {};
    bool isSettled = false;
    SectionIndex index;
};

// The name in a header line; nothing for other lines.
std::optional<std::string> ReadHeader(std::string_view line) {
    const std::string_view text = TrimLeft(TrimRight(Readable(line)));
    if (text.size() < 2 || text.front() != '[' || text.back() != ']') {
        return std::nullopt;
    }
    return std::string(text.substr(1, text.size() - 2));
}

// Whether both are of one unchanged file. The change time, which no program can set, tells a file
// from another that got its inode number later.
bool IsSame(const struct stat& a, const struct stat& b) {
    return a.st_dev == b.st_dev && a.st_ino == b.st_ino && a.st_size == b.st_size &&
           a.st_ctim.tv_sec == b.st_ctim.tv_sec && a.st_ctim.tv_nsec == b.st_ctim.tv_nsec;
}

// Whether any later change of the file will show in its change time. A change within one tick of
// the clock that files are stamped with does not show. A tick is 10 ms at most, and 2 s on file
// systems that keep whole seconds.
bool IsSettled(const struct stat& status, const timespec& now) {
    constexpr long long kNanosecondsPerSecond = 1'000'000'000;
    constexpr long long kTwoTicks = 20'000'000;
    const long long age = (now.tv_sec - status.st_ctim.tv_sec) * kNanosecondsPerSecond +
                          now.tv_nsec - status.st_ctim.tv_nsec;
    return age > (status.st_ctim.tv_nsec != 0 ? kTwoTicks : 3 * kNanosecondsPerSecond);
}

}  // namespace

SectionIndex::SectionIndex(std::string_view text) {
    // Only lines that hold a "[" are looked at.
    for (size_t bracket = text.find('['); bracket != text.npos;) {
        const size_t lineBegin = text.rfind('\n', bracket) + 1;
        std::string_view rest = text.substr(lineBegin);
        auto name = ReadHeader(TakeLine(&rest));
        const size_t lineEnd = text.size() - rest.size();
        if (name) {
            if (!sections_.empty()) {
                sections_.back().end = lineBegin;
            }
            sections_.push_back({std::move(*name), lineEnd, text.size()});
        }
        bracket = text.find('[', lineEnd);
    }
    firstByName_.reserve(sections_.size());
    for (size_t i = 0; i < sections_.size(); ++i) {
        firstByName_.emplace(sections_[i].name, i);
    }
}

const Section* SectionIndex::Find(const std::string& name) const {
    const auto exact = firstByName_.find(std::string_view(name));
    if (exact != firstByName_.end()) {
        return &sections_[exact->second];
    }
    for (const Section& section : sections_) {
        if (strcasecmp(section.name.c_str(), name.c_str()) == 0) {
            return &section;
        }
    }
    return nullptr;
}

const SectionIndex& IndexOf(const TextFile& file) {
    static thread_local KeptIndex kept;
    if (!kept.isSettled || !IsSame(file.Status(), kept.status)) {
        timespec now{};
        clock_gettime(CLOCK_REALTIME_COARSE, &now);  // the clock that files are stamped with
        kept.isSettled = false;                      // until all of it is of the same file
        kept.index = SectionIndex(file.Read());
        kept.status = file.Status();
        kept.isSettled = IsSettled(kept.status, now);
    }
    return kept.index;
}

}  // namespace tavicore
