# SPDX-License-Identifier: MIT
# shellcheck shell=bash
# What the scripts that measure in the guest share; sourced by them. The file build/compare/turns says how many turns.
# Samples for bench/compare/report are printed once the turn that took them has passed.
# shellcheck source=tests/vm/common.sh
. "$(dirname "${BASH_SOURCE[0]}")/../tests/vm/common.sh"
samples=/run/samples

sample() { # ROW WHOSE VALUE [UNIT]
    printf 'SAMPLE\tvirtual machine: %s\t%s\t%s\t%s\n' "$1" "${4:-s}" "$2" "$3" >>$samples
}

# sample_since ROW WHOSE START: the seconds from then until now.
sample_since() {
    sample "$1" "$2" "$(awk "BEGIN { print $EPOCHREALTIME - $3 }")"
}

# take ROW WHOSE COMMAND...: samples how long the command takes.
take() {
    local row=$1 whose=$2 start=$EPOCHREALTIME
    shift 2
    "$@" >/dev/null
    sample_since "$row" "$whose" "$start"
}

# in_turns SETUP TURN: functions.
in_turns() {
    local turns turn
    turns=$(cat "$checkout/build/compare/turns" 2>/dev/null || echo 1)
    scenario "what is measured" "$1"
    for ((turn = 1; turn <= turns && scenario_status == 0; turn++)); do
        : >$samples
        scenario "turn $turn of $turns" "$2"
        [ "$scenario_status" != 0 ] || cat $samples
    done
}
