// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_CORE_CHILD_REPORT_H
#define TAVIWIRELESS_PLATFORM_LINUX_CORE_CHILD_REPORT_H

#include <cerrno>
#include <optional>

#include "base/unique_pipe.h"
#include "failure.h"

namespace tavicore {

// A pipe through which a forked child tells one number. The status that waitpid() gives is lost
// where the process ignores SIGCHLD or reaps all its children.
class ChildReport {
  public:
    ChildReport() {
        if (!pipe_) {
            throw Failure{VEXAC_ERR_FORK_FAILED};
        }
    }

    int WriteEnd() const { return pipe_.writeEnd.Get(); }
    static bool Tell(int writeEnd, int number) {
        return write(writeEnd, &number, sizeof number) == sizeof number;
    }

    // Waits for the number; nothing when the child ended without telling it.
    std::optional<int> Hear() {
        pipe_.writeEnd.Close();
        int number = 0;
        ssize_t count = -1;
        do {
            count = read(pipe_.readEnd.Get(), &number, sizeof number);
        } while (count < 0 && errno == EINTR);
        return count == sizeof number ? std::optional(number) : std::nullopt;
    }

  private:
    taviwireless::UniquePipe pipe_;
};

}  // namespace tavicore

#endif
