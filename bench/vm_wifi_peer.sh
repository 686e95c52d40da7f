#!/bin/bash
# SPDX-License-Identifier: MIT
# What scripts/test-vm wifi_peer runs, on simulated radios: how long it takes to join a network and to switch an access
# point on, and in turns how long the same wpa_supplicant and hostapd take by themselves with the files that were written
# for them.
# shellcheck source=bench/vm_samples.sh
. "$(dirname "$0")/vm_samples.sh"
# shellcheck source=tests/vm/radio.sh
. "$(dirname "$0")/../tests/vm/radio.sh"
output=/run/output

set_up() {
    mkfifo $output
    mkdir -p /etc.defaults
    echo support_wireless=yes >/etc.defaults/taviinfo.conf
    plug_radios 2
    configure_ap wlan1 "My Net" 6 ieee80211n=1 wmm_enabled=1 wpa=2 wpa_passphrase=secret123 wpa_key_mgmt=WPA-PSK \
        rsn_pairwise=CCMP
    start_ap wlan1
    in_air ip addr add 10.9.1.1/24 dev wlan1
    /usr/tavi/hotplug/usb.plug
    taviwireless ap set ssid="My Home" security=wpa2 key channel=6 <<<"correct horse"
    taviwireless ap enable
    grep -v ^bridge= /run/hostapd-wlan0.conf >/run/alone.conf
    taviwireless ap disable
    # With the address set there is nothing but the join to wait for.
    taviwireless wifi connect "My Net" --static 10.9.1.20/24 <<<secret123
    cp /usr/tavi/etc/wpa_supplicant.conf /run/supplicant.conf
    taviwireless wifi disconnect
    wait_for 5 ended wpa_supplicant
}

# take_until ROW WHOSE TEXT COMMAND...: samples how long it takes until a line of the program's output holds the text.
# The program is ended then.
take_until() {
    local start=$EPOCHREALTIME line program
    "${@:4}" >$output 2>&1 &
    program=$!
    while read -r line; do
        [[ $line != *$3* ]] || break
    done <$output
    sample_since "$1" "$2" "$start"
    kill $program
    wait $program || true
    ip link set wlan0 down
}

changed() { # FILE: when
    stat -c %.Y "$1"
}

# What the command takes to the end, and the join, which is in it: from the file for the supplicant to the note that it
# is connected.
turn() {
    take_until "wifi connect" wpa_supplicant CTRL-EVENT-CONNECTED wpa_supplicant -Dwext -iwlan0 -c/run/supplicant.conf
    take "wifi connect" taviwireless taviwireless wifi connect "My Net" </dev/null
    sample "wifi connect: the join in it" taviwireless "$(awk "BEGIN {
        print $(changed /var/tmp/.wireless_current_connection) - $(changed /usr/tavi/etc/wpa_supplicant.conf) }")"
    taviwireless wifi disconnect
    wait_for 5 ended wpa_supplicant
    ip link set wlan0 down
    take_until "ap enable" hostapd AP-ENABLED hostapd /run/alone.conf
    take "ap enable" taviwireless taviwireless ap enable
    take "ap disable" taviwireless taviwireless ap disable
}

in_turns set_up turn
