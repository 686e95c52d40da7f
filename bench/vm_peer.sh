#!/bin/bash
# SPDX-License-Identifier: MIT
# What scripts/test-vm peer runs: the modem service and ModemManager in turns, with the same modem in the same guest. Each
# is started, has the modem plugged in and out, and is ended.
# shellcheck source=bench/vm_samples.sh
. "$(dirname "$0")/vm_samples.sh"
# shellcheck source=tests/vm/gadget.sh
. "$(dirname "$0")/../tests/vm/gadget.sh"

our_bus() {
    gdbus call --session -d com.merilond.usbmodem -o / -m com.merilond.usbmodem.GetUSBModemList
}
their_bus() {
    gdbus call --system -d org.freedesktop.ModemManager1 -o /org/freedesktop/ModemManager1 \
        -m org.freedesktop.DBus.ObjectManager.GetManagedObjects
}
we_list() {
    [[ $(our_bus) = *usbmodem0* ]]
}
they_list() {
    [[ $(their_bus) = *ModemManager1/Modem/* ]]
}
we_list_none() {
    [ "$(our_bus)" = "('',)" ]
}
they_list_none() {
    [ "$(their_bus)" = "(@a{oa{sa{sv}}} {},)" ]
}
# What is listed first has not been looked at.
we_know() {
    local objects
    objects=$(gdbus call --session -d com.merilond.usbmodem.Objects -o /com/merilond/usbmodem \
        -m org.freedesktop.DBus.ObjectManager.GetManagedObjects)
    [[ $objects = *LastLook* && $objects != *"'LastLook': <uint64 0>"* ]]
}

measure() { # WHOSE PROGRAM LISTED KNOWN GONE LIST
    plug
    take "plug to listed" "$1" wait_for 120 "$3"
    wait_for 60 "$4"
    # shellcheck disable=SC2086 # words of a command
    take "command line: list, with a modem" "$1" $6
    sample "daemon: resident memory, with a modem" "$1" \
        "$(awk '$1 == "VmRSS:" { print $2 / 1024 }' "/proc/$(pgrep -x "$2")/status")" MB
    unplug
    take "unplug to noticed" "$1" wait_for 60 "$5"
    pkill -x "$2"
    wait_for 10 ended "$2"
}

turn() {
    usbmodemd
    measure taviwireless usbmodemd we_list we_know we_list_none "taviwireless modem list"
    their_bus >/dev/null # starts it
    measure ModemManager ModemManager they_list true they_list_none "mmcli -L"
}

set_up() {
    # The packages keep ModemManager off these modems.
    sed -i 's/\({ID_MM_DEVICE_IGNORE}=\)"1"/\1"0"/' /usr/lib/udev/rules.d/90-taviwireless.rules
    make_gadget
    unplug || true # by the group before, perhaps
    pkill -x usbmodemd || true
    pkill -x modemsim || true
    wait_for 10 ended modemsim
    start_modem imsi=262019876543210
    mkdir -p /run/dbus
    dbus-daemon --system --fork
    wait_for 20 their_bus
    pkill -x ModemManager
    wait_for 10 ended ModemManager
}

DBUS_SESSION_BUS_ADDRESS=$(dbus-daemon --session --fork --print-address)
export DBUS_SESSION_BUS_ADDRESS
in_turns set_up turn
