/* SPDX-License-Identifier: MIT */
/*
 * String hashes: values by key, which remember the order in which keys were first set.
 *
 * The hash owns copies of its keys and values; keys are compared exactly, case included. A hash is
 * passed by address where it may grow, because growing may move it.
 */
#ifndef TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_SZHASH_H
#define TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_SZHASH_H

#include <tavicore/export.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef struct VEXACSzHash VEXACSzHash;

/*
 * Returns a new, empty hash with room for about size bytes before it has to grow, or null with
 * VEXAC_ERR_OUT_OF_MEMORY (VEXAC_ERR_BAD_PARAMETER for a negative size). The caller frees it with
 * VEXACSzHashFree.
 */
TAVI_SDK_API VEXACSzHash* VEXACSzHashAlloc(int size);

/*
 * Stores copies of key and value in *hash; the value of a key that is already there is replaced and
 * the key keeps its place. Returns 0, or -1 with the hash as it was.
 */
TAVI_SDK_API int VEXACSzHashSetValue(VEXACSzHash** hash, const char* key, const char* value);

/*
 * Returns the value of key, or null when the key is not there. It is borrowed until the hash
 * changes or is freed.
 */
TAVI_SDK_API const char* VEXACSzHashGetValue(const VEXACSzHash* hash, const char* key);

/* Frees the hash, its keys and values; null is accepted. */
TAVI_SDK_API void VEXACSzHashFree(VEXACSzHash* hash);

#ifdef __cplusplus
}
#endif

#endif
