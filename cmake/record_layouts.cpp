// SPDX-License-Identifier: MIT
// The records that callers share with the library, byte for byte: programs that were compiled before
// hold them as well. Each pair of numbers is for 32 and for 64 bits.
#include <tavicore/szlist.h>
#include <tavisdk/bridge.h>
#include <tavisdk/network.h>
#include <taviwireless/wireless.h>

#define SAME_SIZE(record, size) static_assert(sizeof(record) == (size), #record)
#define SAME_AT(record, member, offset) \
    static_assert(offsetof(record, member) == (offset), #record " " #member)
#define SIZE(record, narrow, wide) SAME_SIZE(record, sizeof(void*) == 4 ? (narrow) : (wide))
#define AT(record, member, narrow, wide) \
    SAME_AT(record, member, sizeof(void*) == 4 ? (narrow) : (wide))

SIZE(WirelessNameValue, 8, 16);
SAME_AT(WirelessNameValue, name, 0);
AT(WirelessNameValue, value, 4, 8);

SIZE(WirelessLink, 8, 16);
SAME_AT(WirelessLink, next, 0);
AT(WirelessLink, previous, 4, 8);

SIZE(WirelessNetwork, 72, 80);
SAME_AT(WirelessNetwork, essid, 0);
SAME_AT(WirelessNetwork, bssid, 33);
SAME_AT(WirelessNetwork, channel, 40);
SAME_AT(WirelessNetwork, signal, 44);
SAME_AT(WirelessNetwork, opmode, 48);
SAME_AT(WirelessNetwork, protocol, 52);
SAME_AT(WirelessNetwork, auth, 56);
SAME_AT(WirelessNetwork, encrypt, 60);
SAME_AT(WirelessNetwork, link, 64);

SIZE(WirelessConf, 668, 688);
SAME_AT(WirelessConf, key, 0);
SAME_AT(WirelessConf, ipAddr, 257);
SAME_AT(WirelessConf, netmask, 277);
SAME_AT(WirelessConf, gateway, 297);
SAME_AT(WirelessConf, accessTime, 320);
AT(WirelessConf, network, 324, 328);
AT(WirelessConf, link, 396, 408);
AT(WirelessConf, anyBssid, 404, 424);
AT(WirelessConf, user, 408, 428);

SIZE(WirelessStatus, 76, 88);
SAME_AT(WirelessStatus, status, 0);
AT(WirelessStatus, network, 4, 8);

SAME_SIZE(WirelessInfo, 36);

SAME_SIZE(WirelessAPSecret, 288);
SAME_AT(WirelessAPSecret, wepKey, 0);
SAME_AT(WirelessAPSecret, wpa.wpaVersion, 0);
SAME_AT(WirelessAPSecret, wpa.passphrase, 4);
SAME_AT(WirelessAPSecret, wpa.cipher, 260);
SAME_AT(WirelessAPSecret, enterprise.wpaVersion, 0);
SAME_AT(WirelessAPSecret, enterprise.cipher, 4);
SAME_AT(WirelessAPSecret, enterprise.radiusAddr, 8);
SAME_AT(WirelessAPSecret, enterprise.radiusPort, 28);
SAME_AT(WirelessAPSecret, enterprise.radiusSecret, 32);

SAME_SIZE(WirelessAPConf, 1028);
SAME_AT(WirelessAPConf, ssid, 0);
SAME_AT(WirelessAPConf, bridge, 128);
SAME_AT(WirelessAPConf, hidden, 144);
SAME_AT(WirelessAPConf, band, 148);
SAME_AT(WirelessAPConf, ieee80211n, 152);
SAME_AT(WirelessAPConf, htFlags, 156);
SAME_AT(WirelessAPConf, channel, 160);
SAME_AT(WirelessAPConf, maxStations, 164);
SAME_AT(WirelessAPConf, wmm, 168);
SAME_AT(WirelessAPConf, security, 172);
SAME_AT(WirelessAPConf, secret, 176);
SAME_AT(WirelessAPConf, guestEnabled, 464);
SAME_AT(WirelessAPConf, guestSsid, 468);
SAME_AT(WirelessAPConf, guestBssid, 596);
SAME_AT(WirelessAPConf, guestHidden, 724);
SAME_AT(WirelessAPConf, guestMaxStations, 728);
SAME_AT(WirelessAPConf, guestIsolate, 732);
SAME_AT(WirelessAPConf, guestSecurity, 736);
SAME_AT(WirelessAPConf, guestSecret, 740);

SAME_SIZE(WirelessAPSettings, 1440);
SAME_AT(WirelessAPSettings, enabled, 0);
SAME_AT(WirelessAPSettings, txPower, 4);
SAME_AT(WirelessAPSettings, name, 8);
SAME_AT(WirelessAPSettings, ap, 40);
SAME_AT(WirelessAPSettings, unblock, 1068);
SAME_AT(WirelessAPSettings, schedule, 1072);
SAME_AT(WirelessAPSettings, scheduleEnabled, 1244);
SAME_AT(WirelessAPSettings, guestSchedule, 1248);
SAME_AT(WirelessAPSettings, guestScheduleEnabled, 1420);
SAME_AT(WirelessAPSettings, guestLanBlock, 1424);
SAME_AT(WirelessAPSettings, guestAccessServer, 1428);
SAME_AT(WirelessAPSettings, guestInternetBlock, 1432);
SAME_AT(WirelessAPSettings, guestAllowHttp, 1436);

SAME_SIZE(VEXACSzList, 4);
SAME_AT(VEXACSzList, count, 0);

SAME_SIZE(TAVINetIFInfo, 20);
SAME_AT(TAVINetIFInfo, address, 0);

SAME_SIZE(VEXANetInterfaceInfo, 20);
SAME_AT(VEXANetInterfaceInfo, name, 0);
SAME_AT(VEXANetInterfaceInfo, linkState, 16);

SAME_SIZE(TAVINetCard, 60);
SAME_AT(TAVINetCard, interface, 0);
SAME_AT(TAVINetCard, isStatic, 16);
SAME_AT(TAVINetCard, address, 20);
SAME_AT(TAVINetCard, netmask, 40);

SAME_SIZE(TAVINetBridge, 60);
SAME_AT(TAVINetBridge, isLocal, 0);
SAME_AT(TAVINetBridge, name, 4);
SAME_AT(TAVINetBridge, address, 20);
SAME_AT(TAVINetBridge, netmask, 40);

SAME_SIZE(TAVINetBridgeMember, 20);
SAME_AT(TAVINetBridgeMember, kind, 0);
SAME_AT(TAVINetBridgeMember, interface, 4);

SAME_SIZE(TAVINetDhcpServer, 144);
SAME_AT(TAVINetDhcpServer, enabled, 0);
SAME_AT(TAVINetDhcpServer, reserved, 4);
SAME_AT(TAVINetDhcpServer, leaseTime, 8);
SAME_AT(TAVINetDhcpServer, rangeStart, 12);
SAME_AT(TAVINetDhcpServer, rangeEnd, 32);
SAME_AT(TAVINetDhcpServer, interface, 52);
SAME_AT(TAVINetDhcpServer, bridge, 68);
SAME_AT(TAVINetDhcpServer, gateway, 84);
SAME_AT(TAVINetDhcpServer, nameServer, 104);
SAME_AT(TAVINetDhcpServer, netmask, 124);
