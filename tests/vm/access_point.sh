#!/bin/bash
# SPDX-License-Identifier: MIT
# The Wi-Fi access point: the product's on wlan0, with the real hostapd and udhcpd. A real station at wlan1
# joins it by wpa_supplicant and udhcpc; wlan2 is a neighbour's access point.
# shellcheck source=tests/vm/common.sh
. "$(dirname "$0")/common.sh"
# shellcheck source=tests/vm/radio.sh
. "$(dirname "$0")/radio.sh"

ap() {
    taviwireless ap "$@"
}

status_of() {
    ap status | sed -n "s/^$1  *//p"
}

set_up() {
    plug_radios 3
    configure_ap wlan2 Neighbour 1
    /usr/tavi/hotplug/usb.plug
    holds "$(cat /tmp/wireless.info)" "^AP_SUPPORT=yes$"
    holds "$(ap status)" "^State +off$"
}

sets_and_checks() {
    ap set ssid="My Home" security=wpa2 key channel=6 <<<"correct horse"
    same 600 "$(stat -c %a /usr/tavi/etc/wireless_ap.conf)"
    must_fail grep -F "correct horse" <<<"$(ap show)"
    ap check
}

enables() {
    ap enable
    same on "$(status_of State)"
    same 10.1.14.1 "$(status_of Address)"
    wait_for 5 is_on_air
    holds "$(ip -4 addr show lbr0)" "inet 10.1.14.1/24 "
    same lbr0 "$(basename "$(readlink /sys/class/net/wlan0/master)")"
    same 600 "$(stat -c %a /etc/hostapd/hostapd-wlan0-host.conf)"
    pgrep -x hostapd
    pgrep -x udhcpd
    must_fail test -e /var/tmp/.wireless_ap_connecting
}
is_on_air() {
    [ "$(iw dev wlan0 info | grep -cE 'ssid My Home$|type AP$|channel 6 ')" = 3 ]
}

serves_station() {
    join "My Home" "correct horse"
    local leased
    leased=$(lease)
    holds "$leased" "^ip=10\.1\.14\.([2-9]|[1-9][0-9]|1[0-9][0-9]|2[0-4][0-9]|25[0-4]) mask=24 router=10.1.14.1 "
    in_air ping -c 2 -i 0.2 -W 2 10.1.14.1
    holds "$(ap stations)" "^$(in_air cat /sys/class/net/wlan1/address) +.* +10\.1\.14\.[0-9]+ +[0-9]+% .* My Home$"
}

disables() {
    is_on_air
    ap disable
    same off "$(status_of State)"
    wait_for 3 ended hostapd
    wait_for 3 ended udhcpd
    must_fail ip link show lbr0
    same "" "$(ip -4 addr show wlan0)"
    must_fail grep -r 'passphrase=' /run/hostapd-wlan0.conf
    must_fail is_on_air
}

# The neighbour is on channel 1.
chooses_emptiest_channel() {
    start_ap wlan2
    holds "$(ap set channel=auto)" "^Stored, channel 6: no networks; 1 has 1; "
    stop_ap wlan2
}

# The guests' bridge and its addresses are the model's own.
serves_guests() {
    echo support_pci_wifi=yes >>/etc.defaults/taviinfo.conf
    printf '%s\n' DEVICE=gbr TYPE=Bridge ONBOOT=yes BOOTPROTO=static IPADDR=10.1.15.1 NETMASK=255.255.255.0 \
        >/etc/sysconfig/network-scripts/ifcfg-gbr
    printf '%s\n' enable=yes reserved=30 lease=3600 start=10.1.15.50 end=10.1.15.59 interface=gbr bridge=gbr \
        gateway=10.1.15.1 nameserver=10.1.15.1 netmask=255.255.255.0 >/etc/dhcpd/dhcpd-gbr-gbr.info
    ap set guest=yes guest-ssid=Visitors guest-security=wpa2 guest-key <<<"welcome friend"
    ap enable
    join Visitors "welcome friend"
    holds "$(lease)" "^ip=10.1.15.5[0-9] "
    in_air ping -c 2 -i 0.2 -W 2 10.1.15.1
    same gbr "$(basename "$(readlink /sys/class/net/gwlan/master)")"
    join "My Home" "correct horse"
    holds "$(lease)" "^ip=10\.1\.14\."
    ap disable
    must_fail ip link show gbr
    wait_for 3 ended hostapd
}

# All that is lost with the power is taken away; then comes what the unit does at boot.
comes_back_after_restart() {
    ap enable
    pkill -9 -x hostapd
    pkill -9 -x udhcpd
    ip link delete lbr0
    rm -rf /run/hostapd* /run/udhcpd* /run/rc.network* /tmp/wireless.info
    touch /var/tmp/.wireless_ap_connecting # the power failed while it was being switched on once more
    /usr/tavi/bin/start-wireless
    same on "$(status_of State)"
    join "My Home" "correct horse"
    lease
    in_air ping -c 2 -i 0.2 -W 2 10.1.14.1
}

# Two enable at the same time: one of them succeeds, the other is refused or succeeds as well.
# A refusal is the command line's or, if both look at the same moment, the library's.
is_refused() {
    [ "$1" = 4 ] || same 1 "$1"
}

enables_twice_at_once() {
    ap enable &
    ap enable || is_refused $?
    wait $! || is_refused $?
    same "1 2" "$(pgrep -cx hostapd) $(pgrep -cx udhcpd)" # the guests have a server of their own
    ap disable
    wait_for 3 ended hostapd
    wait_for 3 ended udhcpd
}

is_station_again() {
    start_ap wlan2
    taviwireless wifi mode client
    holds "$(taviwireless wifi scan)" "^ +Neighbour .* 02:00:00:00:02:00 +-$"
}

mkdir -p /etc.defaults
echo support_wireless=yes >/etc.defaults/taviinfo.conf

scenario "the adapter can be an access point" set_up
[ "$scenario_status" = 0 ] || exit 0
scenario "takes settings, and hostapd understands them" sets_and_checks
scenario "switches on, with bridge and address" enables
scenario "a station joins, gets a lease and reaches it" serves_station
scenario "switches off, and leaves nothing" disables
scenario "chooses the emptiest channel" chooses_emptiest_channel
scenario "serves guests on a network of their own" serves_guests
scenario "is on again after a restart" comes_back_after_restart
scenario "two enable it at once" enables_twice_at_once
scenario "the adapter is a station again" is_station_again
