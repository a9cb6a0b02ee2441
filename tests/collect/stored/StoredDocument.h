// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20 {

// A small document of `zep report --json`, with two memory modules, one of them of unknown size.
inline std::string StoredDocument() {
  return R"({
"document": "zep report", "version": 2, "zep": "1.0.0", "sample": false, "exitStatus": 0, "reason": null,
"status": "complete", "time": "2026-11-23T04:05:06Z", "head": ["db1: Server Q100", "Operating system: Debian 12"],
"smbiosTableFile": null,
"findings": {"worst": "error",
  "problems": [{"rule": "disk-failing", "severity": "error", "reason": "the disk sda is failing", "remedy": "Replace it.",
    "instance": "root/x:X_Disk.Name=\"sda\"", "source": "SMART"}],
  "rules": [{"id": "disk-failing", "question": "Is a disk failing?", "outcome": "wrong", "examined": 1,
    "notExamined": [{"instance": null, "reason": "needs root"}]}],
  "thresholds": {}},
"identity": {"hostName": {"label": "Host name", "value": "db1", "source": "kernel"},
  "serialNumber": {"label": "Serial number", "value": null, "source": null, "code": "needs-root", "reason": "needs root"}},
"details": {"memory": {"label": "Memory", "value": "16 GiB", "source": "SMBIOS"}},
"sections": [{"key": "memory", "title": "Memory modules", "columns": ["Slot", "Size"],
  "rows": [["DIMM 1", "16 GiB"], ["DIMM 2", {"code": "not-given", "reason": "the firmware gives none"}]], "whyEmpty": null}],
"plugInDirectory": "/usr/lib/zepcore",
"plugIns": [
  {"name": "Host", "file": "/usr/lib/zepcore/libHost.nsp.so", "milliseconds": 1.5, "error": null, "stage": null,
    "lastLogLine": null, "words": null, "providers": [{"name": "Host", "namespace": "root/x", "milliseconds": 0.5,
    "error": null, "stage": null, "lastLogLine": null}]},
  {"name": "Disks", "file": "/usr/lib/zepcore/libDisks.nsp.so", "milliseconds": 2, "error": "no disk", "stage": "open",
    "lastLogLine": null, "words": null, "providers": []}],
"instances": [
  {"path": "root/x:CIM_PhysicalMemory.Tag=\"1\"", "provider": "Host", "namespace": "root/x", "class": "CIM_PhysicalMemory",
    "properties": {"Tag": {"type": "string", "value": "1", "key": true, "source": "SMBIOS"},
      "ElementName": {"type": "string", "value": "DIMM 1", "source": "SMBIOS"},
      "Capacity": {"type": "uint64", "value": "17179869184", "unit": "byte", "source": "SMBIOS"},
      "MemoryType": {"type": "uint16", "value": 26, "words": "DDR4", "source": "SMBIOS"},
      "States": {"type": "uint16[]", "value": [2, 9], "words": ["OK", null], "source": "SMBIOS"},
      "Removable": {"type": "boolean", "value": true, "source": "SMBIOS"},
      "Voltage": {"type": "real32", "value": 1.25, "source": "SMBIOS"}}},
  {"path": "root/x:CIM_PhysicalMemory.Tag=\"2\"", "provider": "Host", "namespace": "root/x", "class": "CIM_PhysicalMemory",
    "properties": {"Tag": {"type": "string", "value": "2", "key": true, "source": "SMBIOS"},
      "ElementName": {"type": "string", "value": "DIMM 2", "source": "SMBIOS"},
      "Capacity": {"type": "uint64", "value": null, "source": "SMBIOS", "code": "not-given", "reason": "the firmware gives none"}}},
  {"path": "root/x:CIM_Realizes.A=\"1\"", "provider": "Host", "namespace": "root/x", "class": "CIM_Realizes",
    "properties": {"A": {"type": "reference", "value": "x", "key": true, "source": "Host"}}}]
})";
}

inline std::string WithReplaced(std::string text, std::string const& from, std::string const& to) {
  for (std::size_t at = 0; (at = text.find(from, at)) != text.npos; at += to.size()) text.replace(at, from.size(), to);
  return text;
}

// The document with every occurrence of `from` replaced.
inline std::string StoredDocumentWith(std::string const& from, std::string const& to) {
  return WithReplaced(StoredDocument(), from, to);
}

// The same of a run in which no plug-in failed.
inline std::string HealthyDocument() { return StoredDocumentWith("\"no disk\", \"stage\": \"open\"", "null, \"stage\": null"); }
inline std::string HealthyDocumentWith(std::string const& from, std::string const& to) {
  return WithReplaced(HealthyDocument(), from, to);
}

}  // namespace NQRVZEP20
