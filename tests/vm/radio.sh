# SPDX-License-Identifier: MIT
# shellcheck shell=bash
# Simulated radios, and what is at the other end; sourced by the tests that use Wi-Fi. wlan0 is the product's;
# the other radios are in a network namespace of their own, the "air", so that what goes to them does go by radio.

in_air() {
    ip netns exec air "$@"
}

# configure_ap INTERFACE NETWORK CHANNEL [LINE...]
configure_ap() {
    printf '%s\n' "interface=$1" driver=nl80211 hw_mode=g ctrl_interface=/run/hostapd "ssid=$2" "channel=$3" \
        "${@:4}" >"/run/$1.conf"
}

# plug_radios NUMBER: wlan0 and the others.
plug_radios() {
    modprobe mac80211_hwsim "radios=$1"
    ip netns add air
    in_air ip link set lo up
    for ((n = 1; n < $1; n++)); do
        iw phy "$(cat "/sys/class/net/wlan$n/phy80211/name")" set netns name air
    done
}

start_ap() {
    in_air hostapd -B -P "/run/hostapd-$1.pid" "/run/$1.conf"
    wait_for 10 is_beaconing "$1"
}
is_beaconing() {
    in_air hostapd_cli -p /run/hostapd -i "$1" status | grep -qx state=ENABLED
}
stop_ap() {
    kill "$(cat "/run/hostapd-$1.pid")"
    wait_for 10 test ! -e "/run/hostapd-$1.pid"
}

# join NETWORK KEY: what a station does at home.
join() {
    leave
    printf '%s\n' ctrl_interface=/run/station "network={" "ssid=\"$1\"" "psk=\"$2\"" scan_ssid=1 "}" >/run/station.conf
    in_air wpa_supplicant -B -Dnl80211 -iwlan1 -c/run/station.conf -P/run/station.pid
    wait_for 30 has_joined
}
has_joined() {
    in_air wpa_cli -p /run/station -i wlan1 status | grep -qx wpa_state=COMPLETED
}

# Everything that the station has of the access point, if it has something.
leave() {
    [ ! -e /run/station.pid ] || kill "$(cat /run/station.pid)"
    wait_for 5 test ! -e /run/station.pid
    in_air ip addr flush dev wlan1
}

# Prints the lease in words: "ip=10.1.14.2 ...".
lease() {
    cat >/run/station.script <<'END'
#!/bin/sh
[ "$1" = bound ] || exit 0
ip addr replace "$ip/$mask" dev "$interface"
echo "ip=$ip mask=$mask router=$router dns=$dns" >/run/station.lease
END
    chmod +x /run/station.script
    rm -f /run/station.lease
    in_air udhcpc -i wlan1 -n -q -f -t 15 -T 2 -s /run/station.script >&2
    cat /run/station.lease
}
