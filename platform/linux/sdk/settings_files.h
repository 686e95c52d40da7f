// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_SDK_SETTINGS_FILES_H
#define TAVIWIRELESS_PLATFORM_LINUX_SDK_SETTINGS_FILES_H

#include <tavicore/szlist.h>

#include <memory>
#include <string>

// Folders and key/value files of settings, in which something may be missing. Everything here
// throws tavicore::Failure when it cannot tell whether it is.
namespace tavisdk {

using StringList = std::unique_ptr<VEXACSzList, decltype(&VEXACSzListFree)>;

StringList NewList();

// The names of the files in the folder that begin with the prefix; none without the folder.
StringList ListFiles(const char* folder, const char* prefix);

// True when the key has a value, which is then in the buffer; else that holds the empty text. A
// value that does not fit is none.
bool ReadSetting(const std::string& file, const char* key, char* value, size_t size);

// True when the file has exactly this value.
bool HasSetting(const std::string& file, const char* key, const char* value);

}  // namespace tavisdk

#endif
