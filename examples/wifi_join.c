/* SPDX-License-Identifier: MIT */
/*
 * Lists the Wi-Fi networks in range. Given the name of one, joins it, takes an address by DHCP, and
 * remembers the network:
 *   wifi_join [NAME]    # as root; reads the key from standard input
 *
 *   gcc wifi_join.c -o wifi_join $(pkg-config --cflags --libs taviwireless-wifi)
 */
#include <stdio.h>
#include <string.h>
#include <taviwireless/wireless.h>

static int Fail(const char* what) {
    fprintf(stderr, "wifi_join: %s; the system log tells why\n", what);
    return 1;
}

/* Asks for what joining needs to know. Returns 0 when there is no key to read. */
static int Describe(const WirelessNetwork* network, WirelessConf* conf) {
    memset(conf, 0, sizeof *conf);
    conf->network = *network;
    conf->network.opmode = WIRELESS_OPMODE_MANAGED;
    conf->anyBssid = 1;
    strcpy(conf->ipAddr, "DHCP");
    if (network->encrypt == WIRELESS_ENCRYPT_NONE) {
        return 1;
    }
    fprintf(stderr, "Key of %s: ", network->essid);
    if (fgets(conf->key, sizeof conf->key, stdin) == NULL) {
        return 0;
    }
    conf->key[strcspn(conf->key, "\n")] = '\0';
    return 1;
}

/* Only the connection that is the machine's one way out gets the default route. */
static int TakeGateway(void) {
    char gateway[WIRELESS_ADDRESS_SIZE];
    if (TAVIWirelessIsSingle_core() != 1 ||
        TAVIWirelessDefaultGatewayConfGet_core(gateway, sizeof gateway) != 0 ||
        gateway[0] == '\0') {
        return 0;
    }
    return TAVIWirelessDefaultGatewaySet(gateway);
}

static int Join(const WirelessNetwork* network) {
    WirelessConf conf;
    if (TAVIWirelessCheckBlock() != 1) {
        return Fail("the radio may not be used"); /* connecting would do nothing, and succeed */
    }
    if (!Describe(network, &conf)) {
        fprintf(stderr, "wifi_join: there is no key on standard input\n");
        return 1;
    }
    TAVIWirelessNetworkDisconnect_core();
    if (TAVIWirelessNetworkConnect(&conf) != 0) {
        TAVIWirelessNetworkDisconnect_core();
        return Fail("cannot join the network: the key may be wrong");
    }
    if (TAVIWirelessIfconfigSet(TAVIWirelessInterfaceGet_core(), &conf) != 0) {
        TAVIWirelessNetworkDisconnect_core();
        return Fail("joined the network, but got no address");
    }
    if (TakeGateway() != 0) {
        return Fail("connected, but cannot set the gateway");
    }
    printf("connected to %s\n", conf.network.essid);
    return TAVIWirelessConfSet(&conf) == 0 ? 0 : Fail("cannot remember the network");
}

static void Print(const WirelessNetwork* network) {
    printf("%-32s  channel %3d  signal %3d  %s\n", network->essid, network->channel,
           network->signal, TAVIWirelessAuthStringGet(network->auth));
}

int main(int count, char** arguments) {
    const char* name = count > 1 ? arguments[1] : NULL;
    int status = name == NULL ? 0 : -1;
    WirelessLink networks;
    if (TAVIWirelessNetworkScan(0, &networks) != 0) {
        return Fail("cannot scan");
    }
    WIRELESS_FOR_EACH(network, &networks, WirelessNetwork) {
        if (name == NULL) {
            Print(network);
        } else if (strcmp(network->essid, name) == 0) {
            status = Join(network);
            break;
        }
    }
    WIRELESS_FREE_LIST(&networks, WirelessNetwork);
    if (status == -1) {
        fprintf(stderr, "wifi_join: %s is not in range\n", name);
        status = 1;
    }
    return status;
}
