#!/usr/bin/python3
# SPDX-License-Identifier: MIT
"""Shows USB modems as they come, change and go: examples/modem_events.py (Debian: python3-gi)"""
from gi.repository import Gio, GLib

NAMES = ("Vendor", "Product", "SimState")


def say(modem, text):
    print(modem.get_object_path().rsplit("/", 1)[1], text, flush=True)


def came(manager, modem):
    get = modem.get_interface("com.merilond.usbmodem.Modem").get_cached_property
    say(modem, "came: " + ", ".join(get(name).get_string() or "-" for name in NAMES))


def changed(manager, modem, proxy, properties, invalidated):
    for name, value in properties.unpack().items():
        say(modem, f"{name}: {value}")


modems = Gio.DBusObjectManagerClient.new_for_bus_sync(
    Gio.BusType.SESSION, Gio.DBusObjectManagerClientFlags.DO_NOT_AUTO_START,
    "com.merilond.usbmodem.Objects", "/com/merilond/usbmodem", None, None, None)
modems.connect("object-added", came)
modems.connect("object-removed", lambda manager, modem: say(modem, "went"))
modems.connect("interface-proxy-properties-changed", changed)
for known in modems.get_objects():
    came(modems, known)
GLib.MainLoop().run()
