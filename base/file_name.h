// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_FILE_NAME_H
#define TAVIWIRELESS_BASE_FILE_NAME_H

// The source file without its folder. g++ has it from version 12 on.
#ifndef __FILE_NAME__
#define __FILE_NAME__ (__builtin_strrchr("/" __FILE__, '/') + 1)
#endif

#endif
