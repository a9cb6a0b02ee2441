# SPDX-License-Identifier: Apache-2.0
"""The facts of other tools that zep does not describe, or describes otherwise, each with the reason."""
import re

# By tool, fact and object; the last two are regular expressions.
REASONS = {
    ("lspci", "SVendor", r"0000:00:(00|1f)\.\d"): "the name of a subsystem includes its vendor where the list of identifiers "
    "has one",
    ("lsblk", "size", r"fd0"): "the kernel reports 4 KiB for a floppy drive without a disk",
    ("lsblk", "state", r"dm-\d"): "lsblk calls an active map running",
    ("lsblk", "group", r".*"): "who may open the node is not a fact of the device",
    ("lsblk", "owner", r".*"): "who may open the node is not a fact of the device",
    ("lsblk", "mode", r".*"): "who may open the node is not a fact of the device",
    ("lsblk", "subsystems", r".*"): "associations lead to the controller and its bus",
    ("lsblk", "fsuse%", r"dm-0|md0|nvme0n1p2|sdc1"): "it follows from the size and the free space",
    ("lsblk", "fsused", r"dm-0|md0"): "it follows from the size and the free space",
    ("lsblk", "parttypename", r"(nvme0n1p|sd[a-z]|vda|mmcblk0p)\d"): "the type itself is described; its name is lsblk's",
    ("lsblk", "vendor", r"sda\d?|vda\d?"): "lsblk gives the bus of a SATA disk and the number of the vendor of a virtio disk",
    ("lsblk", "path", r"dm-\d"): "the node of a map below /dev/mapper bears the name of the map, which is described",
    ("lsblk", "tran", r"sdb|sr0"): "the schema calls the bus of parallel SCSI by another name",
    ("lshw", "product", r"input\d+|nvme0"): "lshw puts the maker in front of the product of a USB device, and describes input "
    "devices",
    ("lshw", "vendor", r"sd[a-z]\d?|nvme0n1p\d|mmcblk0"): "lshw gives the program that made the file system, or the number of "
    "a maker",
    ("lshw", "size", r"sd[a-z]\d?|nvme0n1p\d"): "lshw gives the size of the file system that its own probe computes",
    ("lshw", "capacity", r"(nvme0n1p|vda)\d"): "lshw gives one block less than the partition has",
    ("lshw", "serial", r"mmcblk0|nvme0"): "lshw prints the number of an SD card in decimal digits",
    ("lshw", "configuration.speed", r"eth1|input\d+|scsi\d+|usb\d+"): "lshw shortens the number",
    ("lshw", "configuration.ansiversion", r"cdrom|sd[bc]"): "the version of the command set is not described",
    ("lshw", "configuration.filesystem", r"nvme0n1p2|sdb|sdc1"): "lshw's own name for the type",
    ("lshw", "configuration.state", r"nvme0|(nvme0n1p|sd[a-z])\d"): "lshw's own word for what the mounts and the type say",
    ("lshw", "configuration.status", r"cdrom"): "lshw's own word: whether a drive has a medium",
    ("lshw", "configuration.mount.options", r"nvme0n1p2|sdc1"): "the options of the mount and of the file system are two "
    "properties",
    ("lshw", "configuration.created", r"sda2"): "times inside the file system are not described",
    ("lshw", "configuration.modified", r"sda2"): "times inside the file system are not described",
    ("lshw", "configuration.nqn", r"nvme0"): "described for the disk of the controller",
    ("lshw", "configuration.wwid", r"nvme0n1"): "it is described without the prefix nvme.",
    ("lshw", "configuration.autonegotiation", r"eth\d"): "lshw's word for AutoSense",
    ("lshw", "configuration.duplex", r"eth1"): "lshw's word for FullDuplex",
    ("lshw", "configuration.driverversion", r"eth\d"): "the version of the kernel, for a driver that is part of it",
    ("lshw", "configuration.broadcast", r"eth\d"): "lshw's word for a flag of the interface",
    ("lshw", "configuration.multicast", r"eth\d"): "lshw's word for a flag of the interface",
    ("lshw", "configuration.link", r"eth\d"): "lshw's word for the operational status",
    ("lshw", "configuration.slave", r"eth\d"): "lshw's word for membership in a bond",
    ("ip", "tso_max_size", r".*"): "limits of segmentation offload are not described",
    ("ip", "tso_max_segs", r"eth1|lo"): "limits of segmentation offload are not described",
    ("ip", "gso_max_size", r".*"): "limits of segmentation offload are not described",
    ("ip", "gso_max_segs", r"eth1|lo"): "limits of segmentation offload are not described",
    ("ip", "gro_max_size", r".*"): "limits of segmentation offload are not described",
    ("ip", "address", r"lo"): "an address of zeros is a missing value with a reason",
    ("ip", "broadcast", r"lo"): "an address of zeros is a missing value with a reason",
    ("ip", "parentbus", r"eth\d"): "the device is described with its bus",
    ("lshw", "1 product", r".*"): "lshw appends the SKU number, which is described by itself",
    ("lshw", "1 description", r".*"): "it is the type of the chassis, which is described there",
    ("lshw", "1 configuration.chassis", r".*"): "lshw's word for the type of the chassis",
    ("lshw", "1 configuration.boot", r".*"): "lshw's word for the boot status",
    ("lshw", "0 size", r"BIOS 0"): "the part of the first megabyte that the firmware uses follows from its two addresses",
    ("lshw", "4 description", r"Processor \d"): "it is the class",
    ("lshw", "4 configuration.microcode", r"Processor \d"): "the version is described in hexadecimal digits, as the kernel "
    "writes it",
    ("lshw", "4 vendor", r"Processor \d"): "the vendor is described as the kernel writes it, AuthenticAMD",
    ("lshw", "4 version", r"Processor \d"): "family, model and stepping are described by themselves",
    ("lshw", "4 size", r"Processor \d"): "the frequency that the kernel measures is described, not that of the firmware",
    ("lshw", r"7 \w+.*", r"L\d \d cache"): "the caches are those of the kernel, with their true sizes and sharing",
    ("lshw", "16 description", r"Memory array 0"): "the use is part of the name of the array, as a sentence",
    ("lshw", "16 slot", r"Memory array 0"): "the place is part of the name of the array, as a sentence",
    ("lshw", "16 size", r"Memory array 0"): "it is the sum of the modules",
    ("lshw", "16 configuration.errordetection", r"Memory array 0"): "lshw's word for the error correction",
    ("lshw", "17 description", r"Memory device \d"): "form factor, type, details and speed of the module are described by "
    "themselves",
    ("lscpu", "Architecture", r"Processor \d"): "the architecture is that of the operating system, and described there",
    ("lscpu", r"CPU op-mode\(s\)", r"Processor \d"): "DataWidth and the flag lm state it",
    ("lscpu", "Byte Order", r"Processor \d"): "it follows from the architecture",
    ("lscpu", "BogoMIPS", r"Processor \d"): "the length of a delay loop of the kernel, not a speed of the processor",
    ("lscpu", "Virtualization", r"Processor \d"): "the flag svm or vmx states it",
    ("lscpu", "BIOS Model name", r"Processor \d"): "lscpu joins the texts Version and Part Number, which are described by "
    "themselves",
    ("lscpu", r"On-line CPU\(s\) list", r"Processor \d"): "the CPUs are listed for each processor",
    ("lscpu", "Vulnerability mitigation", r"spectre_v2"): "lscpu drops the colons within the kernel's text",
    ("lscpu", "cache", r"L3 [23] cache"): "QEMU numbers a shared cache once for each CPU, and lscpu counts the numbers; the "
    "kernel's lists of the CPUs that share it show two",
    ("smartctl", "nvme_pci_vendor.id", r"nvme0n1"): "described for the PCI device of the controller",
    ("smartctl", "nvme_pci_vendor.subsystem_id", r"nvme0n1"): "described for the PCI device of the controller",
    ("smartctl", "nvme_ieee_oui_identifier", r"nvme0n1"): "a part of the identifiers EUI-64 and NGUID, which are described "
    "where a disk has one",
    ("smartctl", r"nvme_version\..*", r"nvme0n1"): "the version of the command set is not described",
    ("smartctl", "nvme_number_of_namespaces", r"nvme0n1"): "a limit of the controller; each namespace in use is described",
    ("smartctl", "nvme_smart_health_information_log.data_units_(read|written)", r"nvme0n1"): "described in bytes, not in "
    "units of 512,000 bytes",
    ("smartctl", "nvme_smart_health_information_log.host_(reads|writes)", r"nvme0n1"): "the number of bytes is described, not "
    "that of commands",
    ("smartctl", r"wwn\..*", r"sda"): "the parts of the WWN, which is described as one number",
    ("smartctl", r"ata_version\..*", r"sda"): "the version of the command set is not described",
    ("smartctl", r"ata_smart_data.offline_data_collection\..*", r"sda"): "the background scan of the disk's own firmware is "
    "not described; its results are the attributes",
    ("smartctl", r"ata_smart_data.self_test.polling_minutes\..*", r"sda"): "the duration of a test that nobody started",
    ("smartctl", r"ata_smart_data.capabilities\..*", r"sda"): "commands that a disk supports are not described",
    ("smartctl", r"attribute.flags\.(value|string|updated_online|performance|error_rate|event_count|auto_keep)",
     r"ZEP:smart:sda:\d+"): "of the flags of an attribute, only the one that announces a failure is described",
    ("ethtool", "Advertised auto-negotiation", r"eth\d"): "the feature Autoneg states it",
    ("ethtool", "Supports auto-negotiation", r"eth\d"): "the feature Autoneg states it",
    ("ethtool", "(Supported|Advertised) pause frame use", r"eth\d"): "the features Pause and Asym_Pause state it",
    ("ethtool", "Current message level", r"eth1"): "which messages a driver logs is not described",
    ("ethtool", "Link detected", r"eth0"): "ethtool's word for the operational status",
    ("ethtool", "MDI-X", r"eth1"): "the crossing of cable pairs, which ports choose by themselves, is not described",
    ("ethtool", "Supports Wake-on", r"eth1"): "the schema has one value for all kinds of wake-up, WakeOnLan",
    ("ethtool", "Wake-on", r"eth1"): "the schema has one value for all kinds of wake-up, WakeOnLan",
    ("ethtool", "Transceiver", r"eth\d"): "the kernel reports every transceiver as internal since version 4.6",
    ("ethtool", "supports-.*", r"eth0"): "which questions of ethtool a driver answers is not described",
    ("dmidecode", "0 Runtime Size", r"BIOS 0"): "the part of the first megabyte that the firmware uses follows from its two "
    "addresses",
    ("dmidecode", "2 Features", r"Board 0"): "described as the properties HostingBoard and RemovalConditions",
    ("dmidecode", "2 Chassis Handle", r"Board 0"): "an association leads from the chassis to the board",
    ("dmidecode", "3 Lock", r"Chassis 0"): "described as the property LockPresent",
    ("dmidecode", "4 Family", r"Processor \d"): "described as a number: the schema has the numbers of SMBIOS, but no names",
    ("dmidecode", "4 Signature", r"Processor \d"): "dmidecode splits the ID, which is described",
    ("dmidecode", "4 Flags", r"Processor \d"): "the kernel spells the flags in its own way",
    ("dmidecode", "4 Current Speed", r"Processor \d"): "the frequency that the kernel measures is described, not that of the "
    "firmware",
    ("dmidecode", "4 Status", r"Processor \d"): "only filled sockets have an instance, and CPUStatus has the schema's words",
    ("dmidecode", "4 Upgrade", r"Processor \d"): "the schema's list of sockets ends before this one",
    ("dmidecode", r"4 L\d Cache Handle", r"Processor \d"): "associations lead to the caches that the kernel knows",
    ("dmidecode", "4 Characteristics", r"Processor \d"): "the schema's word is NX-bit for Execute Protection, and the number "
    "of cores stands for Multi-Core",
    ("dmidecode", "7 .*", r"L\d \d cache"): "the caches are those of the kernel, with their true sizes and sharing",
    ("dmidecode", "9 Characteristics", r"Slot \d"): "the voltages are described in the schema's words; a shared opening and "
    "PME have no property",
    ("dmidecode", "9 Length", r"Slot \d"): "the schema has the length in inches, which the firmware does not report",
    ("dmidecode", "9 Type", r"Slot \d"): "the width is described by itself, in MaxLinkWidth",
    ("dmidecode", "16 (Location|Use|Number Of Devices)", r"Memory array 0"): "the name of the array states it, as a sentence",
    ("dmidecode", "17 Array Handle", r"Memory device \d"): "the handle has no meaning outside the tables; the error "
    "correction of the array is described for each module",
    ("dmidecode", "38 I2C Slave Address", r"IPMI interface 0"): "described with eight bits, as SMBIOS does, where dmidecode "
    "prints the upper seven",
    ("dmidecode", "38 Register Spacing", r"IPMI interface 0"): "described as a number of bytes",
    ("dmidecode", "41 Status", r"Onboard device \d"): "described as the property IsEnabled",
}


def has_reason(tool, fact, name):
    return any(tool == key[0] and re.fullmatch(key[1], fact) and re.fullmatch(key[2], name) for key in REASONS)
