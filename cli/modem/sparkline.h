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
    // A character for each value, the higher the more: of a block of growing height, or in ASCII.
    std::string Draw(bool isUTF8) const;

  private:
    std::vector<int> values_;
};

}  // namespace taviwireless::cli

#endif
