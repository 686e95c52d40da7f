// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_APPLIANCE_ROOT_APPLIANCE_ROOT_H
#define TAVIWIRELESS_PLATFORM_APPLIANCE_ROOT_APPLIANCE_ROOT_H

#include <string>

namespace taviwireless {

// The exit status of a process whose appliance root could not be set up.
constexpr int kApplianceRootFailed = 70;

// Puts the process into an appliance root: a private copy of this machine in which the system's own
// paths can be read, written and served without touching the machine. To be called at the start of
// main(), before any thread is started.
//
// Needs root, or a kernel that lets anybody make user namespaces; then the caller is root within,
// with the limits named at the end.
//
// Processes. The call returns in a forked process, so the caller's pid changes. The process that
// called stays outside: it hands SIGTERM, SIGINT and SIGHUP on, waits, and exits with the same
// status, or with 128 + N when signal N ended the process inside. Process 1 inside collects
// orphans. When the process inside ends, everything it left running is killed; the same happens
// when the process outside dies, of whatever. A signal that the terminal sends to the whole process
// group (Ctrl-C) is delivered once.
//
// Private and empty: /tmp, /run with /run/lock (/var/run and /var/lock lead there or are empty),
//     /var/tmp, /dev/shm, /usr/tavi, /etc/hostapd, /etc.defaults. /var/lib/usbmodem is not there.
// Private copies (changes are seen inside only and vanish): /etc, /usr, /var; also /bin, /sbin,
//     /lib where they are no links. File systems mounted below them are not seen.
// /dev: null, zero, full, random, urandom, tty, a pts of its own with ptmx, shm, fd, stdin, stdout,
//     stderr. None of the machine's devices; links such as /dev/ttyUSB0 can be made.
// Fresh: /proc, and /sys, which cannot be written. /sys/class/net shows the network inside: lo,
//     which is up. In /proc what would change the whole machine cannot be written, such as most of
//     /proc/sys.
// Private: System V and POSIX IPC, process numbers, host name, network devices, addresses, abstract
//     sockets.
//
// Everything else of the machine (/home, /root, /opt, the checkout, ...) can be read and not
// written, but for the folder `output`, which stays the machine's own: whatever has to come out
// goes there.
//
// Unchanged: the environment, open descriptors, and the current directory, which is entered anew by
// its path ("/" if that path is no more). When the running executable or the current directory lies
// below a directory that is private and empty, the topmost directory on the way to it stays
// visible: with a checkout in /tmp/clone, /tmp holds "clone" alone.
//
// Programs that are run inside have no power over the clock, the modules, the devices and the
// restart of the machine.
//
// Without root, files of the machine's root cannot be changed in place, but can be removed and
// created in folders at most three levels deep (/var/lib/usbmodem); folders there that the caller
// may not enter are empty. The users inside are those that the machine lends to the caller:
// Debian's adduser notes them in /etc/subuid, and the package uidmap hands them out; the program is
// then started a second time, by unshare(1). Where none are lent, only the caller's own user and
// group exist, and changing owners fails.
//
// Throws std::system_error with one plain sentence when namespaces are refused. What fails later is
// printed on standard error and ends the process with kApplianceRootFailed.
void EnterApplianceRoot(const std::string& output = "");

}  // namespace taviwireless

#endif
