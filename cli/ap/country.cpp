// SPDX-License-Identifier: MIT
#include "cli/ap/country.h"

#include <tavicore/keyvalue.h>
#include <unistd.h>

#include <cctype>
#include <cstdio>

#include "cli/command_error.h"
#include "wireless/rules/paths.h"
#include "wireless/system/shell.h"

namespace taviwireless::cli {

namespace {

constexpr char kKey[] = "country";

// The country of the kernel as a whole; "00" is the world's. Empty where that cannot be told.
std::string CountryInForce() {
    const wireless::Pipe output(wireless::Command(128, {"iw reg get 2> /dev/null"}));
    char line[256];
    char country[3] = "";
    while (output && *country == '\0' && fgets(line, sizeof line, output.get()) != nullptr) {
        sscanf(line, "country %2[A-Z0-9]:", country);
    }
    return country;
}

// The kernel takes a moment: it reads the rules from a file.
bool ComesIntoForce(const std::string& country) {
    constexpr int kMostLooks = 10;
    constexpr useconds_t kPause = 100000;  // µs
    for (int i = 0; i < kMostLooks && CountryInForce() != country; ++i) {
        usleep(kPause);
    }
    return CountryInForce() == country;
}

}  // namespace

std::string CountryOf(const std::string& word) {
    if (word == "none") {
        return "";
    }
    std::string country;
    for (const char c : word) {
        country += static_cast<char>(toupper(static_cast<unsigned char>(c)));
    }
    if (country.size() != 2 ||
        country.find_first_not_of("ABCDEFGHIJKLMNOPQRSTUVWXYZ") != country.npos) {
        throw CommandError(kUsage, "country has two letters, such as DE or US, or is none");
    }
    return country;
}

std::string StoredCountry() {
    char country[3];
    return VEXACFileGetKeyValue(wireless::kCountry, kKey, country, sizeof country) == 2 ? country
                                                                                        : "";
}

void StoreCountry(const std::string& country) {
    if (VEXACFileSetKeyValue(wireless::kCountry, kKey, country.c_str(), wireless::kPlainLine) !=
        1) {
        throw CommandError(kFailure, std::string("cannot store the country in ") +
                                         wireless::kCountry + "; the system log tells why");
    }
}

std::string EnforceCountry() {
    const std::string country = StoredCountry();
    if (country.empty() || CountryInForce() == country) {
        return "";
    }
    const wireless::Pipe told(
        wireless::Command(128, {"iw reg set ", wireless::Argument{country}, " 2> /dev/null"}));
    if (told && fgetc(told.get()) == EOF && ComesIntoForce(country)) {
        return "";
    }
    const std::string inForce = CountryInForce();
    return "country " + country + " is not in force: " +
           (inForce.empty() ? "iw (package iw) cannot be asked"
                            : "the kernel keeps the rules of " + inForce +
                                  "; it needs the package wireless-regdb, and some adapters decide "
                                  "themselves");
}

}  // namespace taviwireless::cli
