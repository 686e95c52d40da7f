// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_AP_COUNTRY_H
#define TAVIWIRELESS_CLI_AP_COUNTRY_H

#include <string>

// The country whose rules the radio keeps: which channels there are, and how strong. The store of
// the access point has no place for it, so it has a file of its own.
namespace taviwireless::cli {

// "DE" for "de", the empty text for "none"; throws for what cannot be a code of ISO 3166.
std::string CountryOf(const std::string& word);

// Empty when none is stored.
std::string StoredCountry();
void StoreCountry(const std::string& country);

// Tells the kernel, and looks whether the country is in force. Returns a remark if it is not; the
// empty text if it is, or none is stored.
std::string EnforceCountry();

}  // namespace taviwireless::cli

#endif
