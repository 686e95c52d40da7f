/* SPDX-License-Identifier: MIT */
/*
 * Network bridges and their DHCP service, as the appliance's saved settings describe them.
 *
 * A failure sets the error code of <tavicore/error.h>: VEXAC_ERR_NOT_FOUND alone says that there
 * are no such settings; with any other code, they may be there and could not be read or written.
 *
 * Sizes of records and offsets of their members are in bytes, the same on every processor.
 */
#ifndef TAVIWIRELESS_PLATFORM_INCLUDE_TAVISDK_BRIDGE_H
#define TAVIWIRELESS_PLATFORM_INCLUDE_TAVISDK_BRIDGE_H

#include <tavicore/export.h>
#include <tavicore/szlist.h>
#include <tavisdk/network.h>

#ifdef __cplusplus
extern "C" {
#endif

/* A bridge. Size 60: isLocal 0, name 4, address 20, netmask 40. */
typedef struct TAVINetBridge {
    int isLocal; /* 1: a network of its own, with address and netmask; 0: part of the wired one */
    char name[TAVI_NET_IF_NAME_SIZE];
    char address[TAVI_NET_ADDRESS_SIZE]; /* empty: that of the first member */
    char netmask[TAVI_NET_ADDRESS_SIZE];
} TAVINetBridge;

/* Kinds of members. */
enum { TAVI_NET_MEMBER_WIRED = 2, TAVI_NET_MEMBER_WIRELESS = 3 };

/*
 * The first member of a bridge, which decides what kind of bridge it is.
 * Size 20: kind 0, interface 4.
 */
typedef struct TAVINetBridgeMember {
    int kind; /* TAVI_NET_MEMBER_... */
    char interface[TAVI_NET_IF_NAME_SIZE];
} TAVINetBridgeMember;

/*
 * Reads "/etc/sysconfig/network-scripts/ifcfg-" and the bridge. The keys: PRIMARY is the first
 * member, or where that is missing, the first that VEXANetBridgeSlaveEnum gives; LOCAL_LAN tells
 * whether the bridge is local, or where that is missing, whether its first member is a "wlan"
 * interface; IPADDR and NETMASK may be missing. member->kind is TAVI_NET_MEMBER_WIRELESS for a
 * local bridge, else TAVI_NET_MEMBER_WIRED. Returns 0, or -1 when there is no such configuration or
 * one without an address that is of a local bridge or has no member.
 */
TAVI_SDK_API int TAVINetGetBridgeConfig(const char* bridge, TAVINetBridge* config,
                                        TAVINetBridgeMember* member);
/*
 * Writes that file anew, with ONBOOT=yes. A local bridge has an address and a member of the
 * wireless kind; another one may have none and is then given its first member's. Returns 0, or -1
 * on failure.
 */
TAVI_SDK_API int TAVINetSetBridgeConfig(const TAVINetBridge* config,
                                        const TAVINetBridgeMember* member);
/*
 * Appends the names of the bridge's member interfaces to *list: those that the bridge has now, or
 * when there is no such bridge, those whose file ifcfg-INTERFACE says BRIDGE. Returns their number,
 * or -1 when that cannot be told.
 */
TAVI_SDK_API int VEXANetBridgeSlaveEnum(const char* bridge, VEXACSzList** list);

/*
 * The DHCP service on a bridge.
 * Size 144: enabled 0, reserved 4, leaseTime 8, rangeStart 12, rangeEnd 32, interface 52,
 * bridge 68, gateway 84, nameServer 104, netmask 124.
 */
typedef struct TAVINetDhcpServer {
    int enabled;   /* 1: the network script runs it */
    int reserved;  /* the appliance stores 30 here; it means nothing to the host edition */
    int leaseTime; /* seconds */
    char rangeStart[TAVI_NET_ADDRESS_SIZE]; /* first address that is given out */
    char rangeEnd[TAVI_NET_ADDRESS_SIZE];   /* last one */
    char interface[TAVI_NET_IF_NAME_SIZE];  /* part of the file's name; the bridge again */
    char bridge[TAVI_NET_IF_NAME_SIZE];
    char gateway[TAVI_NET_ADDRESS_SIZE];    /* what clients are told; empty: nothing */
    char nameServer[TAVI_NET_ADDRESS_SIZE]; /* what clients are told, too */
    char netmask[TAVI_NET_ADDRESS_SIZE];
} TAVINetDhcpServer;

/*
 * Reads "/etc/dhcpd/dhcpd-INTERFACE-BRIDGE.info", or where that is missing the same name and
 * ".manual", under which a service that was put aside is kept. Returns 0, or -1 when there is none.
 */
TAVI_SDK_API int TAVINetGetDhcpServerConf(const char* interface, const char* bridge,
                                          TAVINetDhcpServer* server);
/*
 * Writes that file, and the configuration of the DHCP server for all bridges that have one, put
 * aside or not. With save 0 the server's configuration alone is written, from the files as they
 * are. Files that are no settings are passed over. Returns 1, or 0 on failure.
 *
 * The host edition's server is udhcpd, with "/etc/dhcpd/dhcpd-INTERFACE-BRIDGE.conf". The network
 * script runs it while the ".info" file says enable=yes.
 */
TAVI_SDK_API int TAVINetSetDhcpServerConfigFiles(const TAVINetDhcpServer* server, int save);
/* Non-zero when address lies in the subnet of network and netmask. */
TAVI_SDK_API int TAVINetIsSameSubnet(const char* address, const char* network, const char* netmask);

#ifdef __cplusplus
}
#endif

#endif
