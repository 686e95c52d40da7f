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
 * - Records are plain and may be zeroed with memset. Texts in them end in a zero byte.
 * - Lists are circular queues of links, as insque() knows them. The caller owns the head, which the
 *   functions make empty first, and the members: unlink each and free() it. Members are records of
 *   which `link` is a part; WIRELESS_RECORD gives the record.
 * - They wait with sleep(), block while tools run, and must not be called from two threads at once.
 */
#ifndef TAVIWIRELESS_WIRELESS_H
#define TAVIWIRELESS_WIRELESS_H

#include <stddef.h>
#include <stdint.h>
#include <taviwireless/export.h>

#ifdef __cplusplus
extern "C" {
#endif

/* ---- Vocabulary ---- */

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

/* A set of bits. */
typedef enum WirelessEncrypt {
    WIRELESS_ENCRYPT_UNKNOWN = 0,
    WIRELESS_ENCRYPT_NONE = 1,
    WIRELESS_ENCRYPT_WEP = 2,
    WIRELESS_ENCRYPT_TKIP = 4,
    WIRELESS_ENCRYPT_AES = 8, /* CCMP */
    WIRELESS_ENCRYPT_TKIP_AES = 12
} WirelessEncrypt;

/* Numbered as the IW_MODE_ constants of the wireless extensions. */
typedef enum WirelessOpmode {
    WIRELESS_OPMODE_AUTO = 0,
    WIRELESS_OPMODE_ADHOC = 1,
    WIRELESS_OPMODE_MANAGED = 2,
    WIRELESS_OPMODE_MASTER = 3,
    WIRELESS_OPMODE_REPEATER = 4,
    WIRELESS_OPMODE_SECONDARY = 5,
    WIRELESS_OPMODE_MONITOR = 6,
    WIRELESS_OPMODE_UNKNOWN = 7
} WirelessOpmode;

/* Sets of 802.11 protocols. */
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

typedef struct WirelessNameValue {
    const char* name;
    int32_t value;
} WirelessNameValue;

enum {
    WIRELESS_AUTH_NAMES = 19,
    WIRELESS_ENCRYPT_NAMES = 7,
    WIRELESS_OPMODE_NAMES = 13,
    WIRELESS_PROTOCOL_NAMES = 17
};

/* The names that are understood, several of which may mean the same. */
TAVIWIRELESS_API extern const WirelessNameValue gWirelessAuths[WIRELESS_AUTH_NAMES];
TAVIWIRELESS_API extern const WirelessNameValue gWirelessEncrypts[WIRELESS_ENCRYPT_NAMES];
TAVIWIRELESS_API extern const WirelessNameValue gWirelessOpmodes[WIRELESS_OPMODE_NAMES];
TAVIWIRELESS_API extern const WirelessNameValue gWirelessProtocols[WIRELESS_PROTOCOL_NAMES];

/*
 * A name's value, whatever its case; blanks around it are not skipped. Any other text, and null,
 * gives the unknown value. "WPA" and "WPA2" are the personal kinds; "Any" is managed.
 */
TAVIWIRELESS_API int TAVIWirelessAuthParse(const char* text);
TAVIWIRELESS_API int TAVIWirelessEncryptParse(const char* text);
TAVIWIRELESS_API int TAVIWirelessOpmodeParse(const char* text);
TAVIWIRELESS_API int TAVIWirelessProtocolParse(const char* text);

/*
 * A value's one name, a constant: "unknown" for values that have none ("Unknown" of an operation
 * mode). With ccmpNames AES is called CCMP, as the supplicant does.
 */
TAVIWIRELESS_API const char* TAVIWirelessAuthStringGet(int auth);
TAVIWIRELESS_API const char* TAVIWirelessEncryptStringGet(int encrypt, int ccmpNames);
TAVIWIRELESS_API const char* TAVIWirelessOpmodeStringGet(int opmode);
TAVIWIRELESS_API const char* TAVIWirelessProtocolStringGet(int protocol);

/*
 * The address of an access point, six groups of hexadecimal digits with colons between them. The
 * low eight bits of each group count, and what follows the sixth is not looked at. On failure bssid
 * is as it was.
 */
TAVIWIRELESS_API int TAVIWirelessBssidParse(const char* text, unsigned char bssid[6]);
/* Writes the address in upper case into buf, of size bytes (18 hold all of it). Returns buf. */
TAVIWIRELESS_API char* TAVIWirelessBssidStringGet(const unsigned char bssid[6], char* buf,
                                                  size_t size);

/* ---- Records ---- */

typedef struct WirelessLink {
    struct WirelessLink* next;
    struct WirelessLink* previous;
} WirelessLink;

/* The record of this type that a link is a part of. */
#define WIRELESS_RECORD(wirelessLink, type) \
    ((type*)(void*)((char*)(wirelessLink)-offsetof(type, link)))

enum { WIRELESS_ESSID_SIZE = 33, WIRELESS_KEY_SIZE = 257, WIRELESS_ADDRESS_SIZE = 20 };

/* A network in range, or the network part of a saved one. */
typedef struct WirelessNetwork {
    char essid[WIRELESS_ESSID_SIZE];
    unsigned char bssid[6];
    int32_t channel;
    int32_t signal; /* as the scan gives it; percent of the current connection */
    int32_t opmode; /* WirelessOpmode; 0 from a scan */
    int32_t protocol;
    int32_t auth;
    int32_t encrypt;
    WirelessLink link; /* in a list of networks */
} WirelessNetwork;

/* A saved network, and what connecting needs to know. */
typedef struct WirelessConf {
    char key[WIRELESS_KEY_SIZE];        /* pass phrase, WEP key or EAP password */
    char ipAddr[WIRELESS_ADDRESS_SIZE]; /* IPv4 address, or exactly "DHCP" */
    char netmask[WIRELESS_ADDRESS_SIZE];
    char gateway[WIRELESS_ADDRESS_SIZE];
    int32_t accessTime; /* of the last saving, seconds since 1970 */
    WirelessNetwork network;
    WirelessLink link;            /* in a list of saved networks */
    int32_t anyBssid;             /* non-zero: any access point of this ESSID will do */
    char user[WIRELESS_KEY_SIZE]; /* EAP identity */
} WirelessConf;

/* Connection status. */
enum {
    WIRELESS_STATUS_OTHER_MODE = 0, /* a mode that this library does not use */
    WIRELESS_STATUS_NOT_SUPPORTED = 1,
    WIRELESS_STATUS_NO_ADAPTER = 2,
    WIRELESS_STATUS_INTERFACE_DOWN = 3,
    WIRELESS_STATUS_NOT_CONNECTED = 4,
    WIRELESS_STATUS_CONNECTED = 5, /* to an access point */
    WIRELESS_STATUS_ADHOC = 6,
    WIRELESS_STATUS_MASTER = 7 /* or monitor */
};

typedef struct WirelessStatus {
    int32_t status;
    WirelessNetwork network; /* of status 5 and 6, else zero */
} WirelessStatus;

/* ---- Interface and adapter ---- */

/* The number of interfaces "/sys/class/net/wlan*"; -1 on error. */
TAVIWIRELESS_API int TAVIWirelessAdapterNum(void);
/* "wlan0", a constant. The SDK's TAVIWirelessInterfaceGet calls it. */
TAVIWIRELESS_API const char* TAVIWirelessInterfaceGet_core(void);
/* Non-zero when "/etc.defaults/taviinfo.conf" says support_wireless=yes. */
TAVIWIRELESS_API int TAVIWirelessIsSupported_core(void);
/*
 * Runs the hot-plug script "/usr/tavi/hotplug/usb.wireless.function change-mode" with "ap" (mode 0)
 * or "client" (mode 1). Returns 1 when that worked, else 0.
 */
TAVIWIRELESS_API int TAVIWirelessModeChange(int mode);
/* Adds the default route through the wireless interface, with "/sbin/route". */
TAVIWIRELESS_API int TAVIWirelessDefaultGatewaySet(const char* gateway);

/* ---- Scan ---- */

/*
 * Lists the networks in range into *networks (WirelessNetwork): "/sbin/iwlist wlan0 scanning tavi"
 * until two runs in a row give the same number, five times at most; what the last gave is taken as
 * it is. Waits up to five seconds for the adapter, brings the interface up, and takes at least a
 * second. With trigger 1 an ordinary scan runs first. On failure the list is empty.
 */
TAVIWIRELESS_API int TAVIWirelessNetworkScan(int trigger, WirelessLink* networks);

/* What TAVIWirelessNetworkGet compares; any other kind takes the first network. */
enum { WIRELESS_KEY_ESSID = 0, WIRELESS_KEY_BSSID = 1 };

/*
 * Scans for one network, by its ESSID (a text, the case counts) or BSSID (six bytes). Returns 1
 * with *out filled, link included, which leads nowhere; 0 when it is not in range; -1 on failure.
 */
TAVIWIRELESS_API int TAVIWirelessNetworkGet(const void* key, int keyKind, WirelessNetwork* out);

/* ---- Connect and disconnect ---- */

/*
 * 1 when the radio may be used, 0 when the user's setting "unblock=no" of the plugged adapter's
 * section in "/usr/tavi/etc/wireless_ap.conf" forbids it, -1 when that cannot be told, also because
 * the file cannot be read.
 */
TAVIWIRELESS_API int TAVIWirelessCheckBlock(void);
/*
 * Joins conf->network: writes "/usr/tavi/etc/wpa_supplicant.conf", starts wpa_supplicant and waits
 * up to 15 seconds until it is associated. Addresses are set by TAVIWirelessIfconfigSet. An opmode
 * of ad-hoc creates that network instead. Returns 0 also when the radio is blocked: there is
 * nothing to do then. While it runs, a second caller fails. A line break, which a carriage return
 * is, too, in a text that the supplicant would be given fails before it is stopped.
 */
TAVIWIRELESS_API int TAVIWirelessNetworkConnect(WirelessConf* conf);
/*
 * Undoes a connection: association, address, supplicant, DHCP client, and the resolver file gets
 * its contents from before. 0 also when there was none. The SDK's TAVIWirelessNetworkDisconnect
 * calls it.
 */
TAVIWIRELESS_API int TAVIWirelessNetworkDisconnect_core(void);

/* ---- Status ---- */

/* The connection status; 0 also when it cannot be told. */
TAVIWIRELESS_API int TAVIWirelessConnStatusGet(void);

/* What TAVIWirelessCurInfoGet tells. */
enum {
    WIRELESS_INFO_ESSID = 0,      /* a text of at most 32 bytes */
    WIRELESS_INFO_PROTOCOL = 1,   /* WirelessProtocol */
    WIRELESS_INFO_KEY_STATE = 2,  /* 1: no key, 2: a WEP key is set */
    WIRELESS_INFO_OPMODE = 3,     /* WirelessOpmode */
    WIRELESS_INFO_CONN_STATUS = 4 /* WIRELESS_STATUS_... */
};
/* Room for any of them. */
typedef union WirelessInfo {
    char essid[WIRELESS_ESSID_SIZE];
    int32_t value;
} WirelessInfo;

/* Asks the driver and fills *out, a WirelessInfo. */
TAVIWIRELESS_API int TAVIWirelessCurInfoGet(int what, void* out);
/* The driver's mode; unknown (7) on any failure. */
TAVIWIRELESS_API int TAVIWirelessOpmodeGet(void);
/* Ad-hoc (1) or managed (2); others are refused. */
TAVIWIRELESS_API int TAVIWirelessOpmodeSet(int mode);
/* Fills *out and returns it. What cannot be told of the network is zero. */
TAVIWIRELESS_API WirelessStatus* TAVIWirelessStatusGet(WirelessStatus* out);
/* 1 when the wireless interface is connected and no other one is, else 0. */
TAVIWIRELESS_API int TAVIWirelessIsSingle_core(void);

/* ---- Ad-hoc ---- */

/* Creates or joins the ad-hoc network conf->network, open or with a WEP key (conf->key). */
TAVIWIRELESS_API int TAVIWirelessAdhocCreate(const WirelessConf* conf);
/* The ad-hoc network the adapter is in; -1 when it is in another mode. */
TAVIWIRELESS_API int TAVIWirelessAdhocNetworkGet(WirelessNetwork* out);

/* ---- Saved networks: "/usr/tavi/etc/wireless.conf" ---- */

/*
 * The network saved under the section name, which is its BSSID in upper case. Keys that the section
 * does not have are empty or 0.
 */
TAVIWIRELESS_API int TAVIWirelessConfGet(const char* section, WirelessConf* conf);
/*
 * Saves the network under its BSSID, with the time of now. Keys of an earlier saving that are not
 * written now are kept.
 */
TAVIWIRELESS_API int TAVIWirelessConfSet(const WirelessConf* conf);
/* All saved networks (WirelessConf) in the order of the file, or the last used first. */
TAVIWIRELESS_API int TAVIWirelessConfEnum(WirelessLink* confs);
TAVIWIRELESS_API int TAVIWirelessConfEnumByAtime(WirelessLink* confs);
/*
 * Connects to the last used saved network that can be joined, and sets its address. A connection
 * that exists is ended instead, with -1. When nothing could be joined the adapter is disconnected.
 */
TAVIWIRELESS_API int TAVIWirelessAutoConnect(void);

/* ---- Addresses ---- */

/* Gives the interface the address of conf, static or by DHCP. The gateway is not set. */
TAVIWIRELESS_API int TAVIWirelessIfconfigSet(const char* interface, const WirelessConf* conf);
/*
 * Copies the gateway that the connection should use into buf, of size bytes: that of the DHCP
 * lease, or that of the saved network.
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

enum { WIRELESS_AP_SSID_SIZE = 128, WIRELESS_AP_PASSPHRASE_SIZE = 256 };

/* What a security kind needs; the kind says which member holds. */
typedef union WirelessAPSecret {
    char wepKey[27]; /* 5 or 13 characters, or 10 or 26 hexadecimal digits */
    struct {
        int32_t wpaVersion; /* of hostapd's key "wpa": 1 WPA, 2 WPA2, 3 both */
        char passphrase[WIRELESS_AP_PASSPHRASE_SIZE];
        int32_t cipher;
    } wpa;
    struct {
        int32_t wpaVersion;
        int32_t cipher;
        char radiusAddr[WIRELESS_ADDRESS_SIZE];
        int32_t radiusPort;
        char radiusSecret[WIRELESS_AP_PASSPHRASE_SIZE];
    } enterprise;
} WirelessAPSecret;

typedef struct WirelessAPConf {
    char ssid[WIRELESS_AP_SSID_SIZE];
    char bridge[16];    /* interface that the access point joins */
    int32_t hidden;     /* hostapd's ignore_broadcast_ssid: 0 shows the name */
    int32_t band;       /* WIRELESS_AP_A ... */
    int32_t ieee80211n; /* written when positive */
    int32_t htFlags;
    int32_t channel;
    int32_t maxStations; /* written when positive */
    int32_t wmm;         /* on when positive */
    int32_t security;
    WirelessAPSecret secret;
    int32_t guestEnabled;
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
 * files hold keys and have mode 0600. Returns 1, or 0 on failure.
 */
TAVIWIRELESS_API int TAVIWirelessSetHostAPConf(const char* interface, const WirelessAPConf* conf);

/* ---- Access point: stored settings, "/usr/tavi/etc/wireless_ap.conf" ---- */

enum { WIRELESS_AP_SCHEDULE_SIZE = 169 }; /* a character per hour of a week, '1' is on */

typedef struct WirelessAPSettings {
    int32_t enabled;
    int32_t txPower;
    char name[32]; /* of the section: the adapter's product */
    WirelessAPConf ap;
    int32_t unblock; /* 0: the user forbids the radio, see TAVIWirelessCheckBlock */
    char schedule[WIRELESS_AP_SCHEDULE_SIZE];
    int32_t scheduleEnabled;
    char guestSchedule[WIRELESS_AP_SCHEDULE_SIZE];
    int32_t guestScheduleEnabled;
    int32_t guestLanBlock;
    int32_t guestAccessServer;
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
 * stays as it is in the file. Returns 1, or 0 on failure, also of memory, with the file as it was.
 */
TAVIWIRELESS_API int TAVIWirelessSetAPConfig(const WirelessAPSettings* settings);

/* ---- Access point: on and off ---- */

/*
 * Switches the access point on with the stored settings: hostapd's files, the bridge with its
 * address and DHCP service, the interface's file, and "/etc/rc.network restart" with the interface
 * and the bridge. Waits up to five seconds for the adapter's channels. Returns 1; 0 on failure,
 * when the settings say that it is off, and while another caller does the same. What was written
 * before a failure stays; but a bridge that can be none (no name of an interface, the adapter
 * itself, "eth0", the guests' "gbr" and "gwlan", or an interface that is there and no bridge) is
 * refused before anything is written.
 */
TAVIWIRELESS_API int TAVIWirelessAPEnable(void);
/*
 * Takes the interface out of its bridge, puts the bridge's DHCP service aside and restarts the
 * network. Returns 1, or 0 on failure.
 */
TAVIWIRELESS_API int TAVIWirelessAPDisable(void);
/* "wlan0", a constant. */
TAVIWIRELESS_API const char* TAVIWirelessAPInterfaceGet(void);
/*
 * Whether an access point is being switched on, here or by another process: 1 or 0. What others
 * than root and the own user put in the flag's place does not count.
 */
TAVIWIRELESS_API int TAVIWirelessAPIsConnecting(void);
/* Whether there is a file of the flag's name, as the SDK tells it: non-zero or 0. */
TAVIWIRELESS_API int TAVIWirelessTestAPMode(void);
/* 1 when an adapter is present and "/tmp/wireless.info" says AP_SUPPORT=yes, else 0. */
TAVIWIRELESS_API int TAVIWirelessAPIsSupported(void);

#ifdef __cplusplus
}
#endif

#endif
