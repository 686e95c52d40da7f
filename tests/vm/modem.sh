#!/bin/bash
# SPDX-License-Identifier: MIT
# The modem: udev and the hot-plug script find it, usbmodemd serves it, and the real wvdial and pppd dial over it.
# shellcheck source=tests/vm/common.sh
. "$(dirname "$0")/common.sh"
# shellcheck source=tests/vm/gadget.sh
. "$(dirname "$0")/gadget.sh"

info=/tmp/usbmodem.info0
lan_route="default via 10.20.0.1 dev lan0"

modem() {
    taviwireless modem "$@"
}

# Takes the modem's document, which the checks behind it are about.
look() {
    document=$(modem --json show usbmodem0)
}
says() { # KEY VALUE
    holds "$document" "^ *\"$1\": $2,?$"
}
is_value() { # KEY VALUE
    modem --json show usbmodem0 | grep -qE "^ *\"$1\": $2,?$"
}

is_status() {
    modem status usbmodem0 | grep -qE "^usbmodem0: $1"
}

# reaches ADDRESS
reaches() {
    ping -c 2 -i 0.2 -W 2 "$1"
}

default_route_is() {
    same "$1" "$(ip route show default | sed 's/ *$//')"
}

# As the modem's user sees it, and as it is.
is_connected() {
    look
    says state '"connected"'
    says address "\"$near_address\""
    holds "$(modem interfaces)" '^usbmodem0 +ppp0$'
    holds "$(ip -4 addr show ppp0)" "inet $near_address peer $far_address/32"
    reaches $far_address
}

# The far pppd ends some seconds after the near one, and the modem takes no commands before that.
no_call_is_left() {
    wait_for 5 ended wvdial
    wait_for 15 ended pppd
    must_fail test -e /sys/class/net/ppp0
    must_fail test -e /var/lib/usbmodem/usbmodem.pid.0
    default_route_is "$lan_route"
    same "nameserver 192.0.2.53" "$(cat /etc/resolv.conf)"
}

finds_modem() {
    make_gadget
    start_modem pin=1234 imsi=262019876543210 operator=Nordnetz signal=28
    plug
    wait_for 10 test -e $info
    same "USB_ID_VENDOR=12d1 CONNECTNODE=0 DEVICENODE=0,1,2" "$(head -n 3 $info | paste -sd ' ')"
    test -c /dev/ttyUSB2
}

lists_modem() {
    # The first call starts the service.
    gdbus call --session -d com.merilond.usbmodem -o / -m com.merilond.usbmodem.GetUSBModemList
    pgrep -x usbmodemd
    wait_for 20 is_value sim_state '"pin_protect"'
    holds "$(modem list)" '^usbmodem0 +huawei +E1752 +- +- +wants PIN +'
}

takes_pin() {
    local status=0
    modem unlock usbmodem0 <<<9999 || status=$?
    same 1 $status
    look
    says sim_state '"pin_protect"'
    says pin_attempts 2
    modem unlock usbmodem0 <<<1234
    look
    says sim_state '"ready"'
    says pin_lock true
    says signal 90
    says operator '"Nordnetz"'
    must_fail grep -E '1234|9999' $system_log
}

connects() {
    modem profile set usbmodem0 apn=web.nordnetz user=me
    modem connect usbmodem0
    is_connected
    grep 'AT+CGDCONT=1,"ip","web.nordnetz"' $modem_log
    default_route_is "$lan_route"
    must_fail reaches $beyond
}

disconnects() {
    modem disconnect usbmodem0
    is_status disconnected
    no_call_is_left
}

reconnects() {
    modem profile set usbmodem0 default-route=yes
    modem connect usbmodem0
    is_connected
    ip netns pids mobile | xargs kill
    wait_for 10 is_status connecting
    wait_for 30 is_status connected
    is_connected
    default_route_is "default dev ppp0 scope link"
    reaches $beyond
}

# Goes on where the one before ended.
survives_unplugging() {
    local service
    service=$(pgrep -x usbmodemd)
    unplug
    wait_for 10 test ! -e $info
    wait_for 5 no_modem_listed
    no_call_is_left
    same "$service" "$(pgrep -x usbmodemd)"
    local status=0
    modem status usbmodem0 || status=$?
    same 3 $status
}
no_modem_listed() {
    modem list | grep -q '^No modem is plugged in'
}

works_again() {
    plug
    wait_for 30 is_value sim_state '"pin_protect"' # it had no power
    modem unlock usbmodem0 <<<1234
    modem connect usbmodem0
    is_connected
    reaches $beyond
    modem disconnect usbmodem0
    no_call_is_left
}

modprobe dummy
ip link add lan0 type dummy
ip addr add 10.20.0.2/24 dev lan0
ip link set lan0 up
ip route add default via 10.20.0.1
echo "nameserver 192.0.2.53" >/etc/resolv.conf
DBUS_SESSION_BUS_ADDRESS=$(dbus-daemon --session --fork --print-address)
export DBUS_SESSION_BUS_ADDRESS

scenario "udev finds a modem that is plugged in" finds_modem
[ "$scenario_status" = 0 ] || exit 0
scenario "the service lists it" lists_modem
scenario "takes the PIN" takes_pin
scenario "connects, and leaves the default route alone" connects
scenario "disconnects" disconnects
scenario "comes back after the network has ended the call" reconnects
scenario "survives unplugging during a call" survives_unplugging
scenario "works again when it is plugged in again" works_again
