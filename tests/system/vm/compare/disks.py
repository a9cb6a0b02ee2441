# SPDX-License-Identifier: Apache-2.0
"""The facts of smartctl and mdadm."""
import re

# About the run of smartctl itself.
OF_THE_RUN = ("json_format_version", "smartctl", "local_time", "drive_database_version", "in_smartctl_database", "device")


def leaves(value, path=()):
    """The values of nested objects and lists, each with the names that lead to it. Numbers of list elements are left out."""
    if isinstance(value, dict):
        for name, part in value.items():
            yield from leaves(part, (*path, name))
    elif isinstance(value, list):
        for part in value:
            yield from leaves(part, path)
    else:
        yield ".".join(path), value


def facts_of_smartctl(disk, document):
    table = document.get("ata_smart_attributes", {}).pop("table", [])
    for fact, value in leaves({name: part for name, part in document.items() if name not in OF_THE_RUN}):
        yield [disk], fact, value
    for attribute in table:
        for fact, value in leaves(attribute):
            yield [f"ZEP:smart:{disk}:{attribute['id']}"], f"attribute.{fact}", value


def facts_of_mdadm(array, text):
    """Of --detail: lines "Fact : value", then a table of the members."""
    for line in text.splitlines():
        if match := re.match(r"\s*([^:]+) : (.*)", line):
            fact, value = match.groups()
            if fact.endswith("Size"):
                value = int(value.split()[0]) * 1024
            if fact == "Used Dev Size":
                continue
            for part in str(value).split(", "):
                yield [array], fact, part.split("  (")[0]
        elif match := re.match(r"\s*(?:\d+|-) +\d+ +\d+ +(\d+|-) +(.*?) +/dev/(\w+)$", line):
            slot, states, member = match.groups()
            names = [f"ZEP:raid:{array}:{member}"]
            yield names, "member slot", None if slot == "-" else slot
            yield names, "member state", {"active sync": "in_sync"}.get(states, states)


def facts_of_mdadm_export(array, text):
    for line in text.splitlines():
        fact, _, value = line.partition("=")
        names = [array]
        if match := re.fullmatch(r"MD_DEVICE_dev_(\w+)_(ROLE|DEV)", fact):
            names, fact, value = [f"ZEP:raid:{array}:{match[1]}"], match[2], value.removeprefix("/dev/")
        yield names, fact, value


def missing_while_suspended(before, after):
    """The instances of storage that zep omits while a disk does not answer, and the state of that disk if it is omitted.

    A reason may be omitted: a slow machine can have kept a tool from answering in time before, and not now."""
    described = {instance["path"] for instance in after["instances"]}
    for instance in before["instances"]:
        if instance["provider"] == "Storage" and instance["class"] != "ZEP_MissingValue" and instance["path"] not in described:
            yield f"zep: {instance['path']} is missing while a disk does not answer"
    states = [instance["properties"]["StatusDescriptions"]["value"] for instance in after["instances"]
              if instance["class"] == "CIM_StorageVolume"]
    if ["suspended"] not in states:
        yield "zep: the disk that does not answer is not described as suspended"
