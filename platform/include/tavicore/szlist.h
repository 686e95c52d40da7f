/* SPDX-License-Identifier: MIT */
/*
 * String lists: strings in the order in which they were pushed.
 *
 * The list owns copies of its strings. A list is passed by address where it may grow, because
 * growing may move it.
 */
#ifndef TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_SZLIST_H
#define TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_SZLIST_H

#include <tavicore/export.h>

#ifdef __cplusplus
extern "C" {
#endif

/* Size 4: count 0. An implementation may keep more behind it. */
typedef struct VEXACSzList {
    int count; /* number of strings; read only */
} VEXACSzList;

/*
 * Returns a new, empty list with room for about size bytes before it has to grow, or null with
 * VEXAC_ERR_OUT_OF_MEMORY (VEXAC_ERR_BAD_PARAMETER for a negative size). The caller frees it with
 * VEXACSzListFree.
 */
TAVI_SDK_API VEXACSzList* VEXACSzListAlloc(int size);

/*
 * Appends a copy of text to *list. Returns the index of the new string (0 or more), or -1 with the
 * list as it was.
 */
TAVI_SDK_API int VEXACSzListPush(VEXACSzList** list, const char* text);

/*
 * Returns string number index (from 0), or null when there is none. It is borrowed until the list
 * changes or is freed.
 */
TAVI_SDK_API const char* VEXACSzListGet(const VEXACSzList* list, int index);

/* Frees the list and its strings; null is accepted. */
TAVI_SDK_API void VEXACSzListFree(VEXACSzList* list);

#ifdef __cplusplus
}
#endif

#endif
