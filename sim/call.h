// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_CALL_H
#define TAVIWIRELESS_SIM_CALL_H

#include <sys/types.h>

#include <string>

#include "base/unique_fd.h"

namespace taviwireless::sim {

// The far end of a data connection: a command that has the line as its standard input and output.
class Call {
  public:
    // Throws std::runtime_error with a sentence.
    Call(const std::string& command, int line);
    // Ends the command, if it has not ended, and waits for that.
    ~Call();
    Call(const Call&) = delete;
    Call& operator=(const Call&) = delete;

    // Readable once the command has ended.
    int Get() const { return handle_.Get(); }
    bool HasEnded() const;

  private:
    int line_;
    pid_t process_;
    UniqueFd handle_;
};

}  // namespace taviwireless::sim

#endif
