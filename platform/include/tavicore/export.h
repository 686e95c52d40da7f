/* SPDX-License-Identifier: MIT */
#ifndef TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_EXPORT_H
#define TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_EXPORT_H

/*
 * Marks what the SDK libraries, libtavicore.so.4 and libtavisdk.so.4, export. The host edition is
 * built with -fvisibility=hidden, so everything else in them is hidden.
 */
#define TAVI_SDK_API __attribute__((visibility("default")))

#endif
