// SPDX-License-Identifier: MIT
// String hashes.
#include <tavicore/szhash.h>

#include "failure.h"
#include "szhash_pairs.h"

using namespace tavicore;

namespace {

void Append(VEXACSzHash* hash, std::string key, std::string value) {
    hash->pairs.push_back({std::move(key), std::move(value)});
    try {
        auto& pair = hash->pairs.back();
        hash->byKey.emplace(pair.key, &pair);
    } catch (...) {
        hash->pairs.pop_back();
        throw;
    }
}

}  // namespace

VEXACSzHash* VEXACSzHashAlloc(int size) {
    return Guarded<VEXACSzHash*>(nullptr, [&] {
        if (size < 0) {
            throw Failure{VEXAC_ERR_BAD_PARAMETER};
        }
        return new VEXACSzHash;  // size is a hint that nothing depends on
    });
}

int VEXACSzHashSetValue(VEXACSzHash** hash, const char* key, const char* value) {
    return Guarded(-1, [&] {
        RequireAll(hash, key, value);
        RequireAll(*hash);
        std::string copy = value;  // first, because value may be one of the hash's own
        const auto found = (*hash)->byKey.find(key);
        if (found != (*hash)->byKey.end()) {
            found->second->value = std::move(copy);
        } else {
            Append(*hash, key, std::move(copy));
        }
        return 0;
    });
}

const char* VEXACSzHashGetValue(const VEXACSzHash* hash, const char* key) {
    return Guarded<const char*>(nullptr, [&] {
        RequireAll(hash, key);
        const auto found = hash->byKey.find(key);
        if (found == hash->byKey.end()) {
            throw Failure{VEXAC_ERR_NOT_FOUND};
        }
        return found->second->value.c_str();
    });
}

void VEXACSzHashFree(VEXACSzHash* hash) {
    delete hash;
}
