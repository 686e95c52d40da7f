// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_MODEM_SPARKLINE_H
#define TAVIWIRELESS_CLI_MODEM_SPARKLINE_H

#include <cstddef>
#include <string>
#include <vector>

namespace taviwireless::cli {

// The last values that were seen of a percentage, the oldest first.
class Trend {
  public:
    void Add(int percent);
    // A character for each value.
    std::string Draw() const;

  private:
    std::vector<int> values_;
};

}  // namespace taviwireless::cli

#endif
