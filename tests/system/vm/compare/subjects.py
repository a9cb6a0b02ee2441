# SPDX-License-Identifier: Apache-2.0
"""The subjects of the facts, and the table of their numbers."""
import re

BOARDS, PROCESSORS, MEMORY, STORAGE, NETWORK, DEVICES, FIRMWARE, RUNNING, OTHER = SUBJECTS = (
    "Computer, boards", "Processors", "Memory", "Storage", "Network", "PCI, USB", "Firmware, boot", "Running system", "Other")

OF_TYPES = {0: FIRMWARE, 4: PROCESSORS, 7: PROCESSORS, 16: MEMORY, 17: MEMORY, 19: MEMORY, 32: FIRMWARE, 43: FIRMWARE}
OF_TOOLS = {"lspci": DEVICES, "lsblk": STORAGE, "smartctl": STORAGE, "mdadm": STORAGE, "ip": NETWORK, "ethtool": NETWORK,
            "resolv.conf": NETWORK, "lscpu": PROCESSORS}
OF_LSHW = {"disk": STORAGE, "storage": STORAGE, "volume": STORAGE, "network": NETWORK}
OF_PROVIDERS = {"Storage": STORAGE, "Network": NETWORK, "Devices": DEVICES}
OF_CLASSES = (("Processor|Core|CacheMemory", PROCESSORS), ("Memory|NUMA", MEMORY), ("BIOS|Firmware|Boot|TrustedPlatform", FIRMWARE),
              ("OperatingSystem|RunningState|RunningOS|Product", RUNNING))


def subject_of_fact(tool, fact, kind):
    """The facts of dmidecode, and those of lshw from SMBIOS, begin with the type of the structure; others of lshw have a class."""
    if match := re.match(r"(\d+) ", fact):
        return OF_TYPES.get(int(match[1]), BOARDS)
    return OF_TOOLS[tool] if tool in OF_TOOLS else OF_LSHW.get(kind, DEVICES)


def subject_of_instance(instance):
    if instance["provider"] != "Host":
        return OF_PROVIDERS.get(instance["provider"], OTHER)
    return next((subject for names, subject in OF_CLASSES if re.search(names, instance["class"])), BOARDS)


def table(zep_counts, results):
    """`results`: the number of facts by subject, tool and result."""
    yield "| Subject | Facts of the other tools | described | with a reason | missing | Facts of zep |"
    yield "|---|---|---|---|---|---|"
    for subject in SUBJECTS:
        tools, numbers = {}, {"described": 0, "with a reason": 0, "missing": 0}
        for (one, tool, result), number in results.items():
            if one == subject:
                tools[tool] = tools.get(tool, 0) + number
                numbers[result] += number
        others = ", ".join(f"{tool} {number}" for tool, number in tools.items()) or "–"
        yield f"| {subject} | {others} | " + " | ".join(str(number) for number in (*numbers.values(), zep_counts[subject])) + " |"
