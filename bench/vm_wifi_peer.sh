#!/bin/bash
# SPDX-License-Identifier: MIT
# What scripts/test-vm wifi_peer runs, on simulated radios: how long it takes to join a network and to switch an access
# point on, and how long the same wpa_supplicant and hostapd take by themselves with the files that were written for them.
# Each row is one figure, "NAME VALUE UNIT", of the medians of so many turns.
turns=5
# shellcheck source=tests/vm/common.sh
. "$(dirname "$0")/../tests/vm/common.sh"
# shellcheck source=tests/vm/radio.sh
. "$(dirname "$0")/../tests/vm/radio.sh"

results=/run/wifi_peer

# note NAME START: that it took from then until now.
note() {
    awk "BEGIN { print $EPOCHREALTIME - $2 }" >>"$results/$1"
}

# take NAME COMMAND...
take() {
    local name=$1 start=$EPOCHREALTIME
    shift
    "$@"
    note "$name" "$start"
}

median() { # NAME
    sort -g "$results/$1" | awk '{ all[NR] = $1 } END { print all[int((NR + 1) / 2)] }'
}

set_up() {
    mkdir -p $results
    mkfifo $results/output
    plug_radios 2
    configure_ap wlan1 "My Net" 6 ieee80211n=1 wmm_enabled=1 wpa=2 wpa_passphrase=secret123 wpa_key_mgmt=WPA-PSK \
        rsn_pairwise=CCMP
    start_ap wlan1
    in_air ip addr add 10.9.1.1/24 dev wlan1
    /usr/tavi/hotplug/usb.plug
    taviwireless ap set ssid="My Home" security=wpa2 key channel=6 <<<"correct horse"
    # With the address set there is nothing but the join to wait for.
    taviwireless wifi connect "My Net" --static 10.9.1.20/24 <<<secret123
    cp /usr/tavi/etc/wpa_supplicant.conf /run/supplicant.conf
    taviwireless wifi disconnect
    wait_for 5 ended wpa_supplicant
}

# says NAME TEXT COMMAND...: how long the program takes until a line of its output holds the text. It is ended then.
says() {
    local name=$1 text=$2 start=$EPOCHREALTIME line program
    "${@:3}" >$results/output 2>&1 &
    program=$!
    while read -r line; do
        [[ $line != *$text* ]] || break
    done <$results/output
    note "$name" "$start"
    kill $program
    wait $program || true
    ip link set wlan0 down
}

changed() { # FILE: when
    stat -c %.Y "$1"
}

# What the command takes to the end, and the join, which is in it: from the file for the supplicant to the note that it
# is connected.
we_join() {
    take connect taviwireless wifi connect "My Net" </dev/null
    awk "BEGIN { print $(changed /var/tmp/.wireless_current_connection) - $(changed /usr/tavi/etc/wpa_supplicant.conf) }" \
        >>$results/join
    taviwireless wifi disconnect
    wait_for 5 ended wpa_supplicant
    ip link set wlan0 down
}

measures_joining() {
    for ((i = 0; i < turns; i++)); do
        says supplicant CTRL-EVENT-CONNECTED wpa_supplicant -Dwext -iwlan0 -c/run/supplicant.conf
        we_join
    done
}

measures_access_point() {
    taviwireless ap enable
    grep -v ^bridge= /run/hostapd-wlan0.conf >/run/alone.conf
    taviwireless ap disable
    for ((i = 0; i < turns; i++)); do
        says hostapd AP-ENABLED hostapd /run/alone.conf
        take enable taviwireless ap enable
        take disable taviwireless ap disable
    done
}

row() { # NAME
    printf '%s %s s\n' "$1" "$(median "$1")"
}

mkdir -p /etc.defaults
echo support_wireless=yes >/etc.defaults/taviinfo.conf
scenario "a network and an adapter" set_up
[ "$scenario_status" = 0 ] || exit 0
scenario "measures wifi connect" measures_joining
[ "$scenario_status" != 0 ] || for name in supplicant join connect; do row $name; done
scenario "measures ap enable" measures_access_point
[ "$scenario_status" != 0 ] || for name in hostapd enable disable; do row $name; done
