#!/usr/bin/python3
"""Shows USB modems as they come, change and go: examples/modem_events.py (Debian: python3-gi)"""
from gi.repository import Gio, GLib

INTERFACE = "com.merilond.usbmodem.Modem"


def say(modem, text):
    print(modem.get_object_path().rsplit("/", 1)[1], text, flush=True)


def came(manager, modem):
    proxy = modem.get_interface(INTERFACE)
    values = {name: proxy.get_cached_property(name) for name in ("Vendor", "Product", "SimState")}
    say(modem, "came: " + ", ".join(value.get_string() or "-" for value in values.values()))


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
