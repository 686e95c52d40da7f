/* SPDX-License-Identifier: MIT */
/* Services of the appliance that follow the network. */
#ifndef TAVIWIRELESS_PLATFORM_INCLUDE_TAVISDK_SERVICE_H
#define TAVIWIRELESS_PLATFORM_INCLUDE_TAVISDK_SERVICE_H

#include <tavicore/export.h>

#ifdef __cplusplus
extern "C" {
#endif

/* What TAVIMediaService can be asked to do. */
enum { TAVI_MEDIA_SERVICE_RESTART = 2 };

/*
 * Restarts the media service on the network as it is now, and waits until that is done; action is
 * TAVI_MEDIA_SERVICE_RESTART. The host edition runs "/etc/rc.mediaservice restart".
 *
 * Returns 0, or -1 with the error code of <tavicore/error.h>: VEXAC_ERR_BAD_PARAMETER for another
 * action, VEXAC_ERR_NOT_FOUND when there is no such script, VEXAC_ERR_IO when it fails.
 */
TAVI_SDK_API int TAVIMediaService(int action);

#ifdef __cplusplus
}
#endif

#endif
