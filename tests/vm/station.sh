#!/bin/bash
# SPDX-License-Identifier: MIT
# The Wi-Fi station: simulated radios, real hostapd as the access points, real wpa_supplicant and udhcpc.
# shellcheck source=tests/vm/common.sh
. "$(dirname "$0")/common.sh"
# shellcheck source=tests/vm/radio.sh
. "$(dirname "$0")/radio.sh"

key=secret123

# The access point at wlanN has the address 10.9.N.1 and gives away 10.9.N.20.
serve_addresses() {
    local subnet=10.9.${1#wlan}
    in_air ip addr add "$subnet.1/24" dev "$1"
    touch "/run/$1.leases"
    printf '%s\n' "interface $1" "start $subnet.20" "end $subnet.20" "lease_file /run/$1.leases" \
        "pidfile /run/udhcpd-$1.pid" "option subnet 255.255.255.0" "option router $subnet.1" \
        "option dns $subnet.8" >"/run/udhcpd-$1.conf"
    in_air udhcpd -S "/run/udhcpd-$1.conf"
}

set_up_air() {
    plug_radios 5
    local wpa2=(wpa=2 "wpa_passphrase=$key" wpa_key_mgmt=WPA-PSK rsn_pairwise=CCMP)
    configure_ap wlan1 "My Net" 6 ieee80211n=1 wmm_enabled=1 "${wpa2[@]}"
    configure_ap wlan2 Old 1 wpa=1 "wpa_passphrase=$key" wpa_key_mgmt=WPA-PSK wpa_pairwise=TKIP
    configure_ap wlan3 "Café 24/7" 11
    configure_ap wlan4 Unseen 3 ignore_broadcast_ssid=1 "${wpa2[@]}"
    for n in 1 2 3 4; do
        start_ap wlan$n
        serve_addresses wlan$n
    done
    in_air iw dev wlan3 set txpower fixed 0 # mBm; the others send with 20 dBm
}

wifi() {
    taviwireless wifi "$@"
}

status_of() {
    wifi status | sed -n "s/^$1  *//p"
}

# connected_to NETWORK N PROTOCOL SECURITY: by the access point at wlanN, as the status tells it and in fact.
connected_to() {
    local status
    status=$(wifi status)
    holds "$status" "^State +connected$"
    holds "$status" "^Network +$1$"
    holds "$status" "^BSSID +02:00:00:00:0$2:00$"
    holds "$status" "^Protocol +$3$"
    holds "$status" "^Security +$4$"
    in_air iw dev "wlan$2" station dump | grep -q "^Station $(cat /sys/class/net/wlan0/address)"
    ping -c 2 -i 0.2 -W 2 "10.9.$2.1"
}

leased_address_of() {
    same "10.9.$1.20" "$(status_of Address)"
    holds "$(ip -4 addr show wlan0)" "inet 10.9.$1.20/24 brd 10.9.$1.255 "
    holds "$(ip route show default)" "^default via 10.9.$1.1 dev wlan0"
    same "10.9.$1.1" "$(wifi gateway)"
    same "nameserver 10.9.$1.8" "$(cat /etc/resolv.conf)"
}

nothing_is_left() {
    wait_for 3 ended wpa_supplicant # it is told to end, and not waited for
    holds "$(status_of State)" "^(not connected|the interface is down)$"
    ended udhcpc
    must_fail test -e /usr/tavi/etc/wpa_supplicant.conf
    must_fail test -e /run/wpa_supplicant.pid
    must_fail test -e /etc/dhcpc/dhcpcd-wlan0.pid
    must_fail test -e /var/tmp/.wireless_current_connection
    must_fail test -e /var/tmp/.wireless_connecting
    same "" "$(ip -4 addr show wlan0)"
    same "" "$(ip route show dev wlan0)"
    same "$(cat /run/resolv.conf.before)" "$(cat /etc/resolv.conf)"
}

# Removes whatever the scenario before has left, save the saved networks. Not by the product's own means, which
# may be what is broken.
start_afresh() {
    pkill -9 taviwireless || true
    pkill wpa_supplicant || true
    pkill -9 udhcpc || true
    wait_for 10 ended wpa_supplicant
    ip addr flush dev wlan0
    rm -rf /usr/tavi/etc/wpa_supplicant.conf /etc/dhcpc /var/tmp/.wireless* /run/wpa_supplicant*
    cp /run/resolv.conf.before /etc/resolv.conf
}

lists_networks() {
    start_afresh
    local list
    list=$(wifi scan)
    holds "$list" '^ +My Net +\[####\] 100% +WPA2PSK/AES +6 +02:00:00:00:01:00 +-$'
    holds "$list" '^ +Old +\[####\] 100% +WPAPSK/TKIP +1 +02:00:00:00:02:00 +-$'
    holds "$list" '^ +Café 24/7 +\[####\] 85% +open +11 +02:00:00:00:03:00 +-$'
    holds "$list" '^ +\(hidden\) +\[####\] 100% +WPA2PSK +3 +02:00:00:00:04:00 +-$'
    must_fail grep Unseen <<<"$list"
    same 5 "$(wc -l <<<"$list")" # with the heading
}

joins_wpa2() {
    start_afresh
    wifi connect "My Net" <<<$key
    connected_to "My Net" 1 11b/g/n WPA2PSK/AES
    same "[####] 100%" "$(status_of Signal)"
    leased_address_of 1
    same 600 "$(stat -c %a /usr/tavi/etc/wpa_supplicant.conf)"
    same 600 "$(stat -c %a /usr/tavi/etc/wireless.conf)"
    must_fail grep -r $key $system_log
}

# Goes on where the one before ended.
disconnects() {
    wifi disconnect
    nothing_is_left
    must_fail ping -c 1 -W 2 10.9.1.1
    wifi connect "My Net" </dev/null # the key is known now
    connected_to "My Net" 1 11b/g/n WPA2PSK/AES
    wifi disconnect
    nothing_is_left
}

# The supplicant tells why, and the network before is joined again.
goes_back() {
    start_afresh
    wifi connect "My Net" </dev/null
    holds "$(wifi connect Old --new-key <<<'a wrong key' 2>&1)" \
        ': its access point refused the key.*; back on My Net$'
    connected_to "My Net" 1 11b/g/n WPA2PSK/AES
    leased_address_of 1
    holds "$(wifi scan)" '^\* +My Net .* yes$'
}

# A second is enough for all of it, on a machine that is not busy.
is_interrupted() {
    start_afresh
    taviwireless wifi connect "My Net" --new-key <<<'a wrong key' &
    local connect=$! status=0
    wait_for 60 test -e /var/tmp/.wireless_connecting
    wait_for 10 pgrep -x wpa_supplicant
    local start=$EPOCHREALTIME
    kill -TERM $connect
    wait $connect || status=$?
    same 143 $status
    same 1 "$(awk "BEGIN { print ($EPOCHREALTIME - $start < 3) }")"
    nothing_is_left
}

joins_wpa_tkip() {
    start_afresh
    wifi connect Old <<<$key
    connected_to Old 2 11b/g WPAPSK/TKIP
    leased_address_of 2
}

joins_open() {
    start_afresh
    wifi connect "Café 24/7" </dev/null
    connected_to "Café 24/7" 3 11b/g open
    leased_address_of 3
    same "[####] 85%" "$(status_of Signal)"
}

joins_hidden() {
    start_afresh
    wifi connect Unseen --hidden --security wpa2 <<<$key
    connected_to Unseen 4 - "WPA2PSK/TKIP AES" # what the network offers in truth is not known
    leased_address_of 4
    holds "$(wifi saved show Unseen)" "^BSSID +02:00:00:00:04:00$"
}

# networks_of LIST: the first column, in one line.
networks_of() {
    sed '1d; s/   *.*//' <<<"$1" | paste -sd, | sed 's/,/, /g'
}

# Both networks were joined before, so they are saved. The one that was used last is off the air.
joins_automatically() {
    start_afresh
    same "My Net, Café 24/7, Old" "$(networks_of "$(wifi saved list)")"
    stop_ap wlan1
    wifi auto
    connected_to "Café 24/7" 3 11b/g open
    leased_address_of 3
    start_ap wlan1
    wifi disconnect
    wifi auto
    connected_to "My Net" 1 11b/g/n WPA2PSK/AES
}

mkdir -p /etc.defaults
echo support_wireless=yes >/etc.defaults/taviinfo.conf
echo "nameserver 192.0.2.53" | tee /run/resolv.conf.before >/etc/resolv.conf

scenario "four access points are on the air" set_up_air
[ "$scenario_status" = 0 ] || exit 0
scenario "lists networks with channel, security and signal" lists_networks
scenario "joins a WPA-TKIP network" joins_wpa_tkip
scenario "joins an open network" joins_open
scenario "joins a WPA2 network by DHCP" joins_wpa2
scenario "disconnects, and joins the saved network without a key" disconnects
scenario "goes back on the network that it left for a wrong key" goes_back
scenario "undoes an attempt at once that a signal ends" is_interrupted
scenario "joins the reachable saved network that was used last" joins_automatically
scenario "joins a hidden network" joins_hidden
