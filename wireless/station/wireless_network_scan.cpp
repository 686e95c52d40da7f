// SPDX-License-Identifier: MIT
// The networks in range, as this system's "iwlist" lists them: a table with one network per line.
#include <tavisdk/network.h>
#include <taviwireless/wireless.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

#include "base/sleep_out.h"
#include "common/log.h"
#include "wireless/system/guarded.h"
#include "wireless/system/interface.h"
#include "wireless/system/queue.h"
#include "wireless/system/shell.h"

namespace taviwireless::wireless {

namespace {

constexpr int kAdapterTries = 6;  // one second apart
constexpr int kMaxScans = 5;
constexpr size_t kCommandSize = 128;

// The table that the tool prints. Columns count from 0.
constexpr int kHeadings = 2;        // lines
constexpr size_t kLineSize = 512;   // what is longer is read as further lines
constexpr size_t kMinLine = 32;     // its end counted
constexpr size_t kEssidColumn = 5;  // the channel stands before it
constexpr size_t kAddressColumn = 37;
// The field is a column wider than an ESSID can be. That column is not read: the record has no room
// for it, and where the tool leaves out the blank it is the first digit of the address.
constexpr size_t kEssidLength = WIRELESS_ESSID_SIZE - 1;
constexpr size_t kWordSize = 32;

bool WaitForAdapter() {
    for (int tries = 0; TAVIWirelessAdapterNum() <= 0; ++tries) {
        if (tries == kAdapterTries - 1) {
            TAVI_LOG_ERROR("There is no wireless USB adapter plugged");
            return false;
        }
        TAVI_LOG_ERROR("Wait for wlan0 ready, %d", tries);
        SleepOut(1);
    }
    return true;
}

std::string_view ColumnsFrom(std::string_view line, size_t column) {
    return line.substr(std::min(column, line.size()));
}

// Reads one item after the other as sscanf() does, which takes most of the time of a long table.
class Items {
  public:
    explicit Items(const char* text) : rest_(text) {}

    // As "%d".
    bool Number(int& number) {
        char* end = nullptr;
        number = static_cast<int>(strtol(rest_, &end, 10));
        const char* const begin = std::exchange(rest_, end);
        return end != begin;
    }
    // As "%x".
    bool Hex(unsigned char& byte) {
        char* end = nullptr;
        byte = static_cast<unsigned char>(strtoul(rest_, &end, 16));
        const char* const begin = std::exchange(rest_, end);
        return end != begin;
    }
    bool Colon() {
        const bool isThere = *rest_ == ':';
        rest_ += isThere ? 1 : 0;
        return isThere;
    }
    // As "%31s".
    bool Word(char (&word)[kWordSize]) {
        rest_ += strspn(rest_, kWhiteSpace);
        const size_t size = std::min(strcspn(rest_, kWhiteSpace), kWordSize - 1);
        word[std::string_view(rest_, size).copy(word, size)] = '\0';
        rest_ += size;
        return size > 0;
    }

  private:
    static constexpr char kWhiteSpace[] = " \t\n\v\f\r";
    const char* rest_;
};

// A channel of five digits leaves no blank before the ESSID, which may begin with one.
bool ParseChannel(std::string_view line, int& channel) {
    const bool isFull = isdigit(static_cast<unsigned char>(line[kEssidColumn - 1])) != 0;
    return isFull ? Items(std::string(line.substr(0, kEssidColumn)).c_str()).Number(channel)
                  : Items(line.data()).Number(channel);
}

// Reads the ESSID. False when it is blank: the network hides its name.
bool ParseEssid(std::string_view line, WirelessNetwork& network) {
    std::string_view essid = ColumnsFrom(line, kEssidColumn).substr(0, kEssidLength);
    while (!essid.empty() && isspace(static_cast<unsigned char>(essid.back())) != 0) {
        essid.remove_suffix(1);
    }
    essid.copy(network.essid, essid.size());
    return !essid.empty();
}

void ParseSecurity(const char* security, WirelessNetwork& network) {
    if (strcasecmp(security, "NONE") == 0) {
        network.auth = WIRELESS_AUTH_OPEN;
        network.encrypt = WIRELESS_ENCRYPT_NONE;
        return;
    }
    if (strcasecmp(security, "WEP") == 0) {
        network.auth = WIRELESS_AUTH_WEP_AUTO;
        network.encrypt = WIRELESS_ENCRYPT_WEP;
        return;
    }
    const char* slash = strchr(security, '/');
    if (slash == nullptr || slash == security || slash[1] == '\0') {
        TAVI_LOG_ERROR("Failed to parse security field '%s'", security);
        return;
    }
    network.auth = TAVIWirelessAuthParse(std::string(security, slash).c_str());
    network.encrypt = TAVIWirelessEncryptParse(slash + 1);
}

// columns begin with the address.
bool ParseAddressAndMore(const char* columns, WirelessNetwork& network) {
    Items items(columns);
    for (unsigned char& byte : network.bssid) {
        if ((&byte != network.bssid && !items.Colon()) || !items.Hex(byte)) {
            return false;
        }
    }
    char protocol[kWordSize];
    char security[kWordSize];
    if (!items.Number(network.signal) || !items.Word(protocol) || !items.Word(security)) {
        return false;
    }
    network.protocol = TAVIWirelessProtocolParse(protocol);
    ParseSecurity(security, network);
    return true;
}

// Returns the network of a line; nothing when the line describes none.
std::optional<WirelessNetwork> ParseLine(const char* text) {
    const std::string_view line(text);
    if (line.size() < kMinLine) {
        return std::nullopt;
    }
    WirelessNetwork network{};
    if (!ParseChannel(line, network.channel)) {
        TAVI_LOG_ERROR("Failed to parse channel(%s)", text);
        return std::nullopt;
    }
    if (!ParseEssid(line, network)) {
        return std::nullopt;
    }
    if (!ParseAddressAndMore(ColumnsFrom(line, kAddressColumn).data(), network)) {
        TAVI_LOG_ERROR("Failed to parse network info(%s)", text);
        return std::nullopt;
    }
    return network;
}

bool Append(WirelessLink& networks, const WirelessNetwork& network) {
    auto* const record = static_cast<WirelessNetwork*>(calloc(1, sizeof network));
    if (record == nullptr) {
        TAVI_LOG_ERROR("Failed to alloc memory");
        return false;
    }
    *record = network;
    InsertBefore(networks, record->link);
    return true;
}

// Appends what one run of the tool lists. Returns the number of networks; -1 on failure, and then
// too the list holds what was read.
int ListNetworks(const char* interface, WirelessLink& networks) {
    const Command command(kCommandSize, {"/sbin/iwlist ", interface, " scanning tavi"});
    const Pipe pipe(command);
    if (!pipe) {
        TAVI_LOG_ERROR("Failed to popen '%s', errno=%s", command.Described().c_str(),
                       strerror(errno));
        return -1;
    }
    int count = 0;
    char line[kLineSize];
    for (int number = 0; fgets(line, sizeof line, pipe.get()) != nullptr; ++number) {
        if (number < kHeadings) {
            continue;
        }
        const std::optional<WirelessNetwork> network = ParseLine(line);
        if (!network) {
            continue;
        }
        if (!Append(networks, *network)) {
            return -1;
        }
        ++count;
    }
    return count;
}

// One scan of a USB adapter often misses some of the networks, so two must agree. What the last
// one gives is taken as it is.
int ListUntilStable(const char* interface, WirelessLink& networks) {
    int previousCount = 0;
    for (int scan = 0;; ++scan) {
        const int count = ListNetworks(interface, networks);
        if (count > 0 && count == previousCount) {
            TAVI_LOG_ERROR("Scan %d: success.", scan);
            return 0;
        }
        TAVI_LOG_ERROR("Scan %d: %s.", scan,
                       count < 0    ? "failed"
                       : count == 0 ? "no scan result"
                                    : "result is un-stable");
        const bool isLast = scan == kMaxScans - 1;
        if (isLast && count >= 0) {
            return 0;
        }
        WIRELESS_FREE_LIST(&networks, WirelessNetwork);
        if (isLast) {
            TAVI_LOG_ERROR("Failed to get network scanning result");
            return -1;
        }
        previousCount = count;
    }
}

int Scan(int trigger, WirelessLink* networks) {
    if (!WaitForAdapter()) {
        return -1;
    }
    const std::string name = WirelessInterface();
    const char* interface = name.c_str();
    if (name.empty() || networks == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    if (VEXANetIfUp(interface) == 0) {
        TAVI_LOG_ERROR("Failed to activate network interface %s", interface);
        return -1;
    }
    SleepOut(1);  // the adapter hears nothing before
    if (trigger == 1) {
        const Command command(kCommandSize,
                              {"/sbin/iwlist ", interface, " scanning > /dev/null 2>&1"});
        if (!TAVI_RUN(command)) {
            return -1;
        }
    }
    return ListUntilStable(interface, *networks);
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessNetworkScan(int trigger, WirelessLink* networks) {
    using namespace taviwireless::wireless;
    if (networks != nullptr) {
        MakeEmpty(*networks);
    }
    const int result =
        TAVI_GUARDED(-1, [=] { return taviwireless::wireless::Scan(trigger, networks); });
    if (result < 0 && networks != nullptr) {
        WIRELESS_FREE_LIST(networks, WirelessNetwork);
    }
    return result;
}
