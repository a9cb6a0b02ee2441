# SPDX-License-Identifier: Apache-2.0
"""The facts of lscpu."""
import re

SIZES = {"B": 1, "KiB": 1 << 10, "MiB": 1 << 20, "GiB": 1 << 30}
COUNTS = {"Socket(s)": "Processor {n}", "NUMA node(s)": "NUMA node {n}"}


def cpu_list(text):
    """The CPUs of a list as the kernel writes it: 0-3,8. lscpu lists each of them in JSON."""
    ranges, cpus = [], sorted(int(cpu) for cpu in text.split(","))
    for cpu in cpus:
        if ranges and ranges[-1][1] == cpu - 1:
            ranges[-1][1] = cpu
        else:
            ranges.append([cpu, cpu])
    return ",".join(str(first) if first == last else f"{first}-{last}" for first, last in ranges)


def weakness_facts(name, text):
    names = [name.lower().replace(" ", "_")]
    state = text.partition(";")[0]
    yield names, "Vulnerability", "Mitigated" if state == "Mitigation" else state
    if ";" in text:
        yield names, "Vulnerability mitigation", text.partition("; ")[2]


def cache_facts(level, text):
    """The total size and the number of the caches of a level, as the size of each cache."""
    number, unit, instances = re.fullmatch(r"([\d.]+) (\w+) \((\d+) instances?\)", text).groups()
    for instance in range(int(instances)):
        yield [f"{level} {instance} cache"], "cache", round(float(number) * SIZES[unit]) // int(instances)


def facts_of_lscpu(document):
    facts = {entry["field"].removesuffix(":"): entry["data"] for entry in document["lscpu"]}
    processors = [f"Processor {number}" for number in range(int(facts["Socket(s)"]))]
    for fact, text in facts.items():
        if fact.startswith("Vulnerability "):
            yield from weakness_facts(fact.removeprefix("Vulnerability "), text)
        elif match := re.fullmatch(r"(L\w+) cache", fact):
            yield from cache_facts(match[1], text)
        elif match := re.fullmatch(r"NUMA node(\d+) CPU\(s\)", fact):
            yield [f"NUMA node {match[1]}"], "NUMA node CPU(s)", cpu_list(text)
        elif fact in COUNTS:
            yield from ((name, fact, name[0]) for name in ([COUNTS[fact].format(n=number)] for number in range(int(text))))
        else:
            for processor in processors:
                for part in text.split() if fact == "Flags" else [text]:
                    yield [processor], fact, part
