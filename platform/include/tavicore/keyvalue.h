/* SPDX-License-Identifier: MIT */
/*
 * Key/value files: text files of KEY=value lines, as shell scripts source them.
 *
 * A line is read as: blanks, the key, "=", the value, blanks. One pair of equal quotes (" or ')
 * around the whole value is not part of it; there are no escapes, so quotes inside stay as they
 * are. Lines whose first character after blanks is "#", empty lines and lines without "=" are
 * comments. Keys are compared exactly, case included; where a key stands twice, the first one
 * counts. The last line may lack its newline. A zero byte ends the value.
 *
 * Writing replaces the file in one step (a new file beside it, synced and renamed), so a reader or
 * a crash sees the old or the new content, never a mixture. Mode and owner of the file are kept, a
 * symbolic link keeps pointing to it, every line that is not concerned survives as it stands, and
 * writers in different processes wait for each other. The lock is on a file ".NAME.lock" beside it
 * that nobody else can open and that is there only meanwhile; a writer that has not got it after 2
 * s fails with VEXAC_ERR_LOCKED and names the holder in the system log.
 */
#ifndef TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_KEYVALUE_H
#define TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_KEYVALUE_H

#include <stddef.h>
#include <tavicore/export.h>

#ifdef __cplusplus
extern "C" {
#endif

/*
 * Copies the value of key in file, with a terminating zero, into value, a buffer of size bytes.
 *
 * Returns the length of the value: above 0 when there is one, 0 when the key stands there with
 * nothing behind it. Returns -1 when the file cannot be read or is not a regular file
 * (VEXAC_ERR_IO; VEXAC_ERR_NOT_FOUND when it does not exist), the key is not there
 * (VEXAC_ERR_NOT_FOUND), the value does not fit (VEXAC_ERR_TOO_LONG) or an argument is null, the
 * key is empty or size is 0 (VEXAC_ERR_BAD_PARAMETER); the buffer, if there is one, then holds the
 * empty text.
 */
TAVI_SDK_API int VEXACFileGetKeyValue(const char* file, const char* key, char* value, size_t size);

/*
 * Sets key to value in file: the key's line is replaced (further lines of the same key are
 * removed), or a line is appended. format is the line to write, with "%s" once for the key and then
 * once for the value, and nothing else to convert; null means "%s=\"%s\"\n". A missing file is
 * created with mode 0644, less the process's umask.
 *
 * Returns 1 on success. Returns -1 and leaves the file as it was when it cannot be read or replaced
 * (VEXAC_ERR_IO, VEXAC_ERR_LOCKED), or an argument but format is null, the format is another one,
 * the key is empty, begins with "#", or holds "=", a blank or a line break, or the value holds a
 * line break (VEXAC_ERR_BAD_PARAMETER).
 */
TAVI_SDK_API int VEXACFileSetKeyValue(const char* file, const char* key, const char* value,
                                      const char* format);

/*
 * Returns 1 when key stands in file with exactly the given value, else 0: with VEXAC_ERR_NOT_FOUND
 * when it does not, and VEXAC_ERR_IO when the file cannot be read. flags is reserved and is 0.
 */
TAVI_SDK_API int VEXACFileCheckKeyValue(const char* file, const char* key, const char* value,
                                        int flags);

#ifdef __cplusplus
}
#endif

#endif
