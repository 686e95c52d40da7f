// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_RESTART_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_RESTART_H

#include "platform/host_root/network/plan.h"

namespace taviwireless::network {

// Brings the plan about and looks whether that worked. Throws Error when it did not; then what was
// before is in force again: bridges, members, addresses, routes and the programs that ran.
void BringAbout(const Plan& plan);

// If the last BringAbout was killed, puts back what was before it, as far as that goes.
void FinishKilledRestart();

}  // namespace taviwireless::network

#endif
