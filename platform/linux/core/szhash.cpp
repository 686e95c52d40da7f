// SPDX-License-Identifier: MIT
// String hashes.
#include <tavicore/szhash.h>

#include "failure.h"
#include "szhash_pairs.h"

using namespace tavicore;

namespace {

void Append(VEXACSzHash& hash, std::string_view key, std::string_view value) {
    auto& pair = hash.pairs.emplace_back();
    try {
        pair.key = key;
        pair.value = value;
        hash.byKey.emplace(pair.key, &pair);
    } catch (...) {
        hash.pairs.pop_back();
        throw;
    }
}

}  // namespace

void tavicore::SetPair(VEXACSzHash& hash, std::string_view key, std::string_view value) {
    const auto found = hash.byKey.find(key);
    if (found != hash.byKey.end()) {
        found->second->value = std::string(value);  // which may be a part of the old one
    } else {
        Append(hash, key, value);
    }
}

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
        SetPair(**hash, key, value);
        return 0;
    });
}

const char* VEXACSzHashGetValue(const VEXACSzHash* hash, const char* key) {
    return Guarded<const char*>(nullptr, [&]() -> const char* {
        RequireAll(hash, key);
        const auto found = hash->byKey.find(key);
        if (found == hash->byKey.end()) {
            VEXACErrSet(VEXAC_ERR_NOT_FOUND);  // not thrown: most sections lack a key
            return nullptr;
        }
        return found->second->value.c_str();
    });
}

void VEXACSzHashFree(VEXACSzHash* hash) {
    delete hash;
}
