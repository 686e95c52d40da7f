#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>
#include <tavicore/process.h>

#include <cerrno>
#include <cstdarg>
#include <vector>

#include "failure.h"

namespace {

using namespace tavicore;

constexpr int kFirstPrivateDescriptor = 3;

// How the program starts: no input, no descriptor but the standard ones, no signal blocked or
// ignored.
class SpawnSettings {
  public:
    SpawnSettings() {
        sigset_t none;
        sigset_t all;
        sigemptyset(&none);
        sigfillset(&all);
        posix_spawnattr_init(&attributes_);
        posix_spawnattr_setflags(&attributes_, POSIX_SPAWN_SETSIGMASK | POSIX_SPAWN_SETSIGDEF);
        posix_spawnattr_setsigmask(&attributes_, &none);
        posix_spawnattr_setsigdefault(&attributes_, &all);
        posix_spawn_file_actions_init(&actions_);
        posix_spawn_file_actions_addopen(&actions_, 0, "/dev/null", 0, 0);
        posix_spawn_file_actions_addclosefrom_np(&actions_, kFirstPrivateDescriptor);
    }
    ~SpawnSettings() {
        posix_spawn_file_actions_destroy(&actions_);
        posix_spawnattr_destroy(&attributes_);
    }
    SpawnSettings(const SpawnSettings&) = delete;
    SpawnSettings& operator=(const SpawnSettings&) = delete;

    // Returns the process id, or -1.
    pid_t Spawn(const char* program, char* const* arguments) const {
        pid_t child = -1;
        return posix_spawnp(&child, program, &actions_, &attributes_, arguments, environ) == 0
                   ? child
                   : -1;
    }

  private:
    posix_spawnattr_t attributes_;
    posix_spawn_file_actions_t actions_;
};

}  // namespace

int VEXACExec(const char* program, ...) {
    va_list list;
    va_start(list, program);
    const int result = Guarded(-1, [&] {
        RequireAll(program);
        std::vector<char*> arguments{const_cast<char*>(program)};
        do {
            arguments.push_back(va_arg(list, char*));
        } while (arguments.back() != nullptr);

        const pid_t child = SpawnSettings().Spawn(program, arguments.data());
        if (child < 0) {
            throw Failure{VEXAC_ERR_NOT_FOUND};
        }
        int status = 0;
        while (waitpid(child, &status, 0) < 0) {
            if (errno != EINTR) {
                throw Failure{VEXAC_ERR_IO};
            }
        }
        if (!WIFEXITED(status)) {
            throw Failure{VEXAC_ERR_IO};
        }
        return WEXITSTATUS(status);
    });
    va_end(list);
    return result;
}
