// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_ADAPTER_CREDENTIALS_H
#define TAVIWIRELESS_CLI_ADAPTER_CREDENTIALS_H

#include <taviwireless/wireless.h>

#include <string>
#include <vector>

#include "wireless/rules/security.h"

namespace taviwireless::cli {

using wireless::Security;
using wireless::SecurityOf;

// The words of --security, and what a network of that kind has.
const std::vector<std::string>& SecurityWords();
void SetSecurity(WirelessNetwork& network, const std::string& word);

// Throws unless the ESSID can be joined or created.
void CheckEssid(const std::string& essid);

// Throws unless the key has the form that such a network wants: a wrong one would only cost the
// time of an attempt.
void CheckKey(Security security, const std::string& key);

// Throws unless the text can be an EAP identity.
void CheckUser(const std::string& user);

// Reads the key behind a prompt, and checks it.
std::string ReadKey(Security security, const std::string& essid);

}  // namespace taviwireless::cli

#endif
