# SPDX-License-Identifier: Apache-2.0
#
# Runs clang-tidy for scripts/tidy. The sources of a folder are checked together, as one unit that includes them, so that their
# headers are read and checked once for all of them, which takes a tenth of the time. A source whose local names clash with those
# of another one is checked in another unit, or alone; so is one with a finding.
#
#   tidy-units.py BUILD SOURCE...    exit status: 0 if clang-tidy finds nothing, otherwise 1
#
# BUILD is a build tree with compile_commands.json, and lies below the folder of .clang-tidy.

import collections
import concurrent.futures
import json
import os
import shlex
import subprocess
import sys
import tempfile


def flags_of(command, source):
    """The flags in a command of compile_commands.json, without the compiler and the names of files."""
    words = iter(shlex.split(command))
    next(word for word in words if os.path.basename(word).startswith("clang++"))
    flags = []
    for word in words:
        if word == "-o":
            next(words)
        elif word not in ("-c", source):
            flags.append(word)
    return tuple(flags)


def units_of(build, sources):
    """Lists of the sources of one folder that are compiled with the same flags, as (sources, flags); the longest first."""
    with open(os.path.join(build, "compile_commands.json"), encoding="utf-8") as file:
        commands = {entry["file"]: entry["command"] for entry in reversed(json.load(file))}  # of a source's first target
    units = collections.defaultdict(list)
    for source in sources:
        nearest = max(commands, key=lambda other: len(os.path.commonprefix([other, source])))  # itself, if the build has it
        flags = flags_of(commands[nearest], nearest)
        units[os.path.dirname(source), flags].append(source)
    return sorted(((members, flags) for (_, flags), members in units.items()), key=lambda unit: -len(unit[0]))


def clang_tidy(build, sources, flags):
    """Its exit status and output."""
    with tempfile.NamedTemporaryFile("w", suffix=".cpp", dir=build) as unit:
        unit.write("".join(f'#include "{source}"\n' for source in sources))
        unit.flush()
        command = ["clang-tidy", "--quiet", unit.name, "--", *flags, "-ferror-limit=0"]
        done = subprocess.run(command, cwd=build, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True, check=False)
    return done.returncode, done.stdout


def check(build, sources, flags):
    """Checks a unit; in parts if something is found, such as two sources that cannot be compiled together, so that a finding is
    always one of a source alone. The exit status of clang-tidy, and its output."""
    status, output = clang_tidy(build, sources, flags)
    if len(sources) == 1 or status == 0:
        return status, output
    errors = [line for line in output.splitlines() if "[clang-diagnostic-" in line]
    clashing = [source for source in sources if any(line.startswith(source + ":") for line in errors)]
    others = [source for source in sources if source not in clashing]
    parts = [others, clashing] if 0 < len(clashing) <= len(others) else [[source] for source in sources]
    results = [check(build, part, flags) for part in parts]
    return max(status for status, _ in results), "".join(output for _, output in results)


def main():
    build, sources = os.path.abspath(sys.argv[1]), [os.path.abspath(source) for source in sys.argv[2:]]
    worst = 0
    with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
        for status, output in pool.map(lambda unit: check(build, *unit), units_of(build, sources)):
            print(output, end="", flush=True)
            worst = max(worst, status)
    sys.exit(1 if worst else 0)


main()
