// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SEMAPHORE_H
#define TAVIWIRELESS_SEMAPHORE_H

#include <taviwireless/export.h>

namespace taviwireless::semaphore {

// A lock between processes: one System V semaphore set of one semaphore, found by its key.
//
// The first process that needs the set creates it, with value 1 and permissions 0666; nobody
// removes it, so it outlives this object and the process. A process that dies while it holds the
// lock gives it back (SEM_UNDO). Key 0 is the system's private key (IPC_PRIVATE): every call then
// makes a set of its own, so that key locks nothing between processes and leaves one set behind per
// call.
class TAVIWIRELESS_API Semaphore {
  public:
    // Makes no set yet. key: the same number in every process that shares the lock.
    explicit Semaphore(unsigned int key);

    // Stores the identifier of the set in *semid, creating the set if it is not there. Returns 0;
    // -1 for a null semid and, with a line in the log, when the set can be neither created nor
    // given its value. When the set is there but may not be opened, *semid is -1 and the result is
    // 0: Enter and Release then fail.
    int Get(int* semid);

    // Takes the lock, waiting while another holder has it, 5 s at most: whoever may open the set
    // can keep it. Caught signals do not end the wait. Returns 0, or -1 with a line in the log,
    // which has errno 11 (EAGAIN) when the time is over.
    int Enter();

    // Gives the lock back. Returns 0, or -1 with a line in the log. Without a lock taken before, it
    // lets a second holder in.
    int Release();

  private:
    int Change(short by);

    unsigned int key_;
};

}  // namespace taviwireless::semaphore

#endif
