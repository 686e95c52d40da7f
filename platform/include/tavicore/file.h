/* SPDX-License-Identifier: MIT */
/*
 * Files and folders: existence, creation, removal, listing, and files that are lists of lines.
 *
 * A failure sets the error code: VEXAC_ERR_NOT_FOUND when the file does not exist,
 * VEXAC_ERR_BAD_PARAMETER for a null or empty path, otherwise VEXAC_ERR_IO.
 *
 * In a folder that others can write in, such as "/tmp", every reader of the SDK takes a file only
 * when it is a regular one of root or of the caller's own user and of 64 KB at most, and follows a
 * link there only when it is root's or the caller's own. Else it fails with VEXAC_ERR_IO.
 */
#ifndef TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_FILE_H
#define TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_FILE_H

#include <tavicore/export.h>
#include <tavicore/szlist.h>

#ifdef __cplusplus
extern "C" {
#endif

/*
 * Returns 1 when path names an existing file of any kind (a link is followed), else 0: with
 * VEXAC_ERR_NOT_FOUND when there is none, and VEXAC_ERR_IO when that cannot be told.
 */
TAVI_SDK_API int VEXACFileExist(const char* path);

/*
 * Returns 1 when path names an existing directory (a link is followed), else 0: with
 * VEXAC_ERR_NOT_FOUND when there is none, also when something else stands there, and VEXAC_ERR_IO
 * when that cannot be told.
 */
TAVI_SDK_API int VEXACFileCheckDir(const char* path);

/*
 * Makes sure that the file exists: creates it empty with mode 0644, less the process's umask, or
 * sets the times of an existing one to now. A link that leads nowhere is followed, too, unless
 * others can write in its folder and it is somebody else's. Returns 0, or -1.
 */
TAVI_SDK_API int VEXACFileTouch(const char* path);

/* Removes the file (not a directory). Returns 0, or -1. */
TAVI_SDK_API int VEXACSysUnlink(const char* path);

/* Renames a file, replacing what stands at newPath, in one step. Returns 0, or -1. */
TAVI_SDK_API int VEXACSysRename(const char* oldPath, const char* newPath);

/*
 * What VEXACFileEnumDir lists: the entries of a directory that are not directories themselves; the
 * only kind of listing that the host edition offers.
 */
enum { VEXAC_ENUM_FILES = 128 };

/*
 * Appends to *list the names, without the directory, of the entries of directory whose name begins
 * with name, numbers within names in numeric order ("x2" before "x10"). flags is VEXAC_ENUM_FILES.
 * Returns the number of names appended (0 or more), or -1.
 */
TAVI_SDK_API int VEXACFileEnumDir(const char* directory, const char* name, VEXACSzList** list,
                                  int flags);

/*
 * Removes every line of file that equals line (line without its newline). The file is replaced in
 * one step as described for key/value files. Returns the number of lines removed (0 or more), or
 * -1, also when there is no such file.
 */
TAVI_SDK_API int VEXACFileRemoveLine(const char* file, const char* line);

/*
 * Appends line and a newline to file; a last line without a newline gets one first. A missing file
 * is created with mode 0644, less the process's umask. The file is replaced in one step as
 * described for key/value files. after is reserved and is null; flags belongs to the appliance's
 * edition and is not looked at here. Returns 1, or -1, also for a line with a line break
 * (VEXAC_ERR_BAD_PARAMETER).
 */
TAVI_SDK_API int VEXACFileAddLine(const char* file, const char* after, const char* line, int flags);

/*
 * Releases the advisory lock that the open file behind descriptor holds, if any; the descriptor
 * stays open. A child calls it after it took over a descriptor, so that it does not keep its
 * parent's locks. Returns 0, or -1.
 */
TAVI_SDK_API int VEXACFileCloseLock(int descriptor);

#ifdef __cplusplus
}
#endif

#endif
