/* SPDX-License-Identifier: MIT */
/*
 * The public names of Wi-Fi functions that libtaviwireless implements under the same name and
 * "_core". They reach the library that the process has loaded.
 */
#ifndef TAVIWIRELESS_PLATFORM_INCLUDE_TAVISDK_WIRELESS_H
#define TAVIWIRELESS_PLATFORM_INCLUDE_TAVISDK_WIRELESS_H

#include <tavicore/export.h>

#ifdef __cplusplus
extern "C" {
#endif

/*
 * The wireless interface, a constant that the caller does not free; null when the library is not
 * loaded, as for the functions below with VEXAC_ERR_NOT_FOUND.
 */
TAVI_SDK_API const char* TAVIWirelessInterfaceGet(void);
/* Non-zero when the model supports Wi-Fi; 0 when not, and when the library is not loaded. */
TAVI_SDK_API int TAVIWirelessIsSupported(void);
/*
 * Ends the Wi-Fi connection, as <taviwireless/wireless.h> describes. Returns 0, or -1 on failure,
 * also when the library is not loaded.
 */
TAVI_SDK_API int TAVIWirelessNetworkDisconnect(void);

#ifdef __cplusplus
}
#endif

#endif
