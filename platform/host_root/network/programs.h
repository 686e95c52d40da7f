// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_PROGRAMS_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_PROGRAMS_H

#include <optional>
#include <string>
#include <vector>

// Other programs: run to their end, or kept running. Every wait has an end.
namespace taviwireless::network {

struct Outcome {
    bool isDone;         // with exit status 0, and in time
    std::string output;  // of both kinds
};

// Runs a program, found along PATH, without input, with no descriptor of ours and no signal
// blocked. It is killed when it has not ended after `limit` seconds.
Outcome Run(const std::vector<std::string>& argv, int limit);

// A program that goes to the background and writes a pid file.
struct Program {
    std::string name;
    std::string interface;
    std::string pidFile;
    std::string conf;  // the file it is started with, made anew from its source; may be empty
    std::vector<std::string> start;
};

Program Hostapd(const std::string& interface);
Program DhcpServer(const std::string& bridge);
Program DhcpClient(const std::string& interface);

bool Runs(const Program& program);
// Returns when it has written its pid file, by which the next restart ends it. Throws Error, after
// which it does not run.
void Start(const Program& program);
// Throws Error when it does not end.
void Stop(const Program& program);

// A program as it was before, if it ran.
struct Kept {
    Program program;
    bool ran;
    std::optional<std::string> conf;
};
Kept Keep(const Program& program);
void PutBack(const Kept& kept);

// The text of a file; nothing where there is none to read.
std::optional<std::string> ReadText(const std::string& path);
// Makes the file anew, for the own user alone.
void WriteText(const std::string& path, const std::string& text);
// The same in one step: at any moment there is the old file or the new one.
void ReplaceText(const std::string& path, const std::string& text);

}  // namespace taviwireless::network

#endif
