#ifndef TAVIWIRELESS_TESTS_WIRELESS_FAILING_STAT_H
#define TAVIWIRELESS_TESTS_WIRELESS_FAILING_STAT_H

namespace taviwireless::test {

// A program that links tavi_failing_stat defines stat() itself. When this is n above 0, the n-th
// call from then on that looks at the stored settings of the access point fails with EIO. It begins
// with the number in the environment variable FAILING_STAT.
extern int gFailingStat;

}  // namespace taviwireless::test

#endif
