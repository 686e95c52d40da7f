/* SPDX-License-Identifier: MIT */
#ifndef TAVIWIRELESS_EXPORT_H
#define TAVIWIRELESS_EXPORT_H

/*
 * Marks what the library exports. It is built with -fvisibility=hidden, so everything else in it
 * is hidden. cmake/taviwireless.exports lists the exported symbols, and a test compares them.
 */
#define TAVIWIRELESS_API __attribute__((visibility("default")))

#endif
