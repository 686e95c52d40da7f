// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_WIFI_LIBRARY_LIST_H
#define TAVIWIRELESS_CLI_WIFI_LIBRARY_LIST_H

#include <taviwireless/wireless.h>

#include <vector>

namespace taviwireless::cli {

// The members of a list that the library made, which are freed.
template <typename Record>
std::vector<Record> TakeList(WirelessLink& head) {
    std::vector<Record> records;
    WIRELESS_FOR_EACH(record, &head, Record) {
        records.push_back(*record);
    }
    WIRELESS_FREE_LIST(&head, Record);
    return records;
}

}  // namespace taviwireless::cli

#endif
