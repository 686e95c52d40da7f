// SPDX-License-Identifier: MIT
// String lists.
#include <tavicore/szlist.h>

#include <climits>
#include <string>
#include <vector>

#include "failure.h"

namespace {

struct List : VEXACSzList {
    List() : VEXACSzList{0} {}
    std::vector<std::string> strings;
};

const List& Whole(const VEXACSzList* list) {
    return *static_cast<const List*>(list);
}

}  // namespace

using namespace tavicore;

VEXACSzList* VEXACSzListAlloc(int size) {
    return Guarded<VEXACSzList*>(nullptr, [&] {
        if (size < 0) {
            throw Failure{VEXAC_ERR_BAD_PARAMETER};
        }
        return new List;  // size is a hint that nothing depends on
    });
}

int VEXACSzListPush(VEXACSzList** list, const char* text) {
    return Guarded(-1, [&] {
        RequireAll(list, text);
        RequireAll(*list);
        auto& whole = *static_cast<List*>(*list);
        if (whole.count == INT_MAX) {
            throw Failure{VEXAC_ERR_OUT_OF_MEMORY};
        }
        std::string copy = text;  // first, because text may be one of the list's own strings
        whole.strings.push_back(std::move(copy));
        return whole.count++;
    });
}

const char* VEXACSzListGet(const VEXACSzList* list, int index) {
    return Guarded<const char*>(nullptr, [&] {
        RequireAll(list);
        if (index < 0 || index >= list->count) {
            throw Failure{VEXAC_ERR_NOT_FOUND};
        }
        return Whole(list).strings[static_cast<size_t>(index)].c_str();
    });
}

void VEXACSzListFree(VEXACSzList* list) {
    delete static_cast<List*>(list);
}
