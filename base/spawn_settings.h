// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_SPAWN_SETTINGS_H
#define TAVIWIRELESS_BASE_SPAWN_SETTINGS_H

#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <sys/types.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <new>
#include <string>
#include <system_error>

namespace taviwireless {

// How a program starts that is to inherit nothing of its caller: no signal is blocked or ignored
// and, with InheritNothingElse, no descriptor but the standard ones is open. When memory is too
// short for one of the settings, std::bad_alloc is thrown.
class SpawnSettings {
  public:
    SpawnSettings() {
        Require(posix_spawnattr_init(&attributes_));
        Require(posix_spawn_file_actions_init(&actions_));
        sigset_t none;
        sigset_t all;
        sigemptyset(&none);
        sigfillset(&all);
        posix_spawnattr_setsigmask(&attributes_, &none);
        posix_spawnattr_setsigdefault(&attributes_, &all);
        SetFlags(0);
    }
    ~SpawnSettings() {
        posix_spawn_file_actions_destroy(&actions_);
        posix_spawnattr_destroy(&attributes_);
    }
    SpawnSettings(const SpawnSettings&) = delete;
    SpawnSettings& operator=(const SpawnSettings&) = delete;

    // So that what it starts can be killed with it.
    void GiveGroupOfItsOwn() { SetFlags(POSIX_SPAWN_SETPGROUP); }
    void Duplicate(int from, int to) {
        Require(posix_spawn_file_actions_adddup2(&actions_, from, to));
    }
    void OpenNothing(int descriptor) {
        Require(posix_spawn_file_actions_addopen(&actions_, descriptor, "/dev/null", O_RDWR, 0));
    }
    // Where the C library cannot do that (glibc before 2.29), it starts where the caller is.
    void StartInRootFolder() { Require(AddChdir(&actions_, "/", 0)); }
    // Comes last.
    void InheritNothingElse() { Require(AddCloseFrom(&actions_, STDERR_FILENO + 1, 0)); }

    // Runs a program, which is looked for along PATH when it has no slash, with these arguments,
    // the first of which is its name. Returns the process; negative, with errno, when there is
    // none.
    pid_t Spawn(const char* program, const char* const* arguments) const {
        pid_t process = -1;
        errno = posix_spawnp(&process, program, &actions_, &attributes_,
                             const_cast<char* const*>(arguments), environ);
        return errno == 0 ? process : -1;
    }

    // Each of these calls is the C library's where that has it, and else what does for it. The last
    // argument, which is 0, prefers the former; 0L asks for the latter.
    template <class Actions>
    static auto AddChdir(Actions* actions, const char* folder, int)
        -> decltype(posix_spawn_file_actions_addchdir_np(actions, folder)) {
        return posix_spawn_file_actions_addchdir_np(actions, folder);
    }
    template <class Actions>
    static int AddChdir(Actions*, const char*, long) {
        return 0;
    }
    template <class Actions>
    static auto AddCloseFrom(Actions* actions, int first, int)
        -> decltype(posix_spawn_file_actions_addclosefrom_np(actions, first)) {
        return posix_spawn_file_actions_addclosefrom_np(actions, first);
    }
    // Closes what is open now: what another thread opens meanwhile has to close itself.
    template <class Actions>
    static int AddCloseFrom(Actions* actions, int first, long) {
        std::error_code none;  // without "/proc" nothing is closed
        int error = 0;
        for (const auto& entry : std::filesystem::directory_iterator("/proc/self/fd", none)) {
            const int descriptor = std::stoi(entry.path().filename());
            if (descriptor >= first && error == 0) {
                error = posix_spawn_file_actions_addclose(actions, descriptor);
            }
        }
        return error;
    }

  private:
    void SetFlags(short more) {
        posix_spawnattr_setflags(&attributes_, static_cast<short>(POSIX_SPAWN_SETSIGMASK |
                                                                  POSIX_SPAWN_SETSIGDEF | more));
    }
    static void Require(int error) {
        if (error != 0) {
            throw std::bad_alloc();
        }
    }

    posix_spawnattr_t attributes_;
    posix_spawn_file_actions_t actions_;
};

}  // namespace taviwireless

#endif
