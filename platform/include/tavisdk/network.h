/* SPDX-License-Identifier: MIT */
/*
 * Network interfaces and the default route, IPv4.
 *
 * A failure sets the error code of <tavicore/error.h>: VEXAC_ERR_BAD_PARAMETER for a null argument
 * or text that is no address, VEXAC_ERR_NOT_FOUND when there is nothing to give, VEXAC_ERR_TOO_LONG
 * when it does not fit, otherwise VEXAC_ERR_IO.
 *
 * Sizes of records and offsets of their members are in bytes, the same on every processor.
 */
#ifndef TAVIWIRELESS_PLATFORM_INCLUDE_TAVISDK_NETWORK_H
#define TAVIWIRELESS_PLATFORM_INCLUDE_TAVISDK_NETWORK_H

#include <stddef.h>
#include <tavicore/export.h>

#ifdef __cplusplus
extern "C" {
#endif

enum { TAVI_NET_ADDRESS_SIZE = 20 }; /* an IPv4 address as text, and its zero byte */

/* Size 20: address 0. */
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

enum { TAVI_NET_IF_NAME_SIZE = 16 }; /* an interface's name, and its zero byte */

/* 1 when the interface is up (administratively), else 0, also when that cannot be told. */
TAVI_SDK_API int TAVINetIsIFUp(const char* interface);
/*
 * Bring the interface up or down (administratively), without waiting for a carrier. Return 1 when
 * that worked or it was so already, else 0.
 */
TAVI_SDK_API int VEXANetIfUp(const char* interface);
TAVI_SDK_API int VEXANetIfDown(const char* interface);

enum { VEXA_NET_ALL_INTERFACES = 2 }; /* query kind: every interface but loopback */

/* Link states. */
enum {
    VEXA_NET_LINK_DOWN = 0,
    VEXA_NET_LINK_NO_CARRIER = 1, /* up, but nothing at the other end */
    VEXA_NET_LINK_CONNECTED = 2   /* up, with a carrier */
};

/* Size 20: name 0, linkState 16. */
typedef struct VEXANetInterfaceInfo {
    char name[TAVI_NET_IF_NAME_SIZE];
    int linkState; /* VEXA_NET_LINK_... */
} VEXANetInterfaceInfo;

/*
 * Fills at most max entries of interfaces, in the kernel's order; kind is VEXA_NET_ALL_INTERFACES.
 * Returns their number, or -1 on error.
 */
TAVI_SDK_API int VEXANetGetInterfaceInfo(VEXANetInterfaceInfo* interfaces, int max, int kind);

/* The IPv4 settings of an interface. Size 60: interface 0, isStatic 16, address 20, netmask 40. */
typedef struct TAVINetCard {
    char interface[TAVI_NET_IF_NAME_SIZE];
    int isStatic; /* 0: by DHCP */
    char address[TAVI_NET_ADDRESS_SIZE];
    char netmask[TAVI_NET_ADDRESS_SIZE];
} TAVINetCard;

/*
 * Makes the card's address the only IPv4 address of the interface. A static card ends the
 * interface's DHCP client. flags is 0. Returns 0, or -1 on error, before anything is changed with a
 * bad address or netmask, and for a card by DHCP that has no address because there is no lease
 * (VEXAC_ERR_NOT_FOUND).
 */
TAVI_SDK_API int TAVINetSetCard1(const TAVINetCard* card, int flags);

/*
 * Gets a lease by DHCP for card->interface, which is up, and fills in its address and netmask;
 * isStatic becomes 0. The DHCP client goes on running to renew the lease, in place of an earlier
 * one. Returns 0, or -1 with empty texts when there is no lease after 12 seconds
 * (VEXAC_ERR_NOT_FOUND).
 *
 * The client's process id is in "/etc/dhcpc/dhcpcd-INTERFACE.pid", with its start time as
 * <tavicore/process.h> describes. Its lease is in "/etc/dhcpc/dhcpcd-INTERFACE.info", a key/value
 * file of IPADDR, NETMASK and, when the network has one, GATEWAY. The host edition runs udhcpc with
 * the script "/usr/tavi/bin/dhcp-lease", which sets the address and the name servers, but no route.
 */
TAVI_SDK_API int TAVIIGetDHCPTestNetInfo(TAVINetCard* card);

/*
 * 1 when the interface has its address from DHCP, that is, the process of its pid file is a running
 * DHCP client (in the host edition, a process named udhcpc), else 0.
 */
TAVI_SDK_API int BlTAVILnxIsDHCP(const char* interface);

#ifdef __cplusplus
}
#endif

#endif
