// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_TRANSCRIPT_H
#define TAVIWIRELESS_SIM_TRANSCRIPT_H

#include <string>

#include "base/unique_file.h"

namespace taviwireless::sim {

// What went over the lines, with times; to a file, or nowhere.
class Transcript {
  public:
    Transcript() = default;
    // "-" is standard error. Throws std::runtime_error when the file cannot be written.
    explicit Transcript(const std::string& path);

    // direction: '<' from the client, '>' to the client.
    void Note(const std::string& port, char direction, const std::string& bytes);

  private:
    UniqueFile file_;
};

}  // namespace taviwireless::sim

#endif
