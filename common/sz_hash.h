// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_COMMON_SZ_HASH_H
#define TAVIWIRELESS_COMMON_SZ_HASH_H

#include <tavicore/szhash.h>

#include <string>

namespace taviwireless {

// An SDK string hash that frees itself.
class SzHash {
  public:
    explicit SzHash(int size) : hash_(VEXACSzHashAlloc(size)) {}
    ~SzHash() { VEXACSzHashFree(hash_); }
    SzHash(const SzHash&) = delete;
    SzHash& operator=(const SzHash&) = delete;

    explicit operator bool() const { return hash_ != nullptr; }
    const VEXACSzHash* Get() const { return hash_; }
    VEXACSzHash** Address() { return &hash_; }
    // Null when the key is not there.
    const char* operator[](const char* key) const { return VEXACSzHashGetValue(hash_, key); }
    // False, with the hash as it was, when there is no memory for it.
    bool Set(const char* key, const std::string& value) {
        return VEXACSzHashSetValue(&hash_, key, value.c_str()) == 0;
    }

  private:
    VEXACSzHash* hash_;
};

}  // namespace taviwireless

#endif
