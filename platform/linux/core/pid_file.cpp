// SPDX-License-Identifier: MIT
#include "pid_file.h"

#include <climits>
#include <cstdlib>

#include "failure.h"
#include "line.h"
#include "text_file.h"

namespace tavicore {
namespace {

// What "/proc/PID/stat" says of a process.
struct ProcessStatus {
    char state;
    std::string startTime;  // clock ticks since boot
};

// Throws when there is no such process. The file is opened in its folder: what a process reads of
// itself by the whole path, the emulator of another processor makes up.
ProcessStatus ReadStatus(const std::string& pid) {
    const std::string text = TextFile(FindPlace(("/proc/" + pid + "/stat").c_str())).Read();
    // The program's name, in brackets, may hold blanks and brackets itself.
    const size_t state = text.rfind(')') + 2;
    constexpr int kFieldsToStartTime = 19;  // from the state (field 3) to the start time (field 22)
    size_t begin = state;
    for (int i = 0; i < kFieldsToStartTime; ++i) {
        begin = text.find(' ', begin) + 1;
    }
    return {text.at(state), text.substr(begin, text.find(' ', begin) - begin)};
}

}  // namespace

PidFile ReadPidFile(const char* file) {
    RequireAll(file);
    const std::string text = ReadText(file);
    std::string_view rest = text;
    const std::string first(Readable(TakeLine(&rest)));
    const long long pid = std::strtoll(first.c_str(), nullptr, 10);  // long may have 32 bits
    std::string startTime(Readable(TakeLine(&rest)));
    if (startTime.find_first_not_of("0123456789") != startTime.npos) {
        startTime.clear();  // a remark of another writer
    }
    return {pid > 0 && pid <= INT_MAX ? static_cast<pid_t>(pid) : 0, startTime};
}

void WritePidFile(const char* file, pid_t pid) {
    const std::string number = std::to_string(pid);
    ReplaceFile(file, number + '\n' + ReadStatus(number).startTime + '\n');
}

void RequireAlive(const PidFile& process) {
    const ProcessStatus status = ReadStatus(std::to_string(process.pid));
    if (status.state == 'Z' || status.state == 'X' ||
        (!process.startTime.empty() && process.startTime != status.startTime)) {
        throw Failure{VEXAC_ERR_NOT_FOUND};
    }
}

}  // namespace tavicore
