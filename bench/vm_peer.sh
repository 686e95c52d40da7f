#!/bin/bash
# SPDX-License-Identifier: MIT
# What scripts/test-vm peer runs: the modem service beside ModemManager, with the same modem in the same guest, one
# after the other. Of the two list commands, ours asks the modem anew.
# shellcheck source=tests/vm/common.sh
. "$(dirname "$0")/../tests/vm/common.sh"
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

# take NAME COMMAND...: writes how many seconds the command takes.
take() {
    local name=$1 start=$EPOCHREALTIME
    shift
    "$@" >/dev/null
    awk "BEGIN { print $EPOCHREALTIME - $start }" >"/run/peer/$name"
}

five_times() {
    for _ in 1 2 3 4 5; do
        "$@"
    done
}

resident_memory() { # PROGRAM, in MB
    awk '$1 == "VmRSS:" { print $2 / 1024 }' "/proc/$(pgrep -x "$1")/status"
}

# measure WHO BUS LISTED GONE LIST PROGRAM
measure() {
    plug
    take "$1.plug" wait_for 120 "$3"
    take "$1.call" five_times "$2"
    # shellcheck disable=SC2086 # words of a command
    take "$1.list" five_times $5
    resident_memory "$6" >"/run/peer/$1.memory"
    unplug
    take "$1.unplug" wait_for 60 "$4"
}

measures_ours() {
    usbmodemd
    measure ours our_bus we_list we_list_none "taviwireless modem list" usbmodemd
    pkill -x usbmodemd
    wait_for 10 ended usbmodemd
}

measures_theirs() {
    mkdir -p /run/dbus
    dbus-daemon --system --fork
    wait_for 20 their_bus # starts it
    measure theirs their_bus they_list they_list_none "mmcli -L" ModemManager
    pkill -x ModemManager
    wait_for 10 ended ModemManager
}

row() { # NAME TITLE UNIT DIVISOR
    awk -v ours="$(cat "/run/peer/ours.$1")" -v theirs="$(cat "/run/peer/theirs.$1")" -v title="$2" -v unit="$3" \
        -v divisor="$4" 'BEGIN {
            printf "    %-30s %8.2f %-2s %8.2f %-2s %8.2f\n",
                title, ours / divisor, unit, theirs / divisor, unit, ours / theirs
        }'
}

set_up() {
    mkdir -p /run/peer
    make_gadget
    unplug || true # by the group before, perhaps
    pkill -x usbmodemd || true
    pkill -x modemsim || true
    wait_for 10 ended modemsim
    start_modem imsi=262019876543210
}

DBUS_SESSION_BUS_ADDRESS=$(dbus-daemon --session --fork --print-address)
export DBUS_SESSION_BUS_ADDRESS
scenario "a modem for both" set_up
[ "$scenario_status" = 0 ] || exit 0
scenario "measures usbmodemd" measures_ours
ours=$scenario_status
scenario "measures ModemManager" measures_theirs
[ "$ours" = 0 ] && [ "$scenario_status" = 0 ] || exit 0
printf '    %-30s %11s %11s %8s\n' "" usbmodemd ModemManager ratio
row plug "plug to listed" s 1
row call "list call on the bus" s 5
row list "modem list and mmcli -L" s 5
row memory "resident memory" MB 1
row unplug "unplug to noticed" s 1
