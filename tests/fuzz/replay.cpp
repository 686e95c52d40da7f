// SPDX-License-Identifier: MIT
// main() where there is no libFuzzer: gives a target every input of the folders that are named, and
// then, since the shortest inputs find much, every input of one byte and none at all.
#include <cstdint>
#include <cstdio>
#include <filesystem>

#include "tests/support/files.h"

extern "C" int LLVMFuzzerInitialize(int* argc, char*** argv);
extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size);

namespace {

void Give(const std::string& input) {
    LLVMFuzzerTestOneInput(reinterpret_cast<const uint8_t*>(input.data()), input.size());
}

}  // namespace

int main(int argc, char** argv) {
    LLVMFuzzerInitialize(&argc, &argv);
    int count = 0;
    for (int i = 1; i < argc; ++i) {
        for (const auto& entry : std::filesystem::directory_iterator(argv[i])) {
            fprintf(stderr, "%s\n", entry.path().c_str());  // the last one is that which failed
            Give(taviwireless::test::ReadFile(entry.path()));
            ++count;
        }
    }
    Give("");
    for (int byte = 0; byte <= UINT8_MAX; ++byte) {
        Give(std::string(1, static_cast<char>(byte)));
    }
    printf("%d inputs of the corpus, and the 257 shortest\n", count);
    return count > 0 ? 0 : 1;
}
