// SPDX-License-Identifier: MIT
#include "daemon/semaphore_sets.h"

#include <sys/ipc.h>
#include <sys/sem.h>
#include <unistd.h>

namespace taviwireless::daemon {

namespace {

// The caller of semctl defines this union (POSIX).
union SemaphoreArgument {
    semid_ds* buf;
    seminfo* info;
};

}  // namespace

void RemovePrivateSemaphoreSets(pid_t process) {
    seminfo info{};
    SemaphoreArgument argument{};
    argument.info = &info;
    const int last = semctl(0, 0, SEM_INFO, argument);
    for (int index = 0; index <= last; ++index) {
        semid_ds set{};
        argument.buf = &set;
        const int id = semctl(index, 0, SEM_STAT, argument);
        if (id >= 0 && set.sem_perm.__key == IPC_PRIVATE && set.sem_perm.cuid == geteuid() &&
            semctl(id, 0, GETPID) == process) {
            semctl(id, 0, IPC_RMID);
        }
    }
}

}  // namespace taviwireless::daemon
