// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_INTERRUPT_H
#define TAVIWIRELESS_CLI_INTERRUPT_H

#include <functional>
#include <optional>
#include <string>

#include "base/unique_fd.h"

namespace taviwireless::cli {

// While it lives, a signal that ends the program (SIGINT, SIGTERM, SIGHUP) has the work undone:
//
//   const UndoneBySignal guard([](const std::string& why) { ... });  // puts back what was, says so
//   ...                                                              // the work
//
// The work can be anywhere then, within a call of the library too, which knows no end but its own.
// So it goes on in a child: the constructor forks and returns in the child alone. The program that
// was started waits for it, and ends with its exit status. A signal ends the child and all that it
// started, daemons included; then undo runs, with nobody beside it, in the program that waited,
// which knows what was known when the guard was made, and which at last dies of the signal. So is a
// child undone that was killed by another signal. Behind the destructor a signal just ends the
// program. `why` begins a sentence: "interrupted", or "not done within 5 s".
//
// To be made after input was read (a child that is ended gives no echo back to its terminal), and
// before there are threads or a connection to a bus; not within another one. A signal that is
// ignored stays so. Throws CommandError when there is no process for it.
class UndoneBySignal {
  public:
    using Undo = std::function<void(const std::string& why)>;

    // With a limit, work that takes longer is undone as well; the program then has failed.
    explicit UndoneBySignal(const Undo& undo, std::optional<int> seconds = std::nullopt);
    ~UndoneBySignal();
    UndoneBySignal(const UndoneBySignal&) = delete;
    UndoneBySignal& operator=(const UndoneBySignal&) = delete;

  private:
    UniqueFd done_;  // takes a byte when the work is done
};

}  // namespace taviwireless::cli

#endif
