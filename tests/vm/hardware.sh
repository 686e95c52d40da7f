#!/bin/bash
# SPDX-License-Identifier: MIT
# What is plugged in when the guest with a disk is switched on: nothing at first, then what was when it went down.
[ -e /etc/test/plugged ] || exit 0
# shellcheck source=tests/vm/gadget.sh
. "$(dirname "$0")/gadget.sh"
# shellcheck source=tests/vm/radio.sh
. "$(dirname "$0")/radio.sh"
make_gadget
plug
plug_radios 2
