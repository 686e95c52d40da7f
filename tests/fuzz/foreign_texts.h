// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_FUZZ_FOREIGN_TEXTS_H
#define TAVIWIRELESS_TESTS_FUZZ_FOREIGN_TEXTS_H

#include <vector>

#include "base/fixed_field.h"
#include "tests/fuzz/fuzz.h"

namespace taviwireless::fuzz {

// Texts of a record, and harmless ones of the same lengths for another: the first is made of bytes
// that nothing else holds, the second of the next ones ... So what is to be made of the record is
// known from what is made of the harmless one.
class ForeignTexts {
  public:
    template <size_t kSize>
    void Take(Input& input, char (&field)[kSize], char (&harmless)[kSize]) {
        CopyField(field, input.Text());
        texts_.emplace_back(field);
        CopyField(harmless,
                  std::string(texts_.back().size(), static_cast<char>(kFirst + texts_.size() - 1)));
    }

    std::string PutInto(const std::string& harmless) const {
        std::string text;
        for (size_t i = 0; i < harmless.size(); ++i) {
            const size_t number = static_cast<unsigned char>(harmless[i]) - kFirst;
            const bool isFirst = i == 0 || harmless[i - 1] != harmless[i];
            text += number >= texts_.size() ? std::string(1, harmless[i])
                    : isFirst               ? texts_[number]
                                            : "";
        }
        return text;
    }

  private:
    static constexpr size_t kFirst = 0x0e;
    std::vector<std::string> texts_;
};

}  // namespace taviwireless::fuzz

#endif
