#!/usr/bin/env python3
"""Writes a large synthetic site for the adapter simulator (sim/README.md).

Every card is a converged adapter whose physical ports each carry a NIC, an
iSCSI and an FCoE function; FCoE ports see FC targets and iSCSI ports iSCSI
targets, each with LUNs of rotating SCSI device types.  Each port has an
optical module (SFF data with diagnostics); the first FCoE port of a card has
one virtual port and a local driver parameter; every card has FRU and general
VPD and an event-log configuration.  Names are derived from the card and port
numbers, so two runs with the same arguments write the same file.

  tools/gen_site.py --cards 16 --ports 4 --targets 8 --luns 16 -o big.json
"""

import argparse
import json
import sys

# Disk, tape, medium changer, array controller, enclosure, CD/DVD, unknown.
DEVICE_TYPES = [0x00, 0x00, 0x01, 0x08, 0x0C, 0x0D, 0x05, 0x1F]
PRODUCTS = {
    0x00: ("NORVSTOR", "VDISK"),
    0x01: ("IBM", "ULT3580-TD8"),
    0x08: ("QUANTUM", "Scalar i6"),
    0x0C: ("NORVSTOR", "RAID CTRL"),
    0x0D: ("NORVSTOR", "SES"),
    0x05: ("NORVSTOR", "VIRTUAL CDROM"),
    0x1F: ("NORVSTOR", "WLUN"),
}


def pairs(value, count):
    """`value` as `count` bytes, joined by ':'."""
    return ":".join("%02x" % ((value >> (8 * (count - 1 - i))) & 0xFF) for i in range(count))


def lun(card, port, target, number):
    kind = DEVICE_TYPES[number % len(DEVICE_TYPES)]
    vendor, product = PRODUCTS[kind]
    unit = {
        "lun": number,
        "type": kind,
        "vendor": vendor,
        "product": product,
        "revision": "0100",
        "serial": "NS%03d%02d%03d%04d" % (card, port, target, number),
    }
    if kind in (0x00, 0x05):
        unit["blocks"] = 2097152 * (1 + number % 8)
    return unit


def function_id(kind, card, port):
    """24 bits unique per (kind, card, port): the tail of MACs and WWPNs."""
    return (kind << 20) | (card << 6) | port


# Global FCoE driver parameters of the library.
DRIVER_PARAMS = [
    {"name": "log-verbose", "min": 0, "max": 65535, "default": 0, "current": 0,
     "help": "Verbose logging bit-mask"},
    {"name": "lun-queue-depth", "min": 1, "max": 128, "default": 30, "current": 30,
     "help": "Max number of FCP commands queued to a LUN"},
]


def sff(card, port):
    """An SR optical module with diagnostics and the default thresholds."""
    return {
        "vendor": "NORVANE", "part_number": "NV-SFP10G-SR", "revision": "A",
        "serial": "NS%05d%02d" % (card, port), "oui": "00:90:fa", "date_code": "250612",
        "wavelength": 850,
        "diagnostics": {"temperature": 35 + (card + port) % 10, "vcc": 3.3, "tx_bias_ma": 6.5,
                        "tx_power_mw": 0.55, "rx_power_mw": 0.48},
    }


def fcoe_function(card, port, args):
    fid = function_id(2, card, port)
    targets = []
    for t in range(args.targets):
        tid = (card << 16) | (port << 10) | t
        targets.append({
            "wwpn": "50:06:01:60:" + pairs(tid, 4),
            "wwnn": "50:06:01:61:" + pairs(tid, 4),
            "fc_id": "0x%06x" % (0x010000 + (t << 8)),
            "luns": [lun(card, port, t, n) for n in range(args.luns)],
        })
    function = {
        "kind": "fcoe", "port": port, "pci_function": 2 * args.ports + port,
        "mac": "00:90:fb:" + pairs(fid, 3),
        "wwpn": "10:00:00:90:fb:" + pairs(fid, 3),
        "wwnn": "20:00:00:90:fb:" + pairs(fid, 3),
        "ifname": "host%d" % (card * args.ports + port + 1),
        "fc_id": "0x%06x" % (fid & 0xFFFFFF),
        "driver": {"name": "tavofc", "version": "12.8.351.29", "type": 3},
        "targets": targets,
    }
    if port == 0:
        function["vports"] = [{
            "wwpn": "10:00:00:90:fc:" + pairs(fid, 3),
            "wwnn": "20:00:00:90:fc:" + pairs(fid, 3),
            "fc_id": "0x%06x" % ((fid + 1) & 0xFFFFFF),
            "name": "vport-c%d" % card,
        }]
        function["driver_params"] = [{"name": "lun-queue-depth", "min": 1, "max": 128, "default": 30,
                                      "current": 32, "help": "Max number of FCP commands queued to a LUN"}]
    return function


def iscsi_function(card, port, args):
    host = "10.%d.%d" % (100 + card % 100, port)
    targets = []
    for t in range(args.targets):
        targets.append({
            "name": "iqn.2024-01.com.norvane.sim:c%d-p%d-t%d" % (card, port, t),
            "portal": "%s.%d:3260" % (host, 100 + t % 100),
            "sessions": [{"isid": "0x%012x" % (0x400000000000 | (card << 20) | (port << 12) | t),
                          "tsih": t % 65535 + 1, "state": 0,
                                        "connections": [{"local": "%s.21:%d" % (host, 50000 + t % 15000)}]}],
            "luns": [lun(card, port, t, n) for n in range(args.luns)],
        })
    return {
        "kind": "iscsi", "port": port, "pci_function": args.ports + port,
        "mac": "00:90:fb:" + pairs(function_id(1, card, port), 3),
        "ifname": "eth%d" % (card * args.ports + port),
        "ipv4": host + ".21", "netmask": "255.255.255.0",
        "driver": {"name": "tavoiscsi", "version": "12.8.351.29", "type": 2},
        "initiator": {"name": "iqn.1998-01.com.norvane:sim-c%d-p%d" % (card, port)},
        "iscsi_targets": targets,
    }


def nic_function(card, port, args):
    return {
        "kind": "nic", "port": port, "pci_function": port,
        "mac": "00:90:fb:" + pairs(function_id(0, card, port), 3),
        "ifname": "eth%d" % (card * args.ports + port),
        "ipv4": "172.%d.%d.%d" % (16 + card // 250, card % 250, 10 + port),
        "netmask": "255.255.255.0",
        "driver": {"name": "tavonic", "version": "12.8.351.29", "type": 1},
    }


def card(number, args):
    serial = "NVS%05d%04d" % (number, args.ports)
    functions = []
    for port in range(args.ports):
        functions.append(nic_function(number, port, args))
        functions.append(iscsi_function(number, port, args))
        functions.append(fcoe_function(number, port, args))
    return {
        "model": "TV-52%02dC" % args.ports,
        "description": "Norvane TAVO %d-port 10GbE Converged Network Adapter (simulated)" % args.ports,
        "serial": serial,
        "pci_bus": 4 + number,
        "temperature": 40 + number % 20,
        "firmware": {"operational": "10.2.370.19", "boot": "10.2.370.9"},
        "vpd": [["PN", "TV52%02dC-N1" % args.ports], ["EC", "A01"], ["SN", serial]],
        "fru": [["MN", "Norvane"], ["PA", "TAVO simulated CNA"], ["PN", "TV52%02dC-N1" % args.ports],
                ["SN", serial], ["UU", "%032x" % (0x6a1f0c4e9b2d4d7a8e1c55f3a0b20000 + number)],
                ["FW", "A1,V:10.2.370.19,D:2025-06-17"], ["FN", "FRU-52%02dC-01" % args.ports],
                ["DM", "2425"], ["CF", "64"], ["RI", "1"]],
        "event_log": [
            {"module": "FCoE", "modes": {"ram": {"level": 5}, "uart": {"level": 9}}},
            {"module": "NIC", "modes": {"ram": {"level": 8}}},
        ],
        "features": [35, 201, 400, 430],
        "ports": [{"link_up": True, "speed_mbps": 10000, "sff": sff(number, port)}
                  for port in range(args.ports)],
        "functions": functions,
    }


def main(argv):
    parser = argparse.ArgumentParser(description=__doc__.split("\n")[0])
    parser.add_argument("--cards", type=int, default=4, help="number of cards (N)")
    parser.add_argument("--ports", type=int, default=2, help="physical ports per card (M)")
    parser.add_argument("--targets", type=int, default=4, help="targets per FCoE and iSCSI port (T)")
    parser.add_argument("--luns", type=int, default=8, help="LUNs per target (L)")
    parser.add_argument("-o", "--output", default="-", help="file to write ('-' for stdout)")
    args = parser.parse_args(argv)
    limits = {"cards": (1, 4000), "ports": (1, 64), "targets": (0, 1000), "luns": (0, 4096)}
    for name, (low, high) in limits.items():
        value = getattr(args, name)
        if not low <= value <= high:
            parser.error("--%s must be between %d and %d" % (name, low, high))
    site = {"library": {"version": "12.8.351.29", "driver_params": DRIVER_PARAMS},
            "cards": [card(c, args) for c in range(args.cards)]}
    text = json.dumps(site, indent=1) + "\n"
    if args.output == "-":
        sys.stdout.write(text)
    else:
        with open(args.output, "w", encoding="utf-8") as out:
            out.write(text)
    return 0


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:]))
