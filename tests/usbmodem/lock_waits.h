#ifndef TAVIWIRELESS_TESTS_USBMODEM_LOCK_WAITS_H
#define TAVIWIRELESS_TESTS_USBMODEM_LOCK_WAITS_H

#include <chrono>

// The waits for a modem's lock, of the library as well: where they are cut, they are over at once.
namespace taviwireless::test {

extern bool lockWaitsAreCut;
extern std::chrono::seconds longestCutWait;  // as it was asked for

}  // namespace taviwireless::test

#endif
