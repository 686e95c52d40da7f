#!/usr/bin/python3
# SPDX-License-Identifier: MIT
"""Scans for Wi-Fi networks without waiting for it: examples/wifi_worker.py (as root)

The functions of the library take seconds, and of two calls at a time each would disturb the other. So one worker
process makes all of them, while the program goes on with what it does.
"""
import ctypes
import signal
import sys
from concurrent.futures import ProcessPoolExecutor, wait


class Link(ctypes.Structure):
    """WirelessLink of <taviwireless/wireless.h>."""


Link._fields_ = [("next", ctypes.POINTER(Link)), ("previous", ctypes.POINTER(Link))]


class Network(ctypes.Structure):
    """WirelessNetwork, likewise."""
    _fields_ = [("essid", ctypes.c_char * 33), ("bssid", ctypes.c_ubyte * 6)] + [
        (name, ctypes.c_int32) for name in ("channel", "signal", "opmode", "protocol", "auth", "encrypt")
    ] + [("link", Link)]


def scan():
    """The networks in range, as (name, channel, signal). For the worker."""
    library = ctypes.CDLL("libtaviwireless.so.4")
    free = ctypes.CDLL(None).free
    free.argtypes = [ctypes.c_void_p]
    head = Link()
    if library.TAVIWirelessNetworkScan(0, ctypes.byref(head)) != 0:
        raise OSError("cannot scan; the system log tells why")
    found = []
    place = ctypes.addressof(head.next.contents)
    while place != ctypes.addressof(head):
        record = place - Network.link.offset
        network = Network.from_address(record)
        found.append((network.essid.decode(errors="replace"), network.channel, network.signal))
        place = ctypes.addressof(network.link.next.contents)
        free(record)
    return found


def main():
    # Ctrl-C ends the worker, too, without a word.
    with ProcessPoolExecutor(1, initializer=signal.signal, initargs=(signal.SIGINT, signal.SIG_DFL)) as worker:
        scanning = worker.submit(scan)
        while wait([scanning], timeout=0.5).not_done:
            print(".", end="", file=sys.stderr, flush=True)  # here the program does its own work
        for name, channel, strength in scanning.result():
            print(f"{name}: channel {channel}, signal {strength}")


if __name__ == "__main__":
    try:
        main()
    except (OSError, RuntimeError) as error:  # also a worker that died
        sys.exit(f"wifi_worker: {error}")
    except KeyboardInterrupt:
        sys.exit(128 + signal.SIGINT)
