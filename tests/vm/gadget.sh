# SPDX-License-Identifier: MIT
# shellcheck shell=bash
# A USB modem to plug in: a gadget with three serial ports on a host controller that is itself simulated, so
# that the kernel's USB and serial drivers are the real ones. On the gadget's side modemsim answers, and gives a
# dialled call to a real pppd; that is in a network namespace of its own, "mobile". Sourced by modem.sh and
# bench/vm_peer.sh.
gadget=/sys/kernel/config/usb_gadget/modem
near_address=10.64.64.64
far_address=10.64.64.65
beyond=192.0.2.1 # an address of the mobile network that only a default route leads to
modem_log=/run/modemsim.log

make_gadget() {
    [ ! -e $gadget ] || return 0 # by the group before, in the same guest
    modprobe -a dummy_hcd libcomposite usb_f_serial option ppp_async ppp_deflate bsd_comp
    echo 12d1 1001 ff >/sys/bus/usb-serial/drivers/option1/new_id
    mountpoint -q /sys/kernel/config || mount -t configfs none /sys/kernel/config
    mkdir -p $gadget/strings/0x409 $gadget/configs/c.1
    echo 0x12d1 >$gadget/idVendor
    echo 0x1001 >$gadget/idProduct
    echo 0x0102 >$gadget/bcdDevice # 0x0000 is a storage device's
    local n
    for n in 0 1 2; do
        mkdir $gadget/functions/gser.$n
        ln -s $gadget/functions/gser.$n $gadget/configs/c.1/
    done
    [ -d /run/systemd/system ] || /lib/systemd/systemd-udevd --daemon
    ip netns add mobile
    ip -n mobile link set lo up
    ip -n mobile addr add $beyond/32 dev lo
}

# start_modem SETTING=VALUE...: see modemsim --help; its ports are as those of real ones of this vendor.
start_modem() {
    modemsim --log $modem_log --modem "12d1,ports=dial/mute/at,$(IFS=, && echo "$*")" \
        --tty /dev/ttyGS0,/dev/ttyGS1,/dev/ttyGS2 --on-dial "exec ip netns exec mobile $(far_pppd)" \
        >/run/modemsim.out 2>&1 &
    wait_for 5 grep -qx ready /run/modemsim.out
}

# It asks every second whether the other side is still there: a gadget's serial port does not show that the caller
# has hung up.
far_pppd() {
    echo pppd nodetach local noauth nolock nocrtscts silent lcp-echo-interval 1 lcp-echo-failure 2 \
        ms-dns 10.64.64.66 ms-dns 10.64.64.67 $far_address:$near_address
}

plug() {
    echo dummy_udc.0 >$gadget/UDC
}
unplug() {
    echo "" >$gadget/UDC
}
