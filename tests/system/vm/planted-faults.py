# SPDX-License-Identifier: Apache-2.0
"""Checks zep's findings in a virtual machine that was healthy, had faults, and was mended (planted-faults.sh).

planted-faults.py DIRECTORY    DIRECTORY has healthy.json, faults.json and mended.json
"""
import json
import pathlib
import sys

# Of each fault: the rule, the severity, and parts of the reason and of the remedy.
FAULTS = [
    ("array-degraded", "critical", "md0", "mdadm"),
    ("file-system-full", "error", "/data", "Delete"),
    ("bond-member", "error", "bond0", "cable"),
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


def describe(problem):
    return f"{problem['rule']} {problem['severity']}: {problem['reason']} [{problem['remedy']}]"


def main():
    directory = pathlib.Path(sys.argv[1])
    failures = without_fault(directory, "healthy") + without_fault(directory, "mended")
    found = findings(directory, "faults")["problems"]
    for rule, severity, reason, remedy in FAULTS:
        matches = [each for each in found if (each["rule"], each["severity"]) == (rule, severity)]
        if not any(reason in each["reason"] and remedy in each["remedy"] for each in matches):
            failures.append(f"faults: no {severity} of {rule} with \"{reason}\" and \"{remedy}\"")
    expected = {rule for rule, *_ in FAULTS}
    failures += [f"faults: unexpected {describe(each)}" for each in found if each["rule"] not in expected]
    for each in found:
        print(describe(each))
    print("\n".join(failures) or f"{len(FAULTS)} faults found and mended")
    sys.exit(1 if failures else 0)


main()
