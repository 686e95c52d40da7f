// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_CORE_SECTION_INDEX_H
#define TAVIWIRELESS_PLATFORM_LINUX_CORE_SECTION_INDEX_H

#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "text_file.h"

// Where the sections of a text stand.
namespace tavicore {

// The bytes from begin up to end are its lines, without the header.
struct Section {
    std::string name;
    size_t begin;
    size_t end;
};

class SectionIndex {
  public:
    SectionIndex() = default;
    explicit SectionIndex(std::string_view text);
    SectionIndex(SectionIndex&&) = default;
    SectionIndex& operator=(SectionIndex&&) = default;

    const std::vector<Section>& Sections() const { return sections_; }
    // Null when there is none. An exact match goes before one without regard to case.
    const Section* Find(const std::string& name) const;

  private:
    std::vector<Section> sections_;
    std::unordered_map<std::string_view, size_t> firstByName_;  // names of sections_
};

// The index of a file, which stands until this thread's next call. It is kept while the file stays
// the same, so that reading a file section by section takes no more than its size. It knows names
// and places; no value of the file, which may be a key, is kept.
const SectionIndex& IndexOf(const TextFile& file);

}  // namespace tavicore

#endif
