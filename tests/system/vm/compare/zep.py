# SPDX-License-Identifier: Apache-2.0
"""The document of zep, by the names of the objects that it describes."""
import re
from collections import Counter

from compare.subjects import subject_of_instance


def normalised(value):
    """Texts without case, outer blanks, colons of MAC addresses and the prefix of hexadecimal numbers."""
    text = str(value).strip().lower()
    if re.fullmatch(r"([0-9a-f]{2}:)+[0-9a-f]{2}", text):
        text = text.replace(":", "")
    return text[2:] if text.startswith("0x") else text


def listed(value):
    return value if isinstance(value, list) else [value]


class Zep:
    """The values of all instances, by the names that their keys contain."""

    def __init__(self, document):
        self.values = {}
        self.properties = {}  # the same by name and property
        self.counts = Counter()  # by subject
        for instance in document["instances"]:
            if instance["class"] != "ZEP_MissingValue":
                self.add(subject_of_instance(instance), instance["properties"])
        self.system = next(instance["properties"]["Name"]["value"] for instance in document["instances"]
                           if instance["class"] == "QRVSG_ComputerSystem")

    def add(self, subject, properties):
        names, values, by_property = set(), self.sizes(properties), {}
        for name, entry in properties.items():
            found = [value for value in listed(entry["value"]) + listed(entry.get("words")) if value is not None]
            self.counts[subject] += bool(found) and not entry.get("key", False)
            for value in found:
                values.add(normalised(value))
                by_property.setdefault(name, set()).add(normalised(value))
                if entry.get("key") and name not in ("SystemName", "SystemCreationClassName", "CreationClassName"):
                    words = [str(value), *re.split(r'[ /"]|(?<!\d):', str(value)), *re.findall(r'"([^"]+)"', str(value))]
                    names.update(words)
                    values.update(normalised(word) for word in words)
        for name in names:
            self.values.setdefault(name, set()).update(values)
            for property_name, found in by_property.items():
                self.properties.setdefault((name, property_name), set()).update(found)

    @staticmethod
    def sizes(properties):
        """The sizes in bytes that are described as a number of blocks."""
        block, number = (properties.get(name, {}).get("value") for name in ("BlockSize", "NumberOfBlocks"))
        return {str(int(block) * int(number))} if block and number else set()

    def describes(self, names, value, properties=()):
        """Whether an instance with one of these names has the value, in one of these properties if any are named."""
        if properties:
            places = [self.properties.get((name, key), ()) for name in names for key in properties]
        else:
            places = [self.values.get(name, ()) for name in names]
        return any(normalised(value) in place for place in places)
