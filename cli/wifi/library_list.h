#ifndef TAVIWIRELESS_CLI_WIFI_LIBRARY_LIST_H
#define TAVIWIRELESS_CLI_WIFI_LIBRARY_LIST_H

#include <taviwireless/wireless.h>

#include <cstdlib>
#include <memory>
#include <vector>

namespace taviwireless::cli {

// The members of a list that the library made, which are freed.
template <typename Record>
std::vector<Record> TakeList(WirelessLink& head) {
    std::vector<Record> records;
    for (WirelessLink* link = head.next; link != &head;) {
        const std::unique_ptr<Record, decltype(&free)> record(WIRELESS_RECORD(link, Record), free);
        link = link->next;
        records.push_back(*record);
    }
    return records;
}

}  // namespace taviwireless::cli

#endif
