# shellcheck shell=bash
# Simulated radios, and what is at the other end; sourced by the tests of the Wi-Fi half. wlan0 is the product's;
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
