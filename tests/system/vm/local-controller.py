# SPDX-License-Identifier: Apache-2.0
"""The controller of a virtual machine, its content and the comparison (local-controller.sh).

local-controller.py make SENSORS DIRECTORY    writes DIRECTORY/sdr with the records of SENSORS (sim/sensors.emu), and DIRECTORY/fru
local-controller.py compare DIRECTORY         compares zep's documents in DIRECTORY with the texts of ipmitool there
"""
import json
import pathlib
import re
import sys

UNITS = {"degrees C": 2, "RPM": 19, "Volts": 5}
THRESHOLDS = {"Lower non-recoverable": "LowerThresholdFatal", "Lower critical": "LowerThresholdCritical",
              "Lower non-critical": "LowerThresholdNonCritical", "Upper non-critical": "UpperThresholdNonCritical",
              "Upper critical": "UpperThresholdCritical", "Upper non-recoverable": "UpperThresholdFatal"}
FRU = {"chassis": {"Chassis Part Number": "PartNumber", "Chassis Serial": "SerialNumber", "Chassis Extra": "OtherIdentifyingInfo"},
       "board": {"Board Mfg": "Manufacturer", "Board Product": "Model", "Board Serial": "SerialNumber",
                 "Board Part Number": "PartNumber"},
       "product": {"Product Manufacturer": "Manufacturer", "Product Name": "Model", "Product Part Number": "PartNumber",
                   "Product Version": "Version", "Product Serial": "SerialNumber", "Product Asset Tag": "UserTracking"}}
# The documents, and the rules that must find a problem in them. Without a clock, the age of events is unknown.
FAULTS = {"healthy": [], "compared": ["event-log-critical"], "faults": ["event-log-full", "controller-clock"], "mended": []}
REMEDIES = {"event-log-critical": "sel clear", "event-log-full": "sel save", "controller-clock": "sel time set"}
USUAL = {"controller-account": "not-asked"}  # QEMU's controller has no accounts
RULES = [*REMEDIES, "sensor-threshold", "fan-stopped", "controller-part-failed", "controller-account"]


# ---- The content of the controller ----

def compact_record(number, kind, reading_type):
    """QEMU has only those sensors that a compact record describes; zep reads the record before it."""
    body = bytes([0x20, 0, number, 10, 1, 0x7F, 0x68, kind, reading_type, 0xFF, 0x7F, 0xFF, 0x7F, 0xFF, 0x7F])
    body += bytes(11) + b"\xC5again"
    return bytes([0, 0, 0x51, 2, len(body)]) + body


def sensor_records(path):
    lines = [line.split()[2:] for line in path.read_text().splitlines() if line.startswith("main_sdr_add")]
    records = [bytearray(int(byte, 16) for byte in line) for line in lines]
    for number, record in enumerate(records, 1):
        record[7] = number  # QEMU has twenty sensors
    full = [record for record in records if record[3] == 1]
    return b"".join(records) + b"".join(compact_record(record[7], record[12], record[13]) for record in full)


def area(head, fields):
    content = bytearray(b"\x01\x00" + head + b"".join(bytes([0xC0 | len(field)]) + field for field in fields) + b"\xC1")
    content += bytes(-(len(content) + 1) % 8)
    content[1] = (len(content) + 1) // 8
    return bytes(content) + bytes([-sum(content) & 255])


def fru():
    areas = [area(b"\x17", [b"PN-1", b"CH123", b"rail kit"]),
             area(bytes([25, 0xA0, 0xAC, 0xD0]), [b"Maker", b"Board 7", b"BS 9", b"BP-2", b"file 3"]),
             area(bytes([25]), [b"Maker", b"Server Q100", b"1234AB7", b"v2", b"KQ12345", b"asset 5", b""])]
    head = bytearray([1, 0])
    for index in range(3):
        head.append(1 + sum(len(each) for each in areas[:index]) // 8)
    head += bytes(2)
    return bytes(head) + bytes([-sum(head) & 255]) + b"".join(areas)


def make(sensors, directory):
    (directory / "sdr").write_bytes(sensor_records(sensors))
    (directory / "fru").write_bytes(fru())


# ---- The comparison ----

class Comparison:
    def __init__(self, directory):
        self.directory = directory
        self.document = json.loads((directory / "compared.json").read_text())
        self.compared, self.failures = 0, []

    def text(self, name):
        return (self.directory / f"{name}.txt").read_text()

    def value_of(self, instance, name):
        return instance.get(name, {}).get("value")

    def instance(self, class_name, name, value):
        for each in self.document["instances"]:
            if each["class"] == class_name and self.value_of(each["properties"], name) == value:
                return each["properties"]
        self.failures.append(f"zep has no {class_name} with {name} {value}")
        return {}

    def expect(self, what, theirs, ours):
        self.compared += 1
        if theirs != ours:
            self.failures.append(f"{what}: ipmitool {theirs!r}, zep {ours!r}")

    def number(self, sensor, name):
        value, power = self.value_of(sensor, name), self.value_of(sensor, "UnitModifier")
        return None if value is None else round(value * 10 ** power, 6)


def fields_of(text):
    """The lines "name : value"."""
    pairs = (line.split(":", 1) for line in text.splitlines() if ":" in line)
    return {name.strip(): value.strip() for name, value in pairs}


def compare_sensors(run):
    for block in run.text("sdr").split("\n\n"):
        fields = fields_of(block)
        name = fields.get("Sensor ID", "").split(" (")[0]
        if not name or name == "again":
            continue
        if "Sensor Type (Discrete)" in fields:
            sensor = run.instance("CIM_Sensor", "ElementName", name)
            run.expect(f"{name} state", fields["Sensor Reading"], "0h" if run.value_of(sensor, "CurrentState") == "none" else "?")
            run.expect(f"{name} type", fields["Sensor Type (Discrete)"].split(" (")[0],
                       run.value_of(sensor, "OtherSensorTypeDescription"))
            continue
        sensor = run.instance("CIM_NumericSensor", "ElementName", name)
        reading, unit = re.fullmatch(r"(\S+) \(\+/- \S+\) (.*)", fields["Sensor Reading"]).groups()
        run.expect(f"{name} reading", float(reading), run.number(sensor, "CurrentReading"))
        run.expect(f"{name} unit", UNITS[unit], run.value_of(sensor, "BaseUnits"))
        run.expect(f"{name} state", fields["Status"], {"Normal": "ok"}.get(run.value_of(sensor, "CurrentState")))
        for theirs, ours in THRESHOLDS.items():
            limit = fields.get(theirs)
            run.expect(f"{name} {ours}", None if limit is None else float(limit), run.number(sensor, ours))


def compare_events(run):
    for row in run.text("sel").splitlines():
        number, day, time, sensor, words, direction, *_ = (cell.strip() for cell in row.split("|"))
        entry = run.instance("ZEP_EventLogEntry", "RecordID", str(int(number, 16)))
        month, date, year = day.split("/")
        stamp = run.value_of(entry, "MessageTimestamp") or ""
        run.expect(f"event {number} time", f"20{year}{month}{date}" + time.split()[0].replace(":", ""), stamp[:14])
        label = (run.value_of(entry, "ElementName") or "").replace("sensor 0x", "#0x")
        run.expect(f"event {number} sensor", sensor, f"{run.value_of(entry, 'SensorTypeName')} {label}")
        text = run.value_of(entry, "RecordData") or ""
        run.expect(f"event {number} text", True, words.replace(" going", " - going") in text and direction.lower() in text)


def compare_parts(run):
    mc, parts = fields_of(run.text("mc")), fields_of(run.text("fru"))
    controller = run.instance("ZEP_ManagementController", "ElementName", "management controller")
    for theirs, ours in {"Device ID": "DeviceNumber", "Device Revision": "DeviceRevision", "Firmware Revision": "FirmwareVersion",
                         "IPMI Version": "IPMIVersion", "Manufacturer ID": "ManufacturerID"}.items():
        run.expect(theirs, mc[theirs], str(run.value_of(controller, ours)))
    run.expect("Product ID", mc["Product ID"].split()[0], str(run.value_of(controller, "ProductID")))
    for kind, names in FRU.items():
        package = run.instance("CIM_PhysicalPackage", "ElementName", f"FRU 0 {kind}")
        for theirs, ours in names.items():
            run.expect(theirs, parts[theirs], run.value_of(package, ours))


# ---- The findings ----

def check_findings(run):
    for name, faults in FAULTS.items():
        findings = json.loads((run.directory / f"{name}.json").read_text())["findings"]
        outcomes = {rule["id"]: rule["outcome"] for rule in findings["rules"]}
        for rule in RULES:
            run.expect(f"{name}: {rule}", "wrong" if rule in faults else USUAL.get(rule, "fine"), outcomes[rule])
        if not faults:
            run.expect(f"{name}: problems", [], [each["reason"] for each in findings["problems"]])
        for problem in findings["problems"]:
            if problem["rule"] in faults:
                print(f"{name}: {problem['rule']} {problem['severity']}: {problem['reason']} [{problem['remedy']}]")
                run.expect(f"remedy of {problem['rule']}", True, REMEDIES[problem["rule"]] in problem["remedy"])


def compare(directory):
    run = Comparison(directory)
    compare_sensors(run)
    compare_events(run)
    compare_parts(run)
    check_findings(run)
    print("\n".join(run.failures) or f"{run.compared} values agree")
    sys.exit(1 if run.failures or run.compared < 80 else 0)


if sys.argv[1] == "make":
    make(pathlib.Path(sys.argv[2]), pathlib.Path(sys.argv[3]))
else:
    compare(pathlib.Path(sys.argv[2]))
