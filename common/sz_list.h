// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_COMMON_SZ_LIST_H
#define TAVIWIRELESS_COMMON_SZ_LIST_H

#include <tavicore/szlist.h>

namespace taviwireless {

// An SDK string list that frees itself.
class SzList {
  public:
    explicit SzList(int size) : list_(VEXACSzListAlloc(size)) {}
    ~SzList() { VEXACSzListFree(list_); }
    SzList(const SzList&) = delete;
    SzList& operator=(const SzList&) = delete;

    explicit operator bool() const { return list_ != nullptr; }
    VEXACSzList** Address() { return &list_; }
    int Count() const { return list_->count; }
    const char* operator[](int index) const { return VEXACSzListGet(list_, index); }

  private:
    VEXACSzList* list_;
};

}  // namespace taviwireless

#endif
