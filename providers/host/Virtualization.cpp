// SPDX-License-Identifier: Apache-2.0
#include "Virtualization.h"

#include "TKernelProcessors.h"

#include <optional>

#if defined(__x86_64__) || defined(__i386__)
#include <cpuid.h>
#endif

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;

std::string const kDmi = "/sys/class/dmi/id/";

// The texts that firmware of virtual machines has, and the hypervisors. Some hypervisors also make real machines' parts, so that
// the complete text is compared there.
constexpr struct {
  char const *fFile, *fText, *fHypervisor;
} kFirmware[] = {
    {"sys_vendor", "QEMU", "QEMU"},
    {"chassis_vendor", "QEMU", "QEMU"},
    {"sys_vendor", "VMware, Inc.", "VMware"},
    {"sys_vendor", "innotek GmbH", "VirtualBox"},
    {"product_name", "VirtualBox", "VirtualBox"},
    {"sys_vendor", "Xen", "Xen"},
    {"product_name", "Virtual Machine", "Microsoft Hyper-V"},
    {"sys_vendor", "Parallels Software International Inc.", "Parallels"},
    {"bios_vendor", "BHYVE", "bhyve"},
    {"bios_vendor", "Bochs", "Bochs"},
    {"product_name", "Google Compute Engine", "KVM (Google Compute Engine)"},
    {"product_name", "OpenStack Compute", "OpenStack"},
    {"product_name", "KubeVirt", "KubeVirt"},
};

// The identifiers that hypervisors return in the instruction CPUID.
constexpr struct {
  char const *fSignature, *fHypervisor;
} kSignatures[] = {
    {"KVMKVMKVM", "KVM"},
    {"Linux KVM Hv", "KVM"},
    {"TCGTCGTCGTCG", "QEMU"},
    {"VMwareVMware", "VMware"},
    {"Microsoft Hv", "Microsoft Hyper-V"},
    {"XenVMMXenVMM", "Xen"},
    {"VBoxVBoxVBox", "VirtualBox"},
    {"bhyve bhyve ", "bhyve"},
    {" lrpepyh  vr", "Parallels"},
    {"prl hyperv  ", "Parallels"},
    {"ACRNACRNACRN", "ACRN"},
    {"QNXQVMBSQG", "QNX"},
};

// Names in /proc/1/cgroup of containers.
constexpr struct {
  char const *fName, *fContainer;
} kGroups[] = {
    {"/kubepods", "Kubernetes"}, {"/docker/", "docker"}, {"/docker-", "docker"}, {"/lxc/", "lxc"}, {"/lxc.payload", "lxc"}};

// The signature of the hypervisor, without zero bytes. Only for a CPU that reports a hypervisor.
TText Signature() {
#if defined(__x86_64__) || defined(__i386__)
  constexpr unsigned leaf = 0x40000000;
  unsigned eax = 0, words[3] = {};
  __cpuid(leaf, eax, words[0], words[1], words[2]);
  std::string const signature(reinterpret_cast<char const*>(words), sizeof words);
  return signature.substr(0, signature.find('\0'));
#else
  return TMissing{kMissingNotGiven, "this processor does not report the name of a hypervisor"};
#endif
}

std::optional<std::string> HypervisorOfSignature(TMachineFiles const& files) {
  auto const signature = files.Answer("cpuid/hypervisor", Signature);
  for (auto const& [known, hypervisor] : kSignatures)
    if (signature && *signature == known) return hypervisor;
  return std::nullopt;
}

std::optional<std::string> HypervisorOfFirmware(TMachineFiles const& files) {
  for (auto const& [file, text, hypervisor] : kFirmware)
    if (auto const line = files.Line(kDmi + file); line && *line == text) return hypervisor;
  return std::nullopt;
}

// Xen's first domain has the hardware, although the kernel runs on the hypervisor.
bool IsXenControlDomain(TMachineFiles const& files) {
  auto const capabilities = files.Line("/proc/xen/capabilities");
  return capabilities && capabilities->find("control_d") != std::string::npos;
}

bool HasHypervisorFlag(TFinding<TKernelProcessors> const& processors) {
  return processors && processors->GetSockets().front().fInfo.HasFlag("hypervisor");
}

// The hypervisor's name; empty when there is one without a known name; nothing on hardware.
std::optional<std::string> HypervisorOf(TMachineFiles const& files, bool hasFlag) {
  if (auto const type = files.Line("/sys/hypervisor/type")) return *type == "xen" ? "Xen" : *type;
  auto const ofSignature = hasFlag ? HypervisorOfSignature(files) : std::nullopt;
  if (ofSignature) return ofSignature;
  auto const ofFirmware = HypervisorOfFirmware(files);
  if (ofFirmware) return ofFirmware;
  auto const compatible = files.Line("/proc/device-tree/hypervisor/compatible");
  if (compatible) return *compatible;
  return hasFlag ? std::optional(std::string()) : std::nullopt;
}

// The text that the container's manager has left for systemd, or the signs of managers that leave none.
TText ContainerOf(TMachineFiles const& files) {
  if (auto const name = files.Line("/run/systemd/container")) return name;
  if (files.Exists("/run/.containerenv")) return std::string("podman");
  if (files.Exists("/.dockerenv")) return std::string("docker");
  auto const groups = files.Content("/proc/1/cgroup");
  for (auto const& [name, container] : kGroups)
    if (groups && groups->find(name) != std::string::npos) return std::string(container);
  return TMissing{kMissingNotApplicable, "the system does not run in a container"};
}

TText NameOf(std::optional<std::string> const& hypervisor) {
  if (!hypervisor) return TMissing{kMissingNotApplicable, "the machine is not virtual"};
  if (hypervisor->empty()) return TMissing{kMissingNotGiven, "the hypervisor does not report its name"};
  return *hypervisor;
}

}  // namespace

TRecord VirtualizationRecord(TMachineFiles const& files, TFinding<TKernelProcessors> const& processors) {
  auto const hypervisor = HypervisorOf(files, HasHypervisorFlag(processors));
  bool const isKnown = hypervisor || processors;

  TRecord record("ZEP_Virtualization", "/proc/cpuinfo, CPUID, /sys/hypervisor, /sys/class/dmi/id", "CIM_SettingData");
  record.AddKey("InstanceID", "Virtualization");
  record.AddOwn("ElementName", "Virtualization");
  if (isKnown)
    record.Add("IsVirtual", TFinding<bool>(hypervisor && !IsXenControlDomain(files)));
  else
    record.Add("IsVirtual", TFinding<bool>(processors.Why()));
  record.Add("Hypervisor", isKnown ? NameOf(hypervisor) : TText(processors.Why()));
  record.SetSource("/run/systemd/container, /proc/1/cgroup");
  record.Add("Container", ContainerOf(files));
  return record;
}

}  // namespace NQRVZEP20
