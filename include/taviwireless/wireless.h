/* SPDX-License-Identifier: MIT */
/*
 * The Wi-Fi adapter "wlan0" as a station, in ad-hoc mode and as an access point. Plain C.
 *
 * What holds for all functions:
 * - They work on one adapter, in the caller's own process; all state is in files. The adapter's
 *   settings need root.
 * - An int result is 0 for success and -1 for failure where nothing else is said; the functions of
 *   the access point return 1 and 0. A failure is a line in the system log; a null argument fails
 *   with "Bad parameters".
 * - The name of an interface has 1 to 15 letters, digits, "_", "." and "-", of which the first is a
 *   letter or a digit; another text is a bad parameter. So is a null that the SDK gives for the
 *   wireless interface.
 * - Records are plain and may be zeroed with memset. Texts in them end in a zero byte. Their sizes
 *   and the offsets of their members are given in bytes; of two numbers the first is for 32-bit
 *   processors, the second for 64-bit ones. The library is not built where they are others.
 * - Lists are circular queues of links, as insque() knows them. The caller owns the head, which the
 *   functions make empty first, and the members, records of which `link` is a part:
 *   WIRELESS_FOR_EACH goes through them, WIRELESS_FREE_LIST frees them. A program in a language
 *   without these macros calls free() for each record.
 * - They wait with sleep(), block while tools run, and must not be called from two threads at once.
 */
#ifndef TAVIWIRELESS_WIRELESS_H
#define TAVIWIRELESS_WIRELESS_H

#include <stddef.h>
#include <stdint.h>
#include <stdlib.h>
#include <taviwireless/export.h>

#ifdef __cplusplus
extern "C" {
#endif

/* ---- Vocabulary ---- */

/* How a station proves itself to a network. PSK: with a pass phrase; EAP: with a user name, too. */
typedef enum WirelessAuth {
    WIRELESS_AUTH_UNKNOWN = 0,
    WIRELESS_AUTH_OPEN = 1,
    WIRELESS_AUTH_SHARED = 2,   /* WEP, shared key */
    WIRELESS_AUTH_WEP_AUTO = 3, /* WEP, open or shared as the access point likes */
    WIRELESS_AUTH_WPA_PSK = 4,
    WIRELESS_AUTH_WPA2_PSK = 5, /* also WPA and WPA2 mixed */
    WIRELESS_AUTH_WPA_NONE = 6, /* WPA in ad-hoc networks */
    WIRELESS_AUTH_WPA_EAP = 7,
    WIRELESS_AUTH_WPA2_EAP = 8
} WirelessAuth;

/* What a network encrypts with, a set of bits. */
typedef enum WirelessEncrypt {
    WIRELESS_ENCRYPT_UNKNOWN = 0,
    WIRELESS_ENCRYPT_NONE = 1,
    WIRELESS_ENCRYPT_WEP = 2,
    WIRELESS_ENCRYPT_TKIP = 4,
    WIRELESS_ENCRYPT_AES = 8, /* CCMP */
    WIRELESS_ENCRYPT_TKIP_AES = 12
} WirelessEncrypt;

/* The adapter's mode, numbered as the IW_MODE_ constants of the wireless extensions. */
typedef enum WirelessOpmode {
    WIRELESS_OPMODE_AUTO = 0,
    WIRELESS_OPMODE_ADHOC = 1,   /* a network of stations, without access point */
    WIRELESS_OPMODE_MANAGED = 2, /* a station of an access point */
    WIRELESS_OPMODE_MASTER = 3,  /* an access point */
    WIRELESS_OPMODE_REPEATER = 4,
    WIRELESS_OPMODE_SECONDARY = 5,
    WIRELESS_OPMODE_MONITOR = 6,
    WIRELESS_OPMODE_UNKNOWN = 7
} WirelessOpmode;

/* Sets of 802.11 protocols; the letters of each are in its name. */
typedef enum WirelessProtocol {
    WIRELESS_PROTOCOL_UNKNOWN = 0,
    WIRELESS_PROTOCOL_BG = 1,
    WIRELESS_PROTOCOL_B = 2,
    WIRELESS_PROTOCOL_A = 3,
    WIRELESS_PROTOCOL_ABG = 4,
    WIRELESS_PROTOCOL_G = 5,
    WIRELESS_PROTOCOL_ABGN = 6,
    WIRELESS_PROTOCOL_N = 7,
    WIRELESS_PROTOCOL_GN = 8,
    WIRELESS_PROTOCOL_AN = 9,
    WIRELESS_PROTOCOL_BGN = 10,
    WIRELESS_PROTOCOL_AGN = 11,
    WIRELESS_PROTOCOL_BN = 12
} WirelessProtocol;

/* An entry of the tables below. Size 8 or 16: name 0, value 4 or 8. */
typedef struct WirelessNameValue {
    const char* name;
    int32_t value; /* of the enumeration that the table is for */
} WirelessNameValue;

/* Lengths of the tables. */
enum {
    WIRELESS_AUTH_NAMES = 19,
    WIRELESS_ENCRYPT_NAMES = 7,
    WIRELESS_OPMODE_NAMES = 13,
    WIRELESS_PROTOCOL_NAMES = 17
};

/*
 * The names that are understood: those of drivers, tools and configuration files. Several names may
 * have one value. Constants.
 */
TAVIWIRELESS_API extern const WirelessNameValue gWirelessAuths[WIRELESS_AUTH_NAMES];
TAVIWIRELESS_API extern const WirelessNameValue gWirelessEncrypts[WIRELESS_ENCRYPT_NAMES];
TAVIWIRELESS_API extern const WirelessNameValue gWirelessOpmodes[WIRELESS_OPMODE_NAMES];
TAVIWIRELESS_API extern const WirelessNameValue gWirelessProtocols[WIRELESS_PROTOCOL_NAMES];

/*
 * A name's value in the tables, whatever its case; blanks around it are not skipped. Any other text
 * gives the unknown value, and so does null, with a line in the log. "WPA" and "WPA2" are the
 * personal kinds, the mixed names count as WPA2; "Any" is managed. Protocols that only newer
 * adapters report, such as "11g", have no entry.
 */
TAVIWIRELESS_API int TAVIWirelessAuthParse(const char* text);
TAVIWIRELESS_API int TAVIWirelessEncryptParse(const char* text);
TAVIWIRELESS_API int TAVIWirelessOpmodeParse(const char* text);
TAVIWIRELESS_API int TAVIWirelessProtocolParse(const char* text);

/*
 * A value's one name, a constant: "unknown" for values that have none ("Unknown" of an operation
 * mode). With ccmpNames other than 0 AES is called CCMP, as the supplicant does. Compatible with
 * what was always printed, secondary mode is "Secondeary", which does not parse back.
 */
TAVIWIRELESS_API const char* TAVIWirelessAuthStringGet(int auth);
TAVIWIRELESS_API const char* TAVIWirelessEncryptStringGet(int encrypt, int ccmpNames);
TAVIWIRELESS_API const char* TAVIWirelessOpmodeStringGet(int opmode);
TAVIWIRELESS_API const char* TAVIWirelessProtocolStringGet(int protocol);

/*
 * Parses the address of an access point, six groups of hexadecimal digits with colons between them.
 * The low eight bits of each group count, and what follows the sixth is not looked at. On failure
 * bssid is as it was.
 */
TAVIWIRELESS_API int TAVIWirelessBssidParse(const char* text, unsigned char bssid[6]);
/*
 * Writes the address as "00:1A:2B:3C:4D:5E" into buf, of size bytes; 18 hold all of it, and a
 * smaller buffer gets its beginning. Returns buf, which is as it was when bssid is null.
 */
TAVIWIRELESS_API char* TAVIWirelessBssidStringGet(const unsigned char bssid[6], char* buf,
                                                  size_t size);

/* ---- Records ---- */

/*
 * A place in a circular list: the list's head, or a part of a record that is in the list.
 * Size 8 or 16: next 0, previous 4 or 8.
 */
typedef struct WirelessLink {
    struct WirelessLink* next;
    struct WirelessLink* previous;
} WirelessLink;

/* The record of this type that a link is a part of. */
#define WIRELESS_RECORD(wirelessLink, type) \
    ((type*)(void*)((char*)(wirelessLink)-offsetof(type, link)))

/* Likewise, but null for the head of a list, that is, behind its last member. */
#define WIRELESS_RECORD_OR_NULL(wirelessLink, head, type) \
    ((wirelessLink) == (head) ? NULL : WIRELESS_RECORD(wirelessLink, type))

/*
 * Goes through the records of a list. head is the list's address, type that of its records, record
 * the name of the pointer that the loop declares:
 *   WIRELESS_FOR_EACH(network, &networks, WirelessNetwork)
 *       puts(network->essid);
 * The record must stay in the list while its turn lasts.
 */
#define WIRELESS_FOR_EACH(record, head, type) /* NOLINTNEXTLINE(bugprone-macro-parentheses) */ \
    for (type* record = WIRELESS_RECORD_OR_NULL((head)->next, head, type); (record) != NULL;   \
         (record) = WIRELESS_RECORD_OR_NULL((record)->link.next, head, type))

/*
 * Frees the records of a list and leaves it empty: WIRELESS_FREE_LIST(&networks, WirelessNetwork).
 */
#define WIRELESS_FREE_LIST(head, type) TAVIWirelessListFree(head, offsetof(type, link))

/* What WIRELESS_FREE_LIST calls: linkOffset is that of the link in the records. */
static inline void TAVIWirelessListFree(WirelessLink* head, size_t linkOffset) {
    WirelessLink* member = head->next;
    while (member != head) {
        WirelessLink* next = member->next;
        free((char*)member - linkOffset);
        member = next;
    }
    head->next = head->previous = head;
}

/* Sizes of texts, their zero byte counted: an ESSID has 32 bytes at most. */
enum { WIRELESS_ESSID_SIZE = 33, WIRELESS_KEY_SIZE = 257, WIRELESS_ADDRESS_SIZE = 20 };

/*
 * A network in range, or the network part of a saved one.
 * Size 72 or 80: essid 0, bssid 33, channel 40, signal 44, opmode 48, protocol 52, auth 56,
 * encrypt 60, link 64.
 */
typedef struct WirelessNetwork {
    char essid[WIRELESS_ESSID_SIZE];
    unsigned char bssid[6]; /* the access point's address; all zero: not known */
    int32_t channel;        /* 0: not known */
    int32_t signal;         /* as the scan gives it; percent of the current connection */
    int32_t opmode;         /* WirelessOpmode; 0 from a scan */
    int32_t protocol;       /* WirelessProtocol */
    int32_t auth;           /* WirelessAuth */
    int32_t encrypt;        /* WirelessEncrypt */
    WirelessLink link;      /* in a list of networks */
} WirelessNetwork;

/*
 * A saved network, and what connecting needs to know.
 * Size 668 or 688: key 0, ipAddr 257, netmask 277, gateway 297, accessTime 320, network 324 or 328,
 * link 396 or 408, anyBssid 404 or 424, user 408 or 428.
 */
typedef struct WirelessConf {
    char key[WIRELESS_KEY_SIZE];         /* pass phrase, WEP key or EAP password */
    char ipAddr[WIRELESS_ADDRESS_SIZE];  /* IPv4 address, or exactly "DHCP" */
    char netmask[WIRELESS_ADDRESS_SIZE]; /* "255.255.255.0"; not looked at with DHCP */
    char gateway[WIRELESS_ADDRESS_SIZE]; /* IPv4 address, or empty */
    int32_t accessTime;                  /* of the last saving, seconds since 1970 */
    WirelessNetwork network;
    WirelessLink link;            /* in a list of saved networks */
    int32_t anyBssid;             /* non-zero: any access point of this ESSID will do */
    char user[WIRELESS_KEY_SIZE]; /* EAP identity */
} WirelessConf;

/* Connection status. */
enum {
    WIRELESS_STATUS_OTHER_MODE = 0,    /* a mode that this library does not use */
    WIRELESS_STATUS_NOT_SUPPORTED = 1, /* the model has no Wi-Fi; of TAVIWirelessStatusGet only */
    WIRELESS_STATUS_NO_ADAPTER = 2,
    WIRELESS_STATUS_INTERFACE_DOWN = 3,
    WIRELESS_STATUS_NOT_CONNECTED = 4,
    WIRELESS_STATUS_CONNECTED = 5, /* to an access point */
    WIRELESS_STATUS_ADHOC = 6,
    WIRELESS_STATUS_MASTER = 7 /* or monitor */
};

/* What TAVIWirelessStatusGet fills. Size 76 or 88: status 0, network 4 or 8. */
typedef struct WirelessStatus {
    int32_t status;          /* WIRELESS_STATUS_... */
    WirelessNetwork network; /* of status 5 and 6, else zero */
} WirelessStatus;

/* ---- Interface and adapter ---- */

/* The number of interfaces "/sys/class/net/wlan*"; -1 on error. */
TAVIWIRELESS_API int TAVIWirelessAdapterNum(void);
/*
 * The wireless interface: "wlan0", a constant. The SDK's TAVIWirelessInterfaceGet calls it, and the
 * other functions ask that one.
 */
TAVIWIRELESS_API const char* TAVIWirelessInterfaceGet_core(void);
/*
 * Non-zero when "/etc.defaults/taviinfo.conf" says support_wireless=yes, else 0. The SDK's
 * TAVIWirelessIsSupported calls it.
 */
TAVIWIRELESS_API int TAVIWirelessIsSupported_core(void);
/*
 * Runs the hot-plug script "/usr/tavi/hotplug/usb.wireless.function change-mode" with "ap" (mode 0)
 * or "client" (mode 1). Returns 1 when that worked, else 0.
 */
TAVIWIRELESS_API int TAVIWirelessModeChange(int mode);
/*
 * Adds a default route by the gateway, an IPv4 address as text, through the wireless interface:
 * "/sbin/route add default gw GATEWAY metric 0 dev wlan0". 0 when the tool was run; what it said
 * is not looked at.
 */
TAVIWIRELESS_API int TAVIWirelessDefaultGatewaySet(const char* gateway);

/* ---- Scan ---- */

/*
 * Lists the networks in range into *networks (WirelessNetwork): "/sbin/iwlist wlan0 scanning tavi",
 * the appliance's form of that tool, runs until two runs in a row give the same number of networks,
 * five times at most; what the last gave is taken as it is. Networks that hide their name are left
 * out. Waits up to five seconds for the adapter, brings the interface up, and takes at least a
 * second. With trigger 1 an ordinary scan runs first. On failure the list is empty.
 */
TAVIWIRELESS_API int TAVIWirelessNetworkScan(int trigger, WirelessLink* networks);

/* What TAVIWirelessNetworkGet compares; any other kind takes the first network. */
enum { WIRELESS_KEY_ESSID = 0, WIRELESS_KEY_BSSID = 1 };

/*
 * Scans for one network, by its ESSID (a text, the case counts) or BSSID (six bytes), and once more
 * with trigger 1 when nothing at all was heard. Returns 1 with *out filled, whose link is null; 0
 * when it is not in range; -1 on failure.
 */
TAVIWIRELESS_API int TAVIWirelessNetworkGet(const void* key, int keyKind, WirelessNetwork* out);

/* ---- Connect and disconnect ---- */

/*
 * 1 when the radio may be used, also when there is no such file or section; 0 when the user's
 * setting "unblock=no" of the plugged adapter's section in "/usr/tavi/etc/wireless_ap.conf" forbids
 * it; -1 when that cannot be told: the file or the adapter's product cannot be read, or the section
 * has no such setting.
 */
TAVIWIRELESS_API int TAVIWirelessCheckBlock(void);
/*
 * Joins conf->network. Addresses are set by TAVIWirelessIfconfigSet. An opmode of ad-hoc creates
 * that network instead, as TAVIWirelessAdhocCreate does. conf is not changed.
 *
 * Writes "/usr/tavi/etc/wpa_supplicant.conf" with mode 0600, ends a supplicant that runs
 * ("/usr/sbin/wpa_cli terminate"), starts "/usr/sbin/wpa_supplicant" and asks wpa_cli every second
 * until it is associated, 15 times at most, and then the supplicant is ended; after the first
 * second sooner, when the supplicant tells that it is connected. With anyBssid, or an all zero
 * BSSID, any access point of the ESSID will do. A WEP key has 5 or 13 characters, or 10 or 26
 * hexadecimal digits; another one is left out, with a line in the log.
 *
 * When it is joined, the network is noted in "/var/tmp/.wireless_current_connection" for
 * TAVIWirelessStatusGet, the media service is restarted where "/etc/taviinfo.conf" says that it
 * runs on this interface, and "/etc/resolv.conf" is copied to "/etc/resolv.conf.wireless.bak".
 *
 * Returns 0, also when the radio is blocked or its setting cannot be told: there is nothing to do
 * then. Fails without an adapter, for a kind of authentication that is unknown, for a line break or
 * carriage return in a text that the supplicant would be given (before anything is stopped), and
 * while another caller in any process is connecting, which the file
 * "/var/tmp/.wireless_connecting" tells.
 */
TAVIWIRELESS_API int TAVIWirelessNetworkConnect(WirelessConf* conf);
/*
 * Undoes a connection. The SDK's TAVIWirelessNetworkDisconnect calls it.
 *
 * Takes ESSID and address from the interface ("/sbin/iwconfig", "/sbin/ifconfig"), ends the
 * supplicant, kills the process of "/etc/dhcpc/dhcpcd-wlan0.pid", and puts
 * "/etc/resolv.conf.wireless.bak" back in the place of "/etc/resolv.conf". An ad-hoc network is
 * left by taking the interface down and setting managed mode. The files that tell of a connection
 * are removed. 0 also when there was none.
 */
TAVIWIRELESS_API int TAVIWirelessNetworkDisconnect_core(void);

/* ---- Status ---- */

/* The connection status, WIRELESS_STATUS_...; 0 also when it cannot be told. */
TAVIWIRELESS_API int TAVIWirelessConnStatusGet(void);

/* What TAVIWirelessCurInfoGet tells. */
enum {
    WIRELESS_INFO_ESSID = 0,      /* a text of at most 32 bytes */
    WIRELESS_INFO_PROTOCOL = 1,   /* WirelessProtocol */
    WIRELESS_INFO_KEY_STATE = 2,  /* 1: no key, 2: a WEP key is set */
    WIRELESS_INFO_OPMODE = 3,     /* WirelessOpmode */
    WIRELESS_INFO_CONN_STATUS = 4 /* WIRELESS_STATUS_... */
};
/* Room for any of them. Size 36, both members at 0. */
typedef union WirelessInfo {
    char essid[WIRELESS_ESSID_SIZE];
    int32_t value;
} WirelessInfo;

/*
 * Asks the driver through the wireless extensions (ioctl SIOCGIW...) and fills *out, a
 * WirelessInfo. On failure *out is as it was.
 */
TAVIWIRELESS_API int TAVIWirelessCurInfoGet(int what, void* out);
/* The driver's mode, WirelessOpmode; unknown (7) on any failure, without an adapter too. */
TAVIWIRELESS_API int TAVIWirelessOpmodeGet(void);
/* Sets the driver's mode: ad-hoc (1) or managed (2); others are refused. */
TAVIWIRELESS_API int TAVIWirelessOpmodeSet(int mode);
/*
 * Fills *out and returns it; null for a null argument. The network is what
 * TAVIWirelessNetworkConnect noted, if root or the own user wrote that file, with the signal of now
 * in percent ("/sbin/iwconfig"); in ad-hoc mode what TAVIWirelessAdhocNetworkGet tells. What cannot
 * be told of the network is zero.
 */
TAVIWIRELESS_API WirelessStatus* TAVIWirelessStatusGet(WirelessStatus* out);
/*
 * 1 when the wireless interface is connected to an access point and no other interface but loopback
 * has a link, else 0. Of the others the first 32 are looked at.
 */
TAVIWIRELESS_API int TAVIWirelessIsSingle_core(void);

/* ---- Ad-hoc ---- */

/*
 * Creates or joins the ad-hoc network conf->network, whose opmode is ad-hoc, open or with a WEP key
 * (conf->key: 5 or 13 characters, or 10 or 26 hexadecimal digits). Takes the interface down, sets
 * mode, ESSID and key with "/sbin/iwconfig", and brings it up. Other encryption is refused.
 */
TAVIWIRELESS_API int TAVIWirelessAdhocCreate(const WirelessConf* conf);
/*
 * The ad-hoc network the adapter is in; -1 when it is in another mode. signal is the link quality
 * that iwconfig prints, 70 where the driver measures none. What the driver does not tell is zero.
 */
TAVIWIRELESS_API int TAVIWirelessAdhocNetworkGet(WirelessNetwork* out);

/* ---- Saved networks: "/usr/tavi/etc/wireless.conf" ---- */

/*
 * The network saved under the section name, which is its BSSID in upper case. Keys that the section
 * does not have are empty or 0, and the mode is then unknown (7). Fails when there is no such file
 * or section.
 */
TAVIWIRELESS_API int TAVIWirelessConfGet(const char* section, WirelessConf* conf);
/*
 * Saves the network under its BSSID, with the time of now; conf->accessTime is not looked at. Keys
 * of an earlier saving that are not written now are kept, such as USER, which only a network with
 * EAP has. The file is made with mode 0600, since it holds keys; an existing one keeps its mode. A
 * text with a line break is refused.
 */
TAVIWIRELESS_API int TAVIWirelessConfSet(const WirelessConf* conf);
/*
 * All saved networks (WirelessConf) in the order of the file, or the last used first. What cannot
 * be read is left out. On failure the list holds what was read so far, for the caller to free.
 */
TAVIWIRELESS_API int TAVIWirelessConfEnum(WirelessLink* confs);
TAVIWIRELESS_API int TAVIWirelessConfEnumByAtime(WirelessLink* confs);
/*
 * Connects to the last used saved network that can be joined, and sets its address. Networks that a
 * scan does not find may hide their name: they are tried, too, when their saved security is known. A
 * connection that exists is ended instead, with -1. When nothing could be joined, or its address
 * could not be set, the adapter is disconnected and the result is -1.
 */
TAVIWIRELESS_API int TAVIWirelessAutoConnect(void);

/* ---- Addresses ---- */

/*
 * Gives the interface the address of conf, static or, when conf->ipAddr is "DHCP", by a DHCP client
 * that goes on running. The gateway is not set.
 */
TAVIWIRELESS_API int TAVIWirelessIfconfigSet(const char* interface, const WirelessConf* conf);
/*
 * Copies the gateway that the connection should use into buf, of size bytes: that of the DHCP lease
 * in "/etc/dhcpc/dhcpcd-wlan0.info", empty when the lease has none; or without a DHCP client that
 * of the saved network which the adapter is connected to.
 */
TAVIWIRELESS_API int TAVIWirelessDefaultGatewayConfGet_core(char* buf, size_t size);

/* ---- Access point: hostapd ---- */

/* Security of an access point. */
enum {
    WIRELESS_AP_OPEN = 0,
    WIRELESS_AP_WEP = 1,
    WIRELESS_AP_WPA = 2,           /* personal */
    WIRELESS_AP_WPA_ENTERPRISE = 3 /* not for guests */
};

/* Ciphers of an access point, a set of bits. */
enum { WIRELESS_AP_TKIP = 1, WIRELESS_AP_CCMP = 2 };

/* 802.11 protocols of an access point, a set of bits. */
enum { WIRELESS_AP_A = 1, WIRELESS_AP_B = 2, WIRELESS_AP_G = 4, WIRELESS_AP_N_ONLY = 8 };

enum { WIRELESS_AP_40_MHZ = 2 }; /* the bit of htFlags that allows channels of 40 MHz */

/* Sizes of texts, their zero byte counted. */
enum { WIRELESS_AP_SSID_SIZE = 128, WIRELESS_AP_PASSPHRASE_SIZE = 256 };

/*
 * What a security kind needs; the kind says which member holds.
 * Size 288, wepKey, wpa and enterprise at 0. wpa: wpaVersion 0, passphrase 4, cipher 260.
 * enterprise: wpaVersion 0, cipher 4, radiusAddr 8, radiusPort 28, radiusSecret 32.
 */
typedef union WirelessAPSecret {
    char wepKey[27]; /* 5 or 13 characters, or 10 or 26 hexadecimal digits */
    struct {
        int32_t wpaVersion; /* of hostapd's key "wpa": 1 WPA, 2 WPA2, 3 both */
        char passphrase[WIRELESS_AP_PASSPHRASE_SIZE];
        int32_t cipher; /* WIRELESS_AP_TKIP, WIRELESS_AP_CCMP or both */
    } wpa;
    struct {
        int32_t wpaVersion;
        int32_t cipher;
        char radiusAddr[WIRELESS_ADDRESS_SIZE]; /* of the RADIUS server, which knows the users */
        int32_t radiusPort;
        char radiusSecret[WIRELESS_AP_PASSPHRASE_SIZE];
    } enterprise;
} WirelessAPSecret;

/*
 * What hostapd is to serve: the main network, and on some models a second one for guests.
 * Size 1028: ssid 0, bridge 128, hidden 144, band 148, ieee80211n 152, htFlags 156, channel 160,
 * maxStations 164, wmm 168, security 172, secret 176, guestEnabled 464, guestSsid 468,
 * guestBssid 596, guestHidden 724, guestMaxStations 728, guestIsolate 732, guestSecurity 736,
 * guestSecret 740.
 */
typedef struct WirelessAPConf {
    char ssid[WIRELESS_AP_SSID_SIZE];
    char bridge[16];     /* interface that the access point joins */
    int32_t hidden;      /* hostapd's ignore_broadcast_ssid: 0 shows the name */
    int32_t band;        /* WIRELESS_AP_A ... */
    int32_t ieee80211n;  /* written when positive */
    int32_t htFlags;     /* WIRELESS_AP_40_MHZ; the other bits mean nothing here */
    int32_t channel;     /* 0: hostapd chooses, where the driver lets it */
    int32_t maxStations; /* written when positive */
    int32_t wmm;         /* on when positive */
    int32_t security;    /* WIRELESS_AP_OPEN ... */
    WirelessAPSecret secret;
    int32_t guestEnabled; /* non-zero: guests are served */
    char guestSsid[WIRELESS_AP_SSID_SIZE];
    char guestBssid[128]; /* as text */
    int32_t guestHidden;
    int32_t guestMaxStations; /* written when positive */
    int32_t guestIsolate;     /* non-zero: guests do not reach each other */
    int32_t guestSecurity;
    WirelessAPSecret guestSecret;
} WirelessAPConf;

/*
 * Ends the hostapd that serves the interface, takes the interface down, and writes
 * "/etc/hostapd/hostapd-" and the interface and "-host.conf"; on models with
 * support_pci_wifi=yes in "/etc.defaults/taviinfo.conf" also "-guest.conf" and "-guest.info". The
 * files hold keys and have mode 0600. Starts nothing. Returns 1, or 0 on failure: a file that could
 * not be written whole is removed. A text with a line break is refused before anything is stopped.
 */
TAVIWIRELESS_API int TAVIWirelessSetHostAPConf(const char* interface, const WirelessAPConf* conf);

/* ---- Access point: stored settings, "/usr/tavi/etc/wireless_ap.conf" ---- */

enum { WIRELESS_AP_SCHEDULE_SIZE = 169 }; /* a character per hour of a week, '1' is on */

/*
 * The settings of one adapter; the file's keys are in quotes where they are not clear.
 * Size 1440: enabled 0, txPower 4, name 8, ap 40, unblock 1068, schedule 1072,
 * scheduleEnabled 1244, guestSchedule 1248, guestScheduleEnabled 1420, guestLanBlock 1424,
 * guestAccessServer 1428, guestInternetBlock 1432, guestAllowHttp 1436.
 */
typedef struct WirelessAPSettings {
    int32_t enabled; /* "enable": non-zero when the access point is switched on */
    int32_t txPower; /* stored only */
    char name[32];   /* of the section: the adapter's product */
    WirelessAPConf ap;
    int32_t unblock; /* 0: the user forbids the radio, see TAVIWirelessCheckBlock */
    /* What follows is stored for other parts of the system; nothing here acts on it. */
    char schedule[WIRELESS_AP_SCHEDULE_SIZE];
    int32_t scheduleEnabled;
    char guestSchedule[WIRELESS_AP_SCHEDULE_SIZE];
    int32_t guestScheduleEnabled;
    int32_t guestLanBlock;     /* "guest_net_lan_block" */
    int32_t guestAccessServer; /* "guest_net_access_hb" */
    int32_t guestInternetBlock;
    int32_t guestAllowHttp;
} WirelessAPSettings;

/*
 * Copies the plugged adapter's product, the key PRODUCT of "/tmp/wireless.info", into buf, of size
 * bytes. Returns 1, or 0 when there is none.
 */
TAVIWIRELESS_API int TAVIWirelessApConfigSecNameGet(char* buf, size_t size);
/*
 * Fills *settings with what is stored under the section name, and with defaults for the rest.
 * Returns a positive number when the section was read; 0 with the defaults when there is no file;
 * what the SDK says, 0 or below, when there is no such section; -1 for bad arguments, and when the
 * file cannot be looked at.
 */
TAVIWIRELESS_API int TAVIWirelessGetAPConfig(const char* section, WirelessAPSettings* settings);
/*
 * Stores the settings under settings->name. With enabled 0 only that is stored, and everything else
 * stays as it is in the file. The file is made with mode 0600, since it holds keys; an existing one
 * keeps its mode. Returns 1, or 0 on failure with the settings as they were: also for a kind of
 * security that does not exist, enterprise security for guests, and a text with a line break.
 */
TAVIWIRELESS_API int TAVIWirelessSetAPConfig(const WirelessAPSettings* settings);

/* ---- Access point: on and off ---- */

/*
 * Switches the access point on with the stored settings. In this order:
 *   hostapd's files, by TAVIWirelessSetHostAPConf
 *   "/etc/hostapd/hostapd-wlan0.info", with enable=yes
 *   the bridge's "/etc/sysconfig/network-scripts/ifcfg-BRIDGE"; where there is none, "lbr0" gets
 *     10.1.14.1/255.255.255.0 and the adapter, any other bridge "eth0"
 *   for a bridge with an address of its own "/etc/dhcpd/dhcpd-BRIDGE-BRIDGE.info": the service that
 *     is there when it fits the bridge's subnet, else one for all addresses behind the bridge's own
 *   the adapter's "ifcfg-wlan0"
 *   a wait of up to five seconds until "iwlist wlan0 active_channel" lists a channel
 *   "/etc/rc.network restart wlan0 BRIDGE", which makes all of that happen
 *
 * Returns 1; 0 on failure, when the settings say that it is off, and while another caller in any
 * process is enabling, which the file "/var/tmp/.wireless_ap_connecting" tells. What was written
 * before a failure stays. A bridge that can be none (no name of an interface, the adapter itself,
 * "eth0", the guests' "gbr" and "gwlan", or an interface that is there and no bridge) is refused
 * before anything is written.
 */
TAVIWIRELESS_API int TAVIWirelessAPEnable(void);
/*
 * Switches the access point off: removes "/etc/hostapd/hostapd-wlan0.info", takes the interface out
 * of its bridge, which is switched off too when nothing else is in it, puts the bridge's DHCP
 * service aside (".info.manual") until the next enabling, and runs "/etc/rc.network restart". The
 * stored settings stay as they are. Returns 1, or 0 on failure, also when the adapter has no
 * "ifcfg-wlan0".
 */
TAVIWIRELESS_API int TAVIWirelessAPDisable(void);
/* The interface of the access point: "wlan0", a constant. */
TAVIWIRELESS_API const char* TAVIWirelessAPInterfaceGet(void);
/*
 * Whether an access point is being switched on, here or by another process: 1 or 0. What others
 * than root and the own user put in the flag's place does not count.
 */
TAVIWIRELESS_API int TAVIWirelessAPIsConnecting(void);
/*
 * Whether there is anything of the flag's name, "/var/tmp/.wireless_ap_connecting", as the SDK's
 * VEXACFileExist tells it: non-zero or 0. TAVIWirelessAPIsConnecting is the stricter question.
 */
TAVIWIRELESS_API int TAVIWirelessTestAPMode(void);
/* 1 when an adapter is present and "/tmp/wireless.info" says AP_SUPPORT=yes, else 0. */
TAVIWIRELESS_API int TAVIWirelessAPIsSupported(void);

#ifdef __cplusplus
}
#endif

#endif
