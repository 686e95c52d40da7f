// SPDX-License-Identifier: MIT
#include "platform/host_root/iwlist/information_elements.h"

#include <cstdint>

namespace taviwireless::iwlist {

namespace {

// Element numbers of IEEE 802.11.
constexpr uint8_t kSsid = 0;
constexpr uint8_t kSupportedRates = 1;
constexpr uint8_t kHtCapabilities = 45;
constexpr uint8_t kRsn = 48;
constexpr uint8_t kExtendedRates = 50;
constexpr uint8_t kVendor = 221;

constexpr std::string_view kWpaVendor("\x00\x50\xf2\x01", 4);  // the vendor element that is WPA's

// Cipher suites and kinds of key management are three bytes of their author and a number.
constexpr std::string_view kRsnAuthor("\x00\x0f\xac", 3);
constexpr std::string_view kWpaAuthor("\x00\x50\xf2", 3);
constexpr size_t kSuiteSize = 4;

// Takes bytes off the front of an element; an element that is too short gives zeros, and is empty
// from there on.
class Reader {
  public:
    explicit Reader(std::string_view bytes) : rest_(bytes) {}

    bool IsEmpty() const { return rest_.empty(); }
    std::string_view Take(size_t size) {
        const std::string_view taken = size <= rest_.size() ? rest_.substr(0, size) : "";
        rest_.remove_prefix(taken.size() == size ? size : rest_.size());
        return taken;
    }
    uint8_t TakeByte() {
        const std::string_view byte = Take(1);
        return byte.empty() ? 0 : static_cast<uint8_t>(byte[0]);
    }
    int TakeNumber() {  // two bytes, the lower one first
        const int low = TakeByte();
        return low | TakeByte() << 8;
    }

  private:
    std::string_view rest_;
};

// The number of a suite; -1 when it is not this author's.
int SuiteNumber(std::string_view suite, std::string_view author) {
    const bool isAuthors = suite.size() == kSuiteSize && suite.substr(0, author.size()) == author;
    return isAuthors ? static_cast<uint8_t>(suite.back()) : -1;
}

int CipherOf(int number) {
    switch (number) {
        case 2:
            return kTkip;
        case 4:
            return kAes;
        default:  // WEP, and those of newer hardware
            return kNoCipher;
    }
}

int RsnKeyManagementOf(int number) {
    switch (number) {
        case 1:  // 802.1X
        case 3:  // the same with fast transition
        case 5:  // with SHA-256
            return kEap;
        case 2:
        case 4:
        case 6:
            return kPsk;
        default:  // WPA3 and others
            return kNoKeyManagement;
    }
}

int WpaKeyManagementOf(int number) {
    switch (number) {
        case 0:
            return kWpaNone;
        case 1:
            return kEap;
        case 2:
            return kPsk;
        default:
            return kNoKeyManagement;
    }
}

// Both elements have the same build; where one ends early, the rest has its default.
Protection ParseProtection(Reader element, std::string_view author, int (*keyManagementOf)(int),
                           Protection defaults) {
    element.TakeNumber();  // version
    if (element.IsEmpty()) {
        return defaults;
    }
    const int group = CipherOf(SuiteNumber(element.Take(kSuiteSize), author));
    if (element.IsEmpty()) {
        return defaults;
    }
    Protection found{true};
    for (int count = element.TakeNumber(); count > 0 && !element.IsEmpty(); --count) {
        constexpr int kUseGroupCipher = 0;
        const int number = SuiteNumber(element.Take(kSuiteSize), author);
        found.ciphers |= number == kUseGroupCipher ? group : CipherOf(number);
    }
    if (element.IsEmpty()) {
        found.keyManagement = defaults.keyManagement;
    }
    for (int count = element.TakeNumber(); count > 0 && !element.IsEmpty(); --count) {
        found.keyManagement |= keyManagementOf(SuiteNumber(element.Take(kSuiteSize), author));
    }
    return found;
}

void ParseRates(std::string_view rates, InformationElements& found) {
    for (const char byte : rates) {
        switch (byte & 0x7f) {  // in half Mbit/s; the highest bit says that a station must know it
            case 2:
            case 4:
            case 11:
            case 22:
                found.hasSlowRates = true;
                break;
            case 12:
            case 18:
            case 24:
            case 36:
            case 48:
            case 72:
            case 96:
            case 108:
                found.hasFastRates = true;
                break;
            default:  // not a rate: a demand that some other standard be understood
                break;
        }
    }
}

void ParseElement(uint8_t number, std::string_view body, InformationElements& found) {
    switch (number) {
        case kSsid:
            found.essid = body;
            break;
        case kSupportedRates:
        case kExtendedRates:
            ParseRates(body, found);
            break;
        case kHtCapabilities:
            found.hasHighThroughput = true;
            break;
        case kRsn:
            found.rsn =
                ParseProtection(Reader(body), kRsnAuthor, RsnKeyManagementOf, {true, kAes, kEap});
            break;
        case kVendor:
            if (body.substr(0, kWpaVendor.size()) == kWpaVendor) {
                found.wpa = ParseProtection(Reader(body.substr(kWpaVendor.size())), kWpaAuthor,
                                            WpaKeyManagementOf, {true, kTkip, kEap});
            }
            break;
        default:
            break;
    }
}

}  // namespace

InformationElements ParseInformationElements(std::string_view bytes) {
    InformationElements found;
    Reader reader(bytes);
    while (!reader.IsEmpty()) {
        const uint8_t number = reader.TakeByte();
        if (reader.IsEmpty()) {
            break;
        }
        const uint8_t size = reader.TakeByte();
        const std::string_view body = reader.Take(size);
        if (body.size() == size) {
            ParseElement(number, body, found);
        }
    }
    return found;
}

}  // namespace taviwireless::iwlist
