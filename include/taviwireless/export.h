#ifndef TAVIWIRELESS_EXPORT_H
#define TAVIWIRELESS_EXPORT_H

/* Marks what the library exports; everything else in it is hidden. */
#define TAVIWIRELESS_API __attribute__((visibility("default")))

#endif
