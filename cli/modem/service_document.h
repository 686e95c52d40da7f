// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_MODEM_SERVICE_DOCUMENT_H
#define TAVIWIRELESS_CLI_MODEM_SERVICE_DOCUMENT_H

#include <string>

#include "cli/modem/modem_access.h"

namespace taviwireless::cli {

// Read the documents of the modem service. They look like JSON but are lines: texts stand in them
// as the modem sent them, quotes and backslashes included. What a document does not hold stays as
// in an empty ModemState, or away from the profile.
ModemState ReadModemDocument(const std::string& document);
Profile ReadProfileDocument(const std::string& document);

}  // namespace taviwireless::cli

#endif
