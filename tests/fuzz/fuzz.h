// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_FUZZ_FUZZ_H
#define TAVIWIRELESS_TESTS_FUZZ_FUZZ_H

#include <cstddef>
#include <cstdint>
#include <string>

// A target is a file NAME_fuzz.cpp with one function, Fuzz, which is called in an appliance root
// with one input after the other: by clang's libFuzzer, which invents them (scripts/fuzz), or by
// replay.cpp, which takes those that were kept (tests/fuzz/corpus/NAME). It makes of the input what
// a modem, a radio, a file or a caller may bring, and demands what must be true whatever it was.
namespace taviwireless::fuzz {

// Takes an input apart: texts that end with a zero byte, so that inputs stay readable, and numbers.
// Behind its end there are empty texts and zeros.
class Input {
  public:
    Input(const uint8_t* data, size_t size) : rest_(reinterpret_cast<const char*>(data), size) {}

    std::string Text() {
        const std::string text = rest_.substr(0, rest_.find('\0'));
        rest_.erase(0, text.size() + 1);
        return text;
    }

    // Below `count`, which is at most 256.
    unsigned Choice(unsigned count) {
        const unsigned byte = rest_.empty() ? 0 : static_cast<unsigned char>(rest_[0]);
        rest_.erase(0, 1);
        return byte % count;
    }
    bool Flag() { return Choice(2) == 1; }

    // All that is left, zero bytes included.
    const std::string& Rest() const { return rest_; }

  private:
    std::string rest_;
};

// Ends the program, with the sentence on standard error, unless what must be true is. `seen` is
// printed with it, each byte that is not printable as a number.
void Demand(bool isTrue, const std::string& sentence, const std::string& seen = "");

// What the target does with an input. Sleeping takes no time, and every line that is logged
// meanwhile has to be printable.
void Fuzz(Input input);

}  // namespace taviwireless::fuzz

#endif
