#!/bin/bash
# SPDX-License-Identifier: MIT
# The packages on a plain Debian, where systemd is the first process: installed, used, restarted and removed as a
# person would, with udev, ModemManager and NetworkManager as Debian has them. The guest is restarted in the middle:
# this runs at each boot.
stty -F /dev/ttyS1 raw
# shellcheck source=tests/vm/common.sh
. "$(dirname "$0")/common.sh"
# shellcheck source=tests/vm/gadget.sh
. "$(dirname "$0")/gadget.sh"
# shellcheck source=tests/vm/radio.sh
. "$(dirname "$0")/radio.sh"

kept=/etc/test # from one boot to the next
packages=(libtaviwireless4 taviwireless taviwireless-host-root modemsim)
info=/tmp/usbmodem.info0
bus_call=(gdbus call --session -d com.merilond.usbmodem -o / -m)
# As logging in sets them.
export XDG_RUNTIME_DIR=/run/user/0 DBUS_SESSION_BUS_ADDRESS=unix:path=/run/user/0/bus

modem() {
    taviwireless modem "$@"
}
ap() {
    taviwireless ap "$@"
}
user_unit() {
    systemctl --user "$@" usbmodemd.service
}
is_active() {
    user_unit --quiet is-active
}
unit_value() { # PROPERTY
    user_unit show --property "$1" --value
}

is_modem() { # KEY VALUE
    modem --json show usbmodem0 | grep -qE "^ *\"$1\": $2,?$"
}
is_status() {
    modem status usbmodem0 | grep -qE "^usbmodem0: $1"
}

# apt_get WORD [OPTION]: all the packages.
apt_get() {
    local package what=("${packages[@]}")
    if [ "$1" = install ]; then
        what=()
        for package in "${packages[@]}"; do
            what+=("$checkout/build/packages/$package"_*.deb)
        done
    fi
    DEBIAN_FRONTEND=noninteractive apt-get --yes --quiet=2 -o Dpkg::Use-Pty=0 -o Dpkg::Progress-Fancy=0 "$@" "${what[@]}"
}

nothing_failed() {
    same "" "$(systemctl list-units --state=failed --plain --no-legend)"
    [ ! -S "$XDG_RUNTIME_DIR/bus" ] || same "" "$(systemctl --user list-units --state=failed --plain --no-legend)"
}

# By the network that NetworkManager has set up, and nothing of a call's is left.
is_at_home() {
    holds "$(ip route get $beyond)" " via 10.20.0.1 dev lan0 "
    same "nameserver 192.0.2.53" "$(grep -v '^#' /etc/resolv.conf)"
}

# All files, with what they hold where settings lie; but for what pppd and wvdial, which stay, have of a call.
snapshot() {
    find / -xdev \( -path /proc -o -path /run -o -path /tmp -o -path /var/tmp -o -path /var/log -o -path /var/cache \
        -o -path /var/lib/dpkg -o -path /var/lib/apt -o -path /var/lib/systemd -o -path /var/lib/NetworkManager \
        -o -path /etc/ppp/resolv.conf -o -path $kept \) -prune -o -printf '%p %y %m %u:%g\n' | sort
    find /etc -path $kept -prune -o -type f ! -path '/etc/ppp/*-secrets' ! -path /etc/ppp/resolv.conf \
        ! -name ld.so.cache ! -name .updated -exec md5sum {} + | sort -k 2
}

boots() {
    systemctl is-system-running --wait || true
    nothing_failed
    same "active active" "$(systemctl is-active ModemManager NetworkManager | paste -sd ' ')"
    nmcli connection add type dummy ifname lan0 con-name lan ipv4.method manual ipv4.addresses 10.20.0.2/24 \
        ipv4.gateway 10.20.0.1 ipv4.dns 192.0.2.53
    nmcli connection up lan
    wait_for 10 grep -q 192.0.2.53 /etc/resolv.conf
    is_at_home
}

installs() {
    snapshot >$kept/before
    apt_get install
    same "" "$(dpkg --audit)"
    same "" "$(dpkg --verify "${packages[@]}")"
    nothing_failed
    test -x /usr/sbin/iwlist.distrib
    grep "^ppp_async " /proc/modules
    same yes "$(loginctl show-user root --property Linger --value)"
    wait_for 30 test -S "$XDG_RUNTIME_DIR/bus"
    wait_for 30 is_active
}

finds_modem() {
    make_gadget
    start_modem imsi=262019876543210 operator=Nordnetz signal=28
    plug
    wait_for 20 test -e $info
    is_described
}
is_described() {
    same "USB_ID_VENDOR=12d1 CONNECTNODE=0 DEVICENODE=0,1,2" "$(head -n 3 $info | paste -sd ' ')"
}

is_activated() {
    user_unit stop
    "${bus_call[@]}" com.merilond.usbmodem.GetUSBModemList
    same active "$(unit_value ActiveState)"
    same "$(pgrep -x usbmodemd)" "$(unit_value MainPID)"
    wait_for 60 is_modem sim_state '"ready"'
}

is_in_sandbox() {
    local status exposure
    status=$(cat "/proc/$(unit_value MainPID)/status")
    holds "$status" "^NoNewPrivs:.1$"
    holds "$status" "^Seccomp:.2$"
    holds "$status" "^CapBnd:.0000000000001000$"
    must_fail nsenter --target "$(unit_value MainPID)" --mount touch /usr/bin/mine
    exposure=$(systemd-analyze --user security usbmodemd.service --no-pager | tee /dev/stderr |
        sed -n 's/.*Overall exposure level .*: \([0-9.]*\) .*/\1/p')
    awk "BEGIN { exit !(\"$exposure\" != \"\" && $exposure < 4) }"
}

is_connected() {
    same $near_address "$(modem --json show usbmodem0 | sed -n 's/^ *"address": "\(.*\)",*$/\1/p')"
    ping -c 2 -i 0.2 -W 2 $beyond
}

dials() {
    modem profile set usbmodem0 apn=web.nordnetz default-route=yes
    modem connect usbmodem0
    is_connected
    same "$(unit_value ControlGroup)" "$(cut -d : -f 3 "/proc/$(pgrep -x wvdial)/cgroup")"
}

survives_unplugging() {
    local service
    service=$(unit_value MainPID)
    unplug
    wait_for 10 test ! -e $info
    wait_for 20 ended wvdial
    wait_for 20 test ! -e /sys/class/net/ppp0
    same "$service" "$(unit_value MainPID)"
    plug
    wait_for 20 test -e $info
    wait_for 60 is_modem sim_state '"ready"'
    modem connect usbmodem0
    is_connected
    modem disconnect usbmodem0
    wait_for 15 ended pppd
    is_at_home
}

# By then it has had the time in which it takes such a modem, and would be asking it things.
managers_keep_away() {
    systemctl is-active ModemManager
    holds "$(mmcli -L 2>&1)" "^No modems were found$"
    for port in /dev/ttyUSB*; do
        holds "$(udevadm info --query=property "$port")" "^ID_MM_DEVICE_IGNORE=1$"
    done
    must_fail grep -E "AT\+GCAP" $modem_log
    systemctl is-active NetworkManager
    holds "$(nmcli --terse --fields DEVICE,STATE device)" "^wlan0:unmanaged$"
}

serves_access_point() {
    plug_radios 2
    wait_for 20 grep -qx AP_SUPPORT=yes /tmp/wireless.info
    ap set ssid="My Home" security=wpa2 key channel=6 <<<"correct horse"
    ap enable
    join "My Home" "correct horse"
    holds "$(lease)" "^ip=10\.1\.14\."
    nothing_failed
}

is_back() {
    systemctl is-system-running --wait || true
    nothing_failed
    wait_for 120 systemctl --quiet is-active taviwireless # udev may not have come to the adapter yet
    holds "$(ap status)" "^State +on$"
    join "My Home" "correct horse"
    holds "$(lease)" "^ip=10\.1\.14\."
    in_air ping -c 2 -i 0.2 -W 2 10.1.14.1
}

# It was there before udev was. When the machine went down, its ports had other numbers.
modem_is_back() {
    is_described
    start_modem imsi=262019876543210 operator=Nordnetz signal=28
    same active "$(unit_value ActiveState)"
    wait_for 90 is_modem sim_state '"ready"'
    holds "$(modem profile show usbmodem0)" 'web\.nordnetz'
    modem connect usbmodem0
    is_connected
}

# With everything in use, as an upgrade is.
installs_over_it() {
    apt_get install --reinstall
    nothing_failed
    holds "$(ap status)" "^State +on$"
    holds "$(ap show)" "My Home"
    holds "$(modem profile show usbmodem0)" 'web\.nordnetz'
    is_status connected
    is_connected
}

is_removed() {
    modem disconnect usbmodem0
    ap disable
    apt_get remove
    wait_for 10 ended usbmodemd
    test ! -e /usr/sbin/iwlist.distrib
    test -e /etc/taviwireless/wireless_ap.conf
    test -e /var/lib/usbmodem
    nothing_failed
    apt_get purge
    test ! -e /var/lib/systemd/linger/root
    snapshot >$kept/after
    same "" "$(diff $kept/before $kept/after)"
    nothing_failed
}

mkdir -p $kept
if [ ! -e $kept/plugged ]; then
    scenario "a plain Debian starts" boots
    scenario "the packages are installed" installs
    scenario "udev finds a modem that is plugged in" finds_modem
    scenario "the bus starts the service" is_activated
    scenario "the service is in its sandbox" is_in_sandbox
    scenario "dials from there" dials
    scenario "survives unplugging, and dials again" survives_unplugging
    scenario "serves an access point" serves_access_point
    scenario "the managers keep away" managers_keep_away
    sed -i s/0,1,2/0,2,3/ $info
    touch $kept/plugged
    systemctl reboot
else
    scenario "after a restart the access point is there" is_back
    scenario "and the modem, with its settings" modem_is_back
    scenario "the managers still keep away" managers_keep_away
    scenario "an upgrade interrupts nothing" installs_over_it
    scenario "is removed, and leaves nothing" is_removed
    echo "finished installed"
    systemctl poweroff
fi
