// SPDX-License-Identifier: MIT
#include "tests/fuzz/fuzz.h"

#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <exception>

#include "tests/support/enter_root.h"
#include "tests/support/log_capture.h"

namespace taviwireless::fuzz {
namespace {

bool IsPrintable(const std::string& line) {
    for (const char c : line.substr(0, line.find_last_not_of('\n') + 1)) {
        if (iscntrl(static_cast<unsigned char>(c)) != 0) {
            return false;
        }
    }
    return true;
}

}  // namespace

void Demand(bool isTrue, const std::string& sentence, const std::string& seen) {
    if (isTrue) {
        return;
    }
    fprintf(stderr, "NOT TRUE: %s: ", sentence.c_str());
    for (const char c : seen) {
        fprintf(stderr, isprint(static_cast<unsigned char>(c)) != 0 ? "%c" : "\\x%02x",
                static_cast<unsigned char>(c));
    }
    fputc('\n', stderr);
    abort();
}

}  // namespace taviwireless::fuzz

// What comes out of the root, such as new inputs, goes to the folder that TAVI_TEST_OUTPUT names.
extern "C" int LLVMFuzzerInitialize(int*, char*** argv) {
    constexpr char kIsInside[] = "TAVI_FUZZ_IS_INSIDE";  // libFuzzer starts the program in itself
    if (getenv(kIsInside) != nullptr) {
        return 0;
    }
    try {
        taviwireless::test::EnterRoot(*argv);
    } catch (const std::exception& error) {
        fprintf(stderr, "%s\n", error.what());
        exit(taviwireless::kApplianceRootFailed);
    }
    setenv(kIsInside, "", 1);  // not before: entering, too, may start the program once more
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const taviwireless::test::LogCapture log;
    taviwireless::fuzz::Fuzz(taviwireless::fuzz::Input(data, size));
    for (const auto& line : log.Lines()) {
        taviwireless::fuzz::Demand(taviwireless::fuzz::IsPrintable(line.text),
                                   "a line of the log is printable", line.text);
    }
    return 0;
}
