# SPDX-License-Identifier: Apache-2.0
"""The facts of ip and ethtool."""
import re


def facts_of_ip(links):
    for link in links:
        name = [link["ifname"]]
        for fact, value in link.items():
            if isinstance(value, (str, int)) and not isinstance(value, bool):
                yield name, fact, value
        for flag in link["flags"]:
            yield name, "flags", flag
        for address in link["addr_info"]:
            yield name, "local", address["local"]
            if address["family"] == "inet6":
                yield name, "prefixlen", address["prefixlen"]
            yield name, "scope", address["scope"]


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
