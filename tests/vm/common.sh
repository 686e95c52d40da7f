# SPDX-License-Identifier: MIT
# shellcheck shell=bash
# What the tests in the guest share; sourced by the script of each group.
#
#   scenario "joins a WPA2 network" joins_wpa2
#
# runs the function in a shell of its own, in which the first command that fails ends it, and prints one line:
# "ok", "FAIL" followed by the commands that were run and their output, or "SKIP". Mind that a command after
# "!", or one in a condition, does not end it: hence the helpers. scenario_status is 0 after one that passed.

checkout=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
group=$(basename "$0" .sh)
system_log=/run/system.log
scenario_log=/run/scenario.log
scenario_limit=180 # s
skipped=77         # exit status

# Ends the scenario.
fail() {
    echo "FAIL: $*"
    exit 1
}
skip() {
    echo "SKIP: $*"
    exit $skipped
}

# must_fail COMMAND...: not for wait_for, which wants an answer.
must_fail() {
    local - # the trace shows what is tested, not how
    set +x
    ! "$@" || fail "should have failed: $*"
}

# wait_for SECONDS COMMAND...: until the command succeeds.
wait_for() {
    local -
    set +x
    local seconds=$1 end=$((SECONDS + $1 + 1))
    shift
    until "$@" 2>/dev/null; do
        [ $SECONDS -lt $end ] || fail "not within $seconds s: $*"
        sleep 0.1
    done
}

ended() { # PROGRAM
    ! pgrep -x "$1" >/dev/null
}

# same WANTED GOT
same() {
    local -
    set +x
    [ "$1" = "$2" ] || fail "wanted \"$1\", got \"$2\""
}

# holds TEXT PATTERN: whether a line of the text matches the extended regular expression.
holds() {
    local -
    set +x
    grep -qE -e "$2" <<<"$1" || fail "no line matches \"$2\" in: $1"
}

report() { # WORD SECONDS TITLE
    printf '%-4s %6.1f s  %s: %s\n' "$1" "$2" "$group" "$3"
}

scenario() {
    local title=$1 start=$EPOCHREALTIME log_lines seconds
    log_lines=$(wc -l <$system_log)
    (
        exec 19>&1
        BASH_XTRACEFD=19 # not among what the commands say
        set -euxo pipefail
        "$2"
    ) >$scenario_log 2>&1 </dev/null &
    timeout $scenario_limit tail --pid=$! -s 0.1 -f /dev/null || {
        echo "FAIL: not done after $scenario_limit s" >>$scenario_log
        kill -9 $!
    }
    scenario_status=0
    wait $! 2>/dev/null || scenario_status=$?
    seconds=$(awk "BEGIN { print $EPOCHREALTIME - $start }")
    case $scenario_status in
    0) report ok "$seconds" "$title" ;;
    "$skipped") report SKIP "$seconds" "$title ($(sed -n 's/^SKIP: //p' $scenario_log))" ;;
    *)
        report FAIL "$seconds" "$title"
        tail -n 60 $scenario_log | sed 's/^/    /'
        echo "    --- system log"
        tail -n "+$((log_lines + 1))" $system_log | tail -n 30 | sed 's/^/    /'
        ;;
    esac
}

# What installing the packages would do on a Debian that runs: here, without starting one.
install_product() {
    local name
    mv /usr/sbin/iwlist /usr/sbin/iwlist.distrib
    for name in libtaviwireless4 taviwireless taviwireless-host-root modemsim; do
        dpkg-deb --fsys-tarfile "$checkout"/build/packages/${name}_*.deb | tar -x --keep-directory-symlink -C /
    done
    echo replacedefaultroute >>/etc/ppp/peers/wvdial
    ldconfig
}

prepare_guest() {
    hostname appliance
    ip link set lo up
    touch $system_log
    busybox syslogd -O $system_log
    [ -e /usr/sbin/iwlist.distrib ] || install_product # by the group before, in the same guest
}
if [ ! -d /run/systemd/system ]; then
    prepare_guest
else
    journalctl --quiet --follow --output=short-monotonic >$system_log &
fi
