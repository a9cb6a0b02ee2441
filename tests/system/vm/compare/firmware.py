# SPDX-License-Identifier: Apache-2.0
"""The facts of dmidecode and of lshw about boards, processors, memory and firmware, which both read from SMBIOS."""
import re

# By SMBIOS type, the names of the objects that a structure describes. {n} is its number among those of its type. Zep states the
# error correction of an array for each of its modules.
OBJECTS = {
    0: ["BIOS {n}"],
    1: ["{system}", "Boot"],
    2: ["Board {n}"],
    3: ["Chassis {n}"],
    4: ["Processor {n}"],
    7: ["L{level} {socket} cache"],
    9: ["Slot {n}"],
    11: ["{system}"],
    12: ["{system}"],
    16: ["Memory array {n}", "Memory device 0"],
    17: ["Memory device {n}"],
    32: ["Boot"],
    38: ["IPMI interface {n}"],
    19: ["Main memory"],
    41: ["Onboard device {n}"],
    43: ["tpm{n}"],
}

NO_VALUE = ("Not Specified", "Not Provided", "Unspecified", "Unknown", "None", "Not Settable", "No", "",
            "BIOS characteristics not supported")
SIZES = {"bytes": 1, "kB": 1 << 10, "MB": 1 << 20, "GB": 1 << 30, "TB": 1 << 40}


def structures(text):
    """Each structure: its handle, its type, and its pairs of a name and a value. A list gives several pairs of one name."""
    for block in text.split("\n\n"):
        head = re.match(r"Handle 0x([0-9A-F]+), DMI type (\d+)", block)
        if not head:
            continue
        pairs = []
        for line in block.splitlines()[2:]:
            if line.startswith("\t\t"):
                pairs.append((pairs[-1][0], line.strip()))
            else:
                name, _, value = line.strip().partition(":")
                pairs.append((name, value.strip()))
        yield head[1], int(head[2]), pairs


def value_of(kind, fact, text):
    """The value in zep's units and form."""
    if match := re.fullmatch(r"(\d+) (bytes|[kMGT]B)", text):
        size = int(match[1]) * SIZES[match[2]]
        return size >> 10 if (kind, fact) == (16, "Maximum Capacity") else size
    if match := re.fullmatch(r"(\d+(?:\.\d+)?) V", text):
        return round(float(match[1]) * 1000)
    if match := re.fullmatch(r"(\d+) (?:MHz|MT/s|bits)", text):
        return match[1]
    if match := re.fullmatch(r"(\d+) U", text):
        return int(match[1]) * 1.75
    if match := re.fullmatch(r"(\d\d)/(\d\d)/(\d{4})", text):
        return f"{match[3]}{match[1]}{match[2]}000000.000000+000"
    if match := re.fullmatch(r"0x([0-9A-F]+)(?: \(.*\))?", text):
        return int(match[1], 16)
    if fact == "ID" and kind == 4:
        return text.replace(" ", "")
    return text if fact == "Type Detail" else re.sub(r" \(.*\)$", "", text)


def objects_of(text, system):
    """By handle: the type of each structure of a type that is compared, and the names of its objects."""
    numbers, caches, objects = {}, {}, {}
    for handle, kind, pairs in structures(text):
        if kind in OBJECTS and not is_empty(kind, dict(pairs)):
            number = numbers[kind] = numbers.get(kind, -1) + 1
            level = re.findall(r"Level (\d)", dict(pairs).get("Configuration", "")) or ["?"]
            caches[level[0]] = caches.get(level[0], -1) + 1
            names = [name.format(n=number, system=system, level=level[0], socket=caches[level[0]]) for name in OBJECTS[kind]]
            objects[handle] = kind, names
    return objects


def is_empty(kind, values):
    """Whether the structure describes a socket or memory slot without anything in it."""
    if kind == 17:
        return values.get("Size") == "No Module Installed"
    return kind == 4 and not values.get("Status", "").startswith("Populated")


def facts_of_dmidecode(text, system):
    objects = objects_of(text, system)
    for handle, kind, pairs in structures(text):
        if handle not in objects:
            continue
        for fact, value in pairs:
            for part in parts_of(kind, fact, value):
                if part not in NO_VALUE:
                    yield objects[handle][1], f"{kind} {fact}", value_of(kind, fact, part)


def parts_of(kind, fact, value):
    """The facts in a value that lists several."""
    if (kind, fact) in ((4, "Status"), (7, "Configuration")):
        return value.split(", ")
    if (kind, fact) == (17, "Type Detail"):
        return re.findall(r"\S+(?: \([^)]*\))?", value)
    if (kind, fact) == (17, "Memory Operating Mode Capability"):
        return re.findall(r"(?:Volatile|\S+ persistent) memory", value)
    return [value]


def facts_of_lshw_firmware(node, dmidecode, system):
    """The nodes of lshw with an SMBIOS handle, and that of the firmware, which has none."""
    objects = objects_of(dmidecode, system)
    handle = node.get("handle", "").removeprefix("DMI:")
    kind, names = (0, ["BIOS 0"]) if node["id"] == "firmware" else objects.get(handle, (None, []))
    if names:
        for fact in ("description", "product", "vendor", "version", "serial", "slot", "size", "capacity", "width", "clock", "date"):
            yield names, f"{kind} {fact}", lshw_value(kind, fact, node.get(fact))
        for fact, value in node.get("configuration", {}).items():
            yield names, f"{kind} configuration.{fact}", value
        for fact in node.get("capabilities", {}):
            yield names, f"{kind} capabilities.{fact}", fact
    for child in node.get("children", []):
        yield from facts_of_lshw_firmware(child, dmidecode, system)


def lshw_value(kind, fact, value):
    if value is None:
        return None
    if fact == "date":
        return value_of(kind, fact, value)
    if fact == "clock" or (kind == 4 and fact in ("size", "capacity")):
        return value // 1000000
    return value >> 10 if (kind, fact) == (16, "capacity") else value
