#!/usr/bin/python3
# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

"""A file manager service without Qt, to hold the library's wire forms against another D-Bus.

    pythonservice.py DIRECTORY

publishes the introspection files of DIRECTORY as they stand. Each call is answered from the
records below, and its arguments are kept as text, with their D-Bus types, for the method "Seen" of
"org.veylabs.Test.Python" on "/Test". "Emit" there sends one of each signal.
"""

import glob
import sys
import xml.etree.ElementTree as ElementTree

import dbus
import dbus.lowlevel
import dbus.mainloop.glib
from gi.repository import GLib

PREFIX = "org.veylabs.FileManager."
NAME = "org.veylabs.vey-fm.vfs"

ENTRY = ("FTP/höst", "/mnt/ö", 4002)
FAVOURITE = ("Fäv", "/fav")
BOOKMARK = ("Büro", "sftp://büro", "/mnt/b")
DEVICE = ("/media/x", True, False, True, "sdx", "Lâbel", "icon", "udi-x", 3)
DEVICE_INFO = (
    "1", "2", "3", "4", True, "5", "6", "7", "8", "9", "10",
    2**63 + 1, 2, True, 3, 4, 2**64 - 1)

REPLIES = {
    "availableStoragePlaces": [DEVICE],
    "storageDeviceInfo": DEVICE_INFO,
    "mountStoragePlace": True,
    "unmountStoragePlace": True,
    "ejectStoragePlaceDevice": True,
    "favouritePlaces": [FAVOURITE],
    "networkPlaces": [BOOKMARK],
    "addNetworkPlace": True,
    "workgroups": ["WÖRK"],
    "hosts": ["höst"],
    "shares": {"shäre": "/mnt/share", "other": ""},
    "shareLocalPath": "/mnt/share",
    "smbNetworkLocalPath": "/mnt",
    "NetworkMountsManager.mounts": {"ftp://höst": ENTRY},
    "FuseMountsManager.mounts": {"ftp://höst": "/mnt/ö"},
}

SIGNALS = {
    "notifyWatchersSignal": [[ENTRY, ("_", "", -1)]],
    "storagePlaceAdded": [DEVICE],
    "storagePlaceUpdated": [DEVICE],
    "storagePlaceRemoved": [DEVICE],
    "favouritePlaceAdded": [("New", "/new")],
    "favouritePlaceRemoved": [("New", "/new")],
    "networkPlaceAdded": [("New", "ftp://new", "")],
    "networkPlaceUpdated": [("New", "ftp://new", "/mnt/new")],
    "networkPlaceRemoved": [("New", "ftp://new", "")],
    "mountAdded": ["ftp://höst", ENTRY],
    "rescanFinished": [False],
    "rescanWorkgroupFinished": ["WÖRK", False],
    "rescanHostFinished": ["höst", "WÖRK", False],
    "shareUpdated": ["shäre", "höst", "WÖRK", "/mnt/new"],
}


def read_contract(directory):
    """The interface elements by object path, and the signatures of methods and signals."""
    elements, methods, signals = {}, {}, {}
    for file in sorted(glob.glob(directory + "/*.xml")):
        interface = ElementTree.parse(file).getroot().find("interface")
        name = interface.get("name")
        short = name[len(PREFIX):]
        path = "/" if short in ("Service", "FileSystem") else "/" + short
        elements.setdefault(path, []).append(
            ElementTree.tostring(interface, encoding="unicode"))
        for method in interface.findall("method"):
            out = "".join(
                arg.get("type") for arg in method.findall("arg") if arg.get("direction") == "out")
            methods[name, method.get("name")] = out
        for signal in interface.findall("signal"):
            types = "".join(arg.get("type") for arg in signal.findall("arg"))
            signals[name, signal.get("name")] = (path, types)
    return elements, methods, signals


def text(value):
    """A value with the D-Bus types of its members."""
    if isinstance(value, dbus.Struct):
        return "(" + ", ".join(map(text, value)) + ")"
    if isinstance(value, dbus.Array):
        return "[" + ", ".join(map(text, value)) + "]"
    if isinstance(value, dbus.Boolean):
        return "b:" + str(bool(value)).lower()
    if isinstance(value, dbus.Int32):
        return "i:" + str(int(value))
    if isinstance(value, dbus.String):
        return "s:" + str(value)
    return type(value).__name__ + ":" + str(value)


class Service:
    """Answers on all paths of a connection."""

    def __init__(self, bus, directory):
        self.bus = bus
        self.elements, self.methods, self.signals = read_contract(directory)
        self.seen = []
        bus.add_message_filter(self.handle)

    def handle(self, _connection, message):
        """Takes method calls, and leaves the rest to the library."""
        if not isinstance(message, dbus.lowlevel.MethodCallMessage):
            return dbus.lowlevel.HANDLER_RESULT_NOT_YET_HANDLED
        interface, member = message.get_interface(), message.get_member()
        reply = dbus.lowlevel.MethodReturnMessage(message)
        if (interface, member) in self.methods:
            self.seen.append(
                member + "(" + ", ".join(map(text, message.get_args_list())) + ")")
            out = self.methods[interface, member]
            if out:
                short = interface[len(PREFIX):] + "." + member
                value = REPLIES.get(short, REPLIES.get(member))
                reply.append(value, signature=out)
        elif interface == "org.freedesktop.DBus.Introspectable":
            path = message.get_path()
            reply.append("<node>" + "".join(self.elements.get(path, [])) + "</node>")
        elif member == "Seen":
            reply.append(self.seen, signature="as")
            self.seen = []
        elif member == "Emit":
            self.emit(*message.get_args_list())
        else:
            return dbus.lowlevel.HANDLER_RESULT_NOT_YET_HANDLED
        if not message.get_no_reply():
            self.bus.send_message(reply)
        return dbus.lowlevel.HANDLER_RESULT_HANDLED

    def emit(self, member):
        """Sends the signal of that name."""
        for (interface, name), (path, signature) in self.signals.items():
            if name == member:
                signal = dbus.lowlevel.SignalMessage(path, interface, name)
                signal.append(*SIGNALS[name], signature=signature)
                self.bus.send_message(signal)


def main():
    """Owns the name last, when everything is there."""
    dbus.mainloop.glib.DBusGMainLoop(set_as_default=True)
    bus = dbus.SessionBus()
    service = Service(bus, sys.argv[1])
    bus.set_exit_on_disconnect(True)
    bus.request_name(NAME)
    GLib.MainLoop().run()
    return service


if __name__ == "__main__":
    main()
