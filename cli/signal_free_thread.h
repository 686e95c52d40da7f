// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_SIGNAL_FREE_THREAD_H
#define TAVIWIRELESS_CLI_SIGNAL_FREE_THREAD_H

#include <pthread.h>

#include <csignal>
#include <thread>
#include <utility>

namespace taviwireless::cli {

// Starts a thread beside the command. Signals are left to the thread of the command, whose waits
// they interrupt. Throws std::system_error when there can be none.
template <typename Work>
std::thread StartBeside(Work work) {
    sigset_t all;
    sigset_t before;
    sigfillset(&all);
    pthread_sigmask(SIG_SETMASK, &all, &before);
    const struct Restore {
        ~Restore() { pthread_sigmask(SIG_SETMASK, &mask, nullptr); }
        sigset_t& mask;
    } restore{before};
    return std::thread(std::move(work));
}

}  // namespace taviwireless::cli

#endif
