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
    ("lsblk", "fsused", r"dm-0|md0|nvme0n1p2|sdc1"): "it follows from the size and the free space",
    ("lsblk", "parttypename", r"(nvme0n1p|sd[a-z]|vda|mmcblk0p)\d"): "the type itself is described; its name is lsblk's",
    ("lsblk", "vendor", r"sda\d?|vda\d?"): "lsblk gives the bus of a SATA disk and the number of the vendor of a virtio disk",
    ("lsblk", "path", r"dm-\d"): "the node of a map below /dev/mapper bears the name of the map, which is described",
    ("lsblk", "tran", r"sdb|sr0"): "the schema calls the bus of parallel SCSI by another name",
    ("lsblk", r"zone-(amax|app|nr|omax|sz|wgran)", r".*"): "0 stands for a disk without zones, whose kind is described",
    ("lsblk", "fsroots", r"dm-0|md0|nvme0n1p2|sdc1"): "described as Directory of the mount",
    ("lsblk", "hotplug", r".*"): "lsblk infers it from Removable and from the bus, which are described",
    ("lsblk", "(opt-io|disc-gran)", r".*"): "0 stands for a value that the disk does not report, which is a missing value with a "
    "reason",
    ("lshw", "description", r".*"): "lshw's words for the class and for the type of the contents",
    ("lshw", "(width|clock)", r"0000:.*|eth\d|nvme0|scsi\d|mmc0"): "of PCI devices, lshw infers it from two bits of the "
    "configuration space",
    ("lshw", r"capabilities\.(bus_master|cap_list|msix?|pm|pciexpress|normal_decode|pci|rom)", r"0000:.*|eth\d|nvme0|scsi\d|mmc0"):
    "bus mastering is a bit of CommandRegister and the link of a PCI Express device is described; further capabilities of PCI are "
    "not, because each of them would have to be read from the device",
    ("lshw", r"capabilities\.(xhci|ahci_1.0|nvm_express|scsi)", r"0000:.*|nvme0|scsi\d"): "the programming interface is "
    "described "
    "as a number",
    ("lshw", r"capabilities\.emulated", r"scsi\d"): "lshw's word for a bus without cables of SCSI",
    ("lshw", r"capabilities\.(usb|usb-[23].00)", r"input\d|usb\d|scsi7"): "the version of USB is described as a number",
    ("lshw", r"capabilities\.i8042", r"input\d"): "keyboards and mice of the controller i8042 are not described",
    ("lshw", r"capabilities\.(10{1,3}bt(-fd)?|autonegotiation|physical)", r"eth\d"): "the speeds and link modes are described in "
    "ethtool's words; only devices are ports",
    ("lshw", r"capabilities\.(partitioned(:dos|:gpt)?|gpt-1.00)", r"nvme0n1|sd[a-c]|vda"): "the kind of partition table is "
    "described in blkid's words",
    ("lshw", r"capabilities\.(fat|ext2|initialized|lvm2)", r"nvme0n1p2|sd[a-c]\d?|vda2"): "the type of the contents is "
    "described in "
    "blkid's words",
    ("lshw", r"capabilities\.(64bit|dir_nlink|extended_attributes|extents|huge_files|journaled|large_files)", r"sda2"): "the "
    "features of a file system are not described",
    ("lshw", r"capabilities\.5400rpm", r"sd[bc]"): "QEMU's disks report no rotation rate; lshw shows the code for that as a "
    "number",
    ("lshw", r"capabilities\.removable", r"cdrom|sdc"): "described as Removable",
    ("lshw", r"capabilities\.(audio|dvd)", r"cdrom"): "the kinds of disc that an optical drive reads are not described",
    ("lshw", "configuration.FATs", r"nvme0n1p2|sdb|sdc1"): "the features of a file system are not described",
    ("lshw", "product", r"input\d+|nvme0"): "lshw puts the maker in front of the product of a USB device, and describes input "
    "devices",
    ("lshw", "vendor", r"sd[a-z]\d?|nvme0n1p\d|mmcblk0"): "lshw gives the program that made the file system, or the number of "
    "a maker",
    ("lshw", "size", r"sd[a-z]\d?|nvme0n1p\d"): "lshw gives the size of the file system that its own probe computes",
    ("lshw", "capacity", r"(nvme0n1p|vda)\d"): "lshw gives one block less than the partition has",
    ("lshw", "serial", r"mmcblk0|nvme0"): "lshw prints the number of an SD card in decimal digits",
    ("lshw", "configuration.speed", r"eth1|input\d+|scsi\d+|usb\d+"): "lshw shortens the number",
    ("lshw", "configuration.ansiversion", r"cdrom|sd[a-c]"): "the version of the command set is not described",
    ("lshw", "configuration.filesystem", r"nvme0n1p2|sdb|sdc1"): "lshw's own name for the type",
    ("lshw", "configuration.state", r"nvme0|(nvme0n1p|sd[a-z])\d"): "lshw's own word for what the mounts and the type say",
    ("lshw", "configuration.status", r"cdrom"): "lshw's own word: whether a drive has a medium",
    ("lshw", "configuration.mount.options", r"nvme0n1p2|sdc1"): "the options of the mount and of the file system are two "
    "properties",
    ("lshw", "configuration.created", r"sda2"): "times inside the file system are not described",
    ("lshw", "configuration.modified", r"sda2"): "times inside the file system are not described",
    ("lshw", "version", r"nvme0"): "the firmware is described for the disk of the controller",
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
    ("ip", "allmulti", r".*"): "how many programs want all multicast packets is not described",
    ("ip", "(min|max)_mtu", r"lo|bond0.10"): "0 stands for an interface without a limit, which is a missing value with a reason",
    ("ip", "address (dynamic|mngtmpaddr)", r"bond0 .*"): "a flag of the address in ip's word; the lifetimes are described",
    ("ip", "address (valid|preferred)_life_time", r"bond0 .*"): "it counts down between the two queries",
    ("ip", "info_(slave_)?kind", r".*"): "the class states it",
    ("ip", "info_data.ad_(lacp_rate|select)", r"bond0"): "only bonds with LACP have these settings; for this one the reason is "
    "described",
    ("ip", "info_(slave_)?data..*_?timer", r"br0|bond0.10"): "a timer, which counts while the tools run",
    ("ip", "info_(slave_)?data.(group_fwd_mask(_str)?)", r"br0|bond0.10"): "described in hexadecimal digits, as the kernel "
    "writes it",
    ("ip", "info_data.mcast_.*", r"br0"): "the times and limits of multicast snooping are not described",
    ("ip", "info_data.stp_state", r"br0"): "described as off, kernel or program",
    ("ip", "info_data.vlan_stats_per_port", r"br0"): "which counters a bridge has is not described",
    ("ip", "info_slave_data.(config_pending|designated_port|topology_change_ack)", r"bond0.10"): "the details of spanning tree "
    "messages are not described",
    ("ip", "info_slave_data.id", r"bond0.10"): "it is made of the priority and the number of the port, which are described",
    ("ip", "info_slave_data.priority", r"bond0.10"): "described as Priority",
    ("ip", "info_slave_data.(locked|mcast_to_unicast|vlan_tunnel)", r"bond0.10"): "settings of a bridge port for access control "
    "and tunnels are not described",
    ("ip", "info_slave_data.prio", r"eth\d"): "which member a bond prefers is described by ActiveMember and PrimaryMember",
    ("ip", "route expires", r"route .*"): "it counts down between the two queries",
    ("ip", "route (pref|metrics)", r"route .*"): "the preference and the metrics of a route, such as its hop limit, are not "
    "described",
    ("mdadm", "(Creation|Update) Time", r"md0"): "kept on the disks only; the kernel exports no times of an array",
    ("mdadm", "Events", r"md0"): "a counter on the disks, which the kernel does not export",
    ("mdadm", "State", r"md0"): "MissingMembers and OperationalStatus state that an array is degraded",
    ("mdadm", "ROLE", r"ZEP:raid:md0:\w+"): "mdadm calls a faulty member without a slot a spare",
    ("mdadm", "Persistence", r"md0"): "MetadataVersion states whether there is a superblock",
    ("mdadm", "(Total|Active|Working) Devices", r"md0"): "it follows from Members, MissingMembers, FailedMembers and "
    "SpareMembers",
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
    ("lshw", r"1 capabilities\.(smp|vsyscall32|smbios-.*|dmi-.*)", r".*"): "words of lshw for the number of processors, for "
    "what the "
    "kernel can run, and for the version of the tables",
    ("lshw", r"0 capabilities\.virtualmachine", r"BIOS 0"): "the characteristics of the firmware are described in SMBIOS's words",
    ("lshw", r"4 capabilities\.(fpu_exception|wp|x86-64)", r"Processor \d"): "lshw's names for what every such processor has; "
    "lm is "
    "the flag for x86-64",
    ("lshw", r"16 capabilities\.ecc", r"Memory array 0"): "lshw's word for the error correction",
    ("lscpu", r"CPU\(s\)", r"Processor \d"): "it is the sum over the processors, each of which has its numbers of cores and "
    "threads",
    ("lscpu", r"Thread\(s\) per core", r"Processor \d"): "it follows from the numbers of threads and cores",
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
    ("smartctl", "smart_support.(available|enabled)", r"sda|nvme0n1"): "a disk without it has no health, with the reason",
    ("smartctl", "smart_status.nvme.value", r"nvme0n1"): "described as CriticalWarning",
    ("smartctl", "nvme_controller_id", r"nvme0n1"): "the number of the controller within its subsystem is not described",
    ("smartctl", "nvme_namespaces.id", r"nvme0n1"): "it is the last number of the name of the disk",
    ("smartctl", r"nvme_smart_health_information_log.(controller_busy|critical_comp|warning_temp)_time", r"nvme0n1"): "the "
    "time that a disk was busy or hot is not described, its temperature is",
    ("smartctl", r"ata_smart_(attributes|error_log.summary|self_test_log.standard).revision", r"sda"): "the version of the "
    "command "
    "set is not described",
    ("smartctl", r"ata_smart_data.self_test.status.(value|passed)", r"sda"): "described in smartctl's words as SelfTest",
    ("smartctl", r"ata_smart_self_test_log.standard.count", r"sda"): "the tests of the past are not described, the last one is",
    ("smartctl", r"trim\..*", r"sda"): "DiscardMaximum and DiscardZeroes are the kernel's values",
    ("smartctl", "write_cache.enabled", r"sda"): "described as WriteCache in the kernel's words",
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
    ("ethtool", "Link detected", r"eth\d"): "ethtool's word for the operational status",
    ("ethtool", "MDI-X", r"eth1"): "the crossing of cable pairs, which ports choose by themselves, is not described",
    ("ethtool", "Supports Wake-on", r"eth1"): "the schema has one value for all kinds of wake-up, WakeOnLan",
    ("ethtool", "Wake-on", r"eth1"): "the schema has one value for all kinds of wake-up, WakeOnLan",
    ("ethtool", "Transceiver", r"eth\d"): "the kernel reports every transceiver as internal since version 4.6",
    ("ethtool", "PHYAD", r"eth\d"): "the address of the chip on its own management bus is not described",
    ("ethtool", "supports-.*", r"eth\d"): "which questions of ethtool a driver answers is not described",
    ("dmidecode", "0 Runtime Size", r"BIOS 0"): "the part of the first megabyte that the firmware uses follows from its two "
    "addresses",
    ("dmidecode", "2 Contained Object Handles", r"Board 0"): "the number of handles that follow; associations lead to the parts",
    ("dmidecode", "3 Contained Elements", r"Chassis 0"): "the number of entries that follow",
    ("dmidecode", "3 OEM Information", r"Chassis 0"): "a number of the maker without a public meaning",
    ("dmidecode", "19 .*", r"Main memory"): "the addresses at which the processors see the memory are not described",
    ("dmidecode", "43 OEM-specific Information", r"tpm0"): "a number of the maker without a public meaning",
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
