# SPDX-License-Identifier: Apache-2.0
"""The facts of ip and ethtool."""
import re
from ipaddress import ip_network

from compare.properties import properties_of
from compare.zep import listed


# The names in the kernel's files, which zep uses, of settings that ip names otherwise.
SETTINGS = {"guard": "bpdu_guard", "fastleave": "multicast_fast_leave", "mcast_flood": "multicast_flood", "flood": "unicast_flood",
            "bcast_flood": "broadcast_flood", "mcast_router": "multicast_router", "proxy_arp": "proxyarp",
            "proxy_arp_wifi": "proxyarp_wifi", "num_peer_notif": "num_grat_arp", "peer_notify_delay": "peer_notif_delay",
            "ad_lacp_active": "lacp_active", "mcast_querier": "multicast_querier",
            "mcast_igmp_version": "multicast_igmp_version", "mcast_mld_version": "multicast_mld_version"}
TRUTHS = ("vlan_filtering", "mcast_snooping")  # numbers 0 and 1
FOR_EVER = 0xFFFFFFFF


def facts_of_ip(links):
    for link in links:
        name = [link["ifname"]]
        for fact, value in link.items():
            if isinstance(value, (str, int)):
                yield name, fact, value
        for flag in link["flags"]:
            yield name, "flags", flag
        for part, values in link.get("linkinfo", {}).items():
            yield from ([(name, part, values)] if isinstance(values, str) else settings(name, part, values))
        for address in link["addr_info"]:
            yield from facts_of_address(name, address)


def settings(name, part, values):
    """Those that zep describes as properties have a row in properties.py; the others are texts like "use_carrier: 1"."""
    for fact, value in values.items():
        if isinstance(value, list):
            for flag in value:
                yield name, f"{part}.{fact}", flag
        elif properties_of("ip", f"{part}.{fact}"):
            yield name, f"{part}.{fact}", bool(value) if fact in TRUTHS else digits_of(value)
        else:
            number = int(value) if isinstance(value, bool) else "none" if value is None else value
            yield name, f"{part}.{fact}", f"{SETTINGS.get(fact, fact)}: {number}"


def digits_of(value):
    """The identifier of a bridge, in which ip leaves out zeros, and other numbers in decimal digits."""
    text = str(value)
    if re.fullmatch("0x[0-9a-f]+", text):
        return int(text, 16)
    priority, _, address = text.partition(".")
    if ":" not in address:
        return value
    return priority + "." + "".join(part.zfill(2) for part in address.split(":"))


def facts_of_address(link, address):
    names = [f"{link[0]} {address['local']}/{address['prefixlen']}"]
    for fact, value in address.items():
        if fact == "prefixlen" and address["family"] == "inet":
            value = str(ip_network(f"0.0.0.0/{value}").netmask)
        if fact not in ("local", "family") and value != FOR_EVER:
            yield names, f"address {fact}", value


def network_of(route):
    is_ipv6 = ":" in route["dst"] + route.get("gateway", "")
    return ip_network(route["dst"] if route["dst"] != "default" else "::/0" if is_ipv6 else "0.0.0.0/0")


def facts_of_routes(routes):
    for route in routes:
        network = network_of(route)
        words = ["route", str(network)]
        for word, fact in (("via", "gateway"), ("dev", "dev"), ("metric", "metric")):
            words += [word, str(route[fact])] if route.get(fact) else []
        names = [" ".join(words)]
        yield names, "dst", network.network_address
        yield names, "dst length", network.prefixlen if network.version == 6 else network.netmask
        for fact, value in route.items():
            if fact != "dst":
                yield from ((names, f"route {fact}", part) for part in listed(value))


def facts_of_resolvers(text):
    for line in text.splitlines():
        fact, *values = line.split()
        for value in values:
            yield ["resolv.conf"], fact, value
            if fact == "nameserver":
                yield [f"resolver {value}"], fact, value


NO_VALUE = ("", "Not reported", "Unknown!", "Unknown! (255)")
WORDS = {"yes": "True", "no": "False", "on": "True", "off": "False", "Full": "True", "Half": "False"}


def value_of(fact, text):
    """The value in zep's units and form."""
    if fact == "Speed":
        return int(text.removesuffix("Mb/s")) * 1000000
    return WORDS.get(text, text.strip("[] "))


def facts_of_ethtool(port, text):
    """Of any of its outputs: lines "Fact: value", where the value may continue on the next lines."""
    fact, names = "", [port]
    for line in text.splitlines():
        if match := re.match(r"\s*([^:]+): ?(.*)", line):
            fact, line = match[1], match[2]
        if fact.endswith("link modes"):
            values = line.split()
            if line.strip() in NO_VALUE:
                continue
        else:
            values = [line.strip()]
        for value in values:
            if value not in NO_VALUE and not fact.startswith("Settings for"):
                yield names, fact, value_of(fact, value)
                names += [value] if fact == "driver" else []
