#ifndef TAVIWIRELESS_WIRELESS_RULES_BRIDGE_NAME_H
#define TAVIWIRELESS_WIRELESS_RULES_BRIDGE_NAME_H

#include <string>

namespace taviwireless::wireless {

// Why an access point cannot join a bridge of this name, as the end of a sentence that begins with
// "bridge"; empty when it can. There need be no such bridge yet.
std::string WhyNoBridge(const std::string& name);

}  // namespace taviwireless::wireless

#endif
