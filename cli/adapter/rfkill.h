// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_ADAPTER_RFKILL_H
#define TAVIWIRELESS_CLI_ADAPTER_RFKILL_H

namespace taviwireless::cli {

// The kernel's switches of the adapter's radio.
enum class RadioSwitch {
    kNone,  // the kernel knows none
    kOn,
    kOff,      // by software
    kOffHard,  // by a switch or a key of the machine
};
RadioSwitch LookAtRadioSwitch();
// False when it cannot be set.
bool SetRadioSwitch(bool isOn);

}  // namespace taviwireless::cli

#endif
