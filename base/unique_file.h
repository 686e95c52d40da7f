// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_UNIQUE_FILE_H
#define TAVIWIRELESS_BASE_UNIQUE_FILE_H

#include <cstdio>
#include <memory>

namespace taviwireless {

struct CloseFile {
    void operator()(FILE* file) const { fclose(file); }
};

// A stream that closes itself; null when there is none.
using UniqueFile = std::unique_ptr<FILE, CloseFile>;

}  // namespace taviwireless

#endif
