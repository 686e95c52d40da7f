/*
 * Network interfaces and the default route, IPv4.
 *
 * A failure sets the error code of <tavicore/error.h>: VEXAC_ERR_BAD_PARAMETER for a null argument
 * or text that is no address, VEXAC_ERR_NOT_FOUND when there is nothing to give, VEXAC_ERR_TOO_LONG
 * when it does not fit, otherwise VEXAC_ERR_IO.
 */
#ifndef TAVISDK_NETWORK_H
#define TAVISDK_NETWORK_H

#include <stddef.h>
#include <tavicore/export.h>

#ifdef __cplusplus
extern "C" {
#endif

enum { TAVI_NET_ADDRESS_SIZE = 20 }; /* an IPv4 address as text, and its zero byte */

typedef struct TAVINetIFInfo {
    char address[TAVI_NET_ADDRESS_SIZE]; /* the local one, also of a point-to-point link */
} TAVINetIFInfo;

/*
 * Fills *info with what is known of the interface. Returns 1; 0 when there is nothing to know
 * (there is no such interface, or it has no IPv4 address), with an empty address; -1 on error.
 */
TAVI_SDK_API int TAVINetIFGetInfo(const char* interface, TAVINetIFInfo* info);

/*
 * Copies the default gateway in force, that of the default route with the lowest metric, into
 * gateway, a buffer of size bytes. For a default route through a point-to-point link, which needs
 * no gateway, that is the address of the other end. Returns 0, or -1 when there is none.
 */
TAVI_SDK_API int TAVINetDefaultGatewayGet(char* gateway, size_t size);

/*
 * Makes the address the default gateway: the default route with the lowest metric is replaced in
 * one step. Returns 0, or -1 with the route as it was, also when no link leads to the gateway.
 */
TAVI_SDK_API int TAVINetDefaultGatewaySet(const char* gateway);

/*
 * Copies the default gateway of the saved settings into gateway, a buffer of size bytes: the key
 * GATEWAY of "/etc/sysconfig/network", or of the first file
 * "/etc/sysconfig/network-scripts/ifcfg-*" that has one and whose ONBOOT is not "no". Returns 0, or
 * -1 when there is none.
 */
TAVI_SDK_API int TAVINetDefaultGatewayGetConf(char* gateway, size_t size);

/* Returns 1 when text is an IPv4 or IPv6 address in full, else 0. */
TAVI_SDK_API int BlVEXAIsIpAddr(const char* text);

#ifdef __cplusplus
}
#endif

#endif
