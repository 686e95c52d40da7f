// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_FIXED_FIELD_H
#define TAVIWIRELESS_BASE_FIXED_FIELD_H

#include <algorithm>
#include <iterator>
#include <string_view>

namespace taviwireless {

// Sets a text of a C record. What does not fit is cut off; the rest of the field is zero, so
// nothing of a longer text before stays in it.
template <size_t kSize>
void CopyField(char (&field)[kSize], std::string_view text) {
    std::fill(field + text.copy(field, kSize - 1), std::end(field), '\0');
}

}  // namespace taviwireless

#endif
