// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_SERIAL_LINE_H
#define TAVIWIRELESS_SIM_SERIAL_LINE_H

#include <map>
#include <string>

#include "base/unique_fd.h"

namespace taviwireless::sim {

// Wakes the program when another one opens or closes one of a few files, which a pseudo-terminal
// itself does not tell.
class OpenWatch {
  public:
    OpenWatch();
    int Get() const { return inotify_.Get(); }

    int Add(const std::string& path);
    void Remove(int watch);

    // True while something happened to a file that nobody has asked about since; reading the events
    // of one file takes those of all, so the OpenWatch itself does not wake for them again.
    bool HasNews() const;
    bool HasNews(int watch);
    // True, once, when the file was closed and then opened.
    bool TakeReopened(int watch);
    // Begins anew: what was done to the file up to now does not count.
    void Reset(int watch);

  private:
    struct File {
        bool closed = false;
        bool reopened = false;
        bool news = false;
    };

    void ReadEvents();

    UniqueFd inotify_;
    std::map<int, File> files_;
};

// The modem's end of a serial line: a new pseudo-terminal, or a tty that was given. Both are in raw
// mode and never block.
class SerialLine {
  public:
    // `tty` is empty for a pseudo-terminal; `link`, if not empty, is made to lead to it. Throws
    // std::runtime_error with a sentence when that fails.
    SerialLine(const std::string& tty, const std::string& link, OpenWatch& watch);
    ~SerialLine();
    SerialLine(const SerialLine&) = delete;
    SerialLine& operator=(const SerialLine&) = delete;

    int Get() const { return modemEnd_.Get(); }
    const std::string& Path() const { return path_; }

    struct Input {
        std::string bytes;
        bool isHungUp = false;      // a given tty is gone
        bool hasNewClient = false;  // the bytes may be of another client than those before
        bool isReleased = false;    // the client of the bytes, if any, is gone ...
        bool mayBeLate = false;     // ... and only just, so that more may arrive without notice
    };
    Input Read();

    // True while a client had the line open at the last Read; always, for a tty that was given:
    // that cannot be seen. Without one, waiting for input returns at once, so the OpenWatch is
    // waited for.
    bool HasClient() const { return hasClient_; }

    // Sets the line up anew after another program had it, and drops what it left unread.
    void Restart();

    // Writes as much as the line takes now, and returns how many bytes that were.
    size_t Write(const std::string& bytes);

  private:
    void OpenPseudoTerminal();
    void OpenGiven();
    void MakeLink();
    bool IsOpened() const;
    void Refresh();

    bool isGiven_;
    std::string path_;
    std::string link_;
    OpenWatch& watch_;
    int watchId_ = -1;
    UniqueFd modemEnd_;
    bool hasClient_ = true;
};

}  // namespace taviwireless::sim

#endif
