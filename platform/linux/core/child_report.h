#ifndef TAVIWIRELESS_PLATFORM_LINUX_CORE_CHILD_REPORT_H
#define TAVIWIRELESS_PLATFORM_LINUX_CORE_CHILD_REPORT_H

#include <fcntl.h>

#include <cerrno>
#include <optional>

#include "base/unique_fd.h"
#include "failure.h"

namespace tavicore {

// A pipe through which a forked child tells one number. The status that waitpid() gives is lost
// where the process ignores SIGCHLD or reaps all its children.
class ChildReport {
  public:
    ChildReport() {
        int ends[2];
        if (pipe2(ends, O_CLOEXEC) != 0) {
            throw Failure{VEXAC_ERR_FORK_FAILED};
        }
        readEnd_ = taviwireless::UniqueFd(ends[0]);
        writeEnd_ = taviwireless::UniqueFd(ends[1]);
    }

    int WriteEnd() const { return writeEnd_.Get(); }
    static bool Tell(int writeEnd, int number) {
        return write(writeEnd, &number, sizeof number) == sizeof number;
    }

    // Waits for the number; nothing when the child ended without telling it.
    std::optional<int> Hear() {
        writeEnd_.Close();
        int number = 0;
        ssize_t count = -1;
        do {
            count = read(readEnd_.Get(), &number, sizeof number);
        } while (count < 0 && errno == EINTR);
        return count == sizeof number ? std::optional(number) : std::nullopt;
    }

  private:
    taviwireless::UniqueFd readEnd_;
    taviwireless::UniqueFd writeEnd_;
};

}  // namespace tavicore

#endif
