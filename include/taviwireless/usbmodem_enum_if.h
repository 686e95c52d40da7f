/* SPDX-License-Identifier: MIT */
#ifndef TAVIWIRELESS_USBMODEM_ENUM_IF_H
#define TAVIWIRELESS_USBMODEM_ENUM_IF_H

#include <tavicore/szlist.h>
#include <taviwireless/export.h>

#ifdef __cplusplus
extern "C" {
#endif

/*
 * Appends to *list the names of the PPP interfaces that belong to USB modems: by convention those
 * with unit numbers from 100 on, such as "ppp100"; lower ones are other PPP links of the system.
 * Reads the names of "/sys/class/net/ppp*" in their sorted order.
 *
 * list: the address of a list of the caller's own, from VEXACSzListAlloc; what it holds stays.
 *
 * Returns the number of names appended (0 or more), or -1: for a null list with the SDK's error
 * code VEXAC_ERR_BAD_PARAMETER (0x0D00), otherwise, when the folder cannot be read or there is no
 * memory, with a line in the log.
 */
TAVIWIRELESS_API int TAVIUSBModemEnumIf(VEXACSzList** list);

#ifdef __cplusplus
}
#endif

#endif
