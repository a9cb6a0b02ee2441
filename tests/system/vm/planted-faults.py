# SPDX-License-Identifier: Apache-2.0
"""Checks zep's findings in a virtual machine that was healthy, had faults, and was mended (planted-faults.sh).

planted-faults.py DIRECTORY    DIRECTORY has healthy.json, faults.json and mended.json
"""
import json
import pathlib
import sys

# Of each problem of the faults: the rule, the severity, and parts of the reason and of the remedy.
FAULTS = [
    ("array-degraded", "critical", "md0", "mdadm"),
    ("disk-errors", "warning", "sda, which has vanished since", "unless it was removed on purpose"),
    ("file-system-full", "error", "/data is full", "Delete"),
    ("bond-member", "error", "bond0 lacks its member eth0", "cable"),
    ("out-of-memory", "warning", "killed the process tail", "MemoryMax"),
    ("disk-errors", "error", "dm-", "smartctl"),
    ("hardware-errors", "information", "corrected error of the processor", "Watch"),
    ("sensor-threshold", "warning", "Upper Non-Critical", "air flow"),
    ("clock-synchronized", "warning", "not synchronised", "time service"),
]


def findings(directory, name):
    return json.loads((directory / f"{name}.json").read_text())["findings"]


def without_fault(directory, name):
    """The problems of a machine that has none, and the rules about the faults that could not be asked."""
    document = findings(directory, name)
    outcomes = {rule["id"]: rule["outcome"] for rule in document["rules"]}
    return [f"{name}: {describe(each)}" for each in document["problems"]] + [
        f"{name}: {rule} is {outcomes[rule]}" for rule, *_ in FAULTS if outcomes[rule] != "fine"]


def matches(fault, problem):
    rule, severity, reason, remedy = fault
    return (problem["rule"], problem["severity"]) == (rule, severity) and (
        reason in problem["reason"] and remedy in problem["remedy"])


def differences(found):
    """The faults that were not found exactly once, and the problems that are of none of them."""
    counts = [(fault, sum(matches(fault, each) for each in found)) for fault in FAULTS]
    return [f"faults: found {count} times: {fault}" for fault, count in counts if count != 1] + [
        f"faults: unexpected {describe(each)}" for each in found if not any(matches(fault, each) for fault in FAULTS)]


def describe(problem):
    return f"{problem['rule']} {problem['severity']}: {problem['reason']} [{problem['remedy']}]"


def main():
    directory = pathlib.Path(sys.argv[1])
    found = findings(directory, "faults")["problems"]
    failures = without_fault(directory, "healthy") + differences(found) + without_fault(directory, "mended")
    for each in found:
        print(describe(each))
    print("\n".join(failures) or f"{len(FAULTS)} problems found and mended")
    sys.exit(1 if failures else 0)


main()
