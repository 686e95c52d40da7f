/* SPDX-License-Identifier: MIT */
/*
 * Section files: text files of sections, each a header line "[name]" followed by its key=value
 * lines, which may be indented.
 *
 * A header is a line whose first non-blank character is "[" and whose last is "]"; the name is what
 * stands between them. A "[" line without its closing bracket is no header and is passed over.
 * Section names are compared exactly first and then, if none matches, without regard to the case of
 * ASCII letters; where a name stands twice, the first section counts. A value is everything behind
 * the first "=" to the end of the line, as it stands: blanks and quotes belong to it. Lines whose
 * first character after blanks is "#" or ";", empty lines and lines without "=" are comments. Keys
 * are compared exactly; where a key stands twice in a section, the first one counts. The last line
 * may lack its newline. A zero byte ends the value.
 *
 * format is the line to write for a pair, with "%s" once for the key and then once for the value,
 * and nothing else to convert, such as "\t%s=%s\n".
 *
 * Writing replaces the file in one step, keeps its mode and owner, lets every line survive that is
 * not concerned (comments, blank lines, other sections) and waits for writers in other processes,
 * as for key/value files. Section names, keys and values with a line break, keys that are empty,
 * hold "=" or begin with a blank, "[", "#" or ";", and empty section names are refused with
 * VEXAC_ERR_BAD_PARAMETER, so that no value can forge another line.
 *
 * Unless stated otherwise, a failure returns -1 and sets VEXAC_ERR_NOT_FOUND when the file does not
 * exist, VEXAC_ERR_IO when it cannot be read or replaced or is not a regular file, VEXAC_ERR_LOCKED
 * when another writer keeps it for 2 s, VEXAC_ERR_OUT_OF_MEMORY when there is no memory, and
 * VEXAC_ERR_BAD_PARAMETER for a null argument; a failed write leaves the file as it was.
 */
#ifndef TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_SECTION_H
#define TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_SECTION_H

#include <stddef.h>
#include <tavicore/export.h>
#include <tavicore/szhash.h>
#include <tavicore/szlist.h>

#ifdef __cplusplus
extern "C" {
#endif

/*
 * Appends the names of the sections of file, in file order, to *list.
 * Returns their number (0 or more), or -1.
 */
TAVI_SDK_API int VEXACFileEnumSection(const char* file, VEXACSzList** list);

/*
 * Sets every key of the section in *hash, in file order; other keys of the hash stay.
 * Returns 1, 0 when the file has no such section (VEXAC_ERR_NOT_FOUND), or -1.
 */
TAVI_SDK_API int VEXACFileGetSection(const char* file, const char* section, VEXACSzHash** hash);

/*
 * Appends a new section that holds every pair of the hash, in the order of the hash. A missing file
 * is created with mode 0644, less the process's umask. Returns 1, or -1, also when the file already
 * has the section.
 */
TAVI_SDK_API int VEXACFileAddSection(const char* file, const char* section, const VEXACSzHash* hash,
                                     const char* format);

/*
 * Replaces the keys of an existing section by the pairs of the hash, in the order of the hash; the
 * section keeps its place, its header line and its comments. newName is reserved and is null.
 * Returns 1, 0 when the file has no such section (VEXAC_ERR_NOT_FOUND), or -1.
 */
TAVI_SDK_API int VEXACFileSetSection(const char* file, const char* section, const char* newName,
                                     const VEXACSzHash* hash, const char* format);

/*
 * Removes all sections of this name; comments below their last keys stay. The host edition alone has
 * this call: look it up at run time. Returns 1, 0 when the file has no such section
 * (VEXAC_ERR_NOT_FOUND), or -1.
 */
TAVI_SDK_API int VEXACFileRemoveSection(const char* file, const char* section);

/*
 * Copies the value of key in the section, with a terminating zero, into value, a buffer of size
 * bytes. Returns 0, or -1, also when the section or the key is not there (VEXAC_ERR_NOT_FOUND) or
 * the value does not fit (VEXAC_ERR_TOO_LONG); the buffer, if there is one, then holds the empty
 * text.
 */
TAVI_SDK_API int VEXACFileGetSectionValue(const char* file, const char* section, const char* key,
                                          char* value, size_t size);

/*
 * Sets key to value in the section: the key's line is replaced, or a line is added at the end of
 * the section, or the section with it at the end of the file. A missing file is created with mode
 * 0644, less the process's umask. Returns 0, or -1.
 */
TAVI_SDK_API int VEXACFileSetSectionValue(const char* file, const char* section, const char* key,
                                          const char* value, const char* format);

#ifdef __cplusplus
}
#endif

#endif
