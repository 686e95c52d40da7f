// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_CORE_LINE_H
#define TAVIWIRELESS_PLATFORM_LINUX_CORE_LINE_H

#include <optional>
#include <string>
#include <string_view>

// Lines of text files: how they are cut, read and written.
namespace tavicore {

inline constexpr std::string_view kBlanks = " \t\r\v\f";

// Cuts the first line, with its newline if it has one, off `rest`.
std::string_view TakeLine(std::string_view* rest);

// The line without its end ("\n" or "\r\n") and without what stands behind a zero byte.
std::string_view Readable(std::string_view line);

std::string_view TrimLeft(std::string_view text);
std::string_view TrimRight(std::string_view text);

struct Pair {
    std::string_view key;
    std::string_view value;
};

// The two sides of the first "=" of a line, without the blanks in front of the key. Nothing when
// the line has no key or no "=", or begins with one of `marks`.
std::optional<Pair> ReadPair(std::string_view line, std::string_view marks);

bool HasLineBreak(std::string_view text);

// Adds the newline that a last line may lack, so that a line can follow it.
void EndLastLine(std::string* text);

// Copies value with a terminating zero into a buffer of size bytes; throws when it does not fit.
void CopyOut(std::string_view value, char* buffer, size_t size);

// A format such as "\t%s=%s\n". It is filled in by this class and never given to printf.
class PairFormat {
  public:
    // Throws when the format is not one line with "%s" twice and nothing else to convert.
    explicit PairFormat(std::string_view format);

    std::string Line(std::string_view key, std::string_view value) const;

  private:
    std::string_view before_, between_, after_;
};

}  // namespace tavicore

#endif
