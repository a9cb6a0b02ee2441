# SPDX-License-Identifier: Apache-2.0
"""The processor time and the memory that zep and lshw needed."""
import re

MOST_BYTES = 50000000

# QEMU translates the programs, which takes longest for those with much code. Beyond this ratio zep itself has become slow.
MOST_TIMES_OF_LSHW = 15


def use_of(times, memory):
    """The seconds of processor time that time -v printed, and the bytes of all processes together."""
    return sum(float(value) for value in re.findall(r"(?:User|System) time \(seconds\): ([\d.]+)", times)), int(memory)


def excess(zep, lshw):
    """The limits that zep exceeded."""
    (seconds, memory), (others_seconds, _) = zep, lshw
    if seconds > MOST_TIMES_OF_LSHW * others_seconds:
        yield f"zep: {seconds:.2f} s of processor time, lshw: {others_seconds:.2f} s"
    if not 0 < memory <= MOST_BYTES:
        yield f"zep: {memory} bytes of memory"
