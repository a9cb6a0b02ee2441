// SPDX-License-Identifier: Apache-2.0
#include "ProcessorRecords.h"

#include "CpuList.h"
#include "SmbiosFields.h"
#include "TCIMSchemaHelper.h"
#include "ValueNames.h"

#include <cstdio>
#include <initializer_list>

namespace NQRVZEP20 {

namespace {

constexpr char const* kCpuInfo = "/proc/cpuinfo";
constexpr char const* kSysfs = "/sys/devices/system/cpu";

// The family; the first field may refer to the second family field.
TFinding<std::uint16_t> FamilyOf(TSmbiosStructure const& processor) {
  constexpr std::uint8_t unknown = 2, seeFamily2 = 0xfe;
  auto const family = processor.Byte(0x06);
  if (IsNumber(family, seeFamily2)) return processor.Word(0x28);
  return NumberOf<std::uint16_t>(family, unknown);
}

TFinding<std::string> RoleFrom(std::uint8_t type) {
  constexpr char const* roles[] = {"Other", "Unknown", "Central Processor", "Math Processor", "DSP Processor", "Video Processor"};
  return WordFor(type, roles, 1, "processor type");
}

TFinding<std::string> RoleOf(TSmbiosStructure const& processor) {
  return NumberOf<std::uint8_t>(processor.Byte(0x05), std::uint8_t(2)).Then(RoleFrom);
}

// CIM numbers sockets as SMBIOS does, up to the last one in its list.
std::uint16_t UpgradeMethodFrom(std::uint16_t socket) {
  constexpr std::uint16_t other = 1, last = 56;
  return socket > last ? other : socket;
}

TFinding<std::uint16_t> UpgradeMethodOf(TSmbiosStructure const& processor) {
  return NumberOf<std::uint16_t>(processor.Byte(0x19), std::uint8_t(2)).Then(UpgradeMethodFrom);
}

TFinding<std::uint16_t> CpuStatusFrom(std::uint8_t field) {
  std::uint16_t const status = field & 0x07;
  if (status == 0) return Unknown();
  return status;
}

TFinding<std::uint16_t> DataWidthFrom(std::uint16_t characteristics) {
  constexpr std::uint16_t unknown = 0x02, is64Bit = 0x04;
  if (characteristics & is64Bit) return std::uint16_t(64);
  if (characteristics == 0 || characteristics & unknown) return Unknown();
  return std::uint16_t(32);
}

// The bytes of the processor's identifier, in their order.
TFinding<std::string> ProcessorIdFrom(std::vector<unsigned char> const& id) {
  if (AreAll(id, 0)) return TMissing{kMissingNotGiven, "not set by the firmware (all zeros)"};
  std::string text;
  for (unsigned char byte : id) {
    char digits[3];
    std::snprintf(digits, sizeof digits, "%02X", byte);
    text += digits;
  }
  return text;
}

// 255 in the first field refers to the wider second field, if the structure has it.
TFinding<std::uint16_t> EnabledCoresOf(TSmbiosStructure const& processor) {
  auto const cores = processor.Byte(0x24);
  if (IsNumber(cores, std::uint8_t(0xff))) {
    if (auto const wide = processor.Word(0x2c)) return NumberOf<std::uint16_t>(wide, std::uint16_t(0));
  }
  return NumberOf<std::uint16_t>(cores, std::uint8_t(0));
}

// The bits of the field and the numbers of CIM: 64-bit, hardware threads, execute protection, virtualization, power control.
TFinding<std::vector<unsigned short>> CharacteristicsFrom(std::uint16_t field) {
  constexpr struct { std::uint16_t fBit, fCharacteristic; } table[] = {{0x04, 2}, {0x40, 4}, {0x10, 5}, {0x20, 6}, {0x80, 7}};
  if (field == 0 || field & 0x02) return Unknown();
  std::vector<unsigned short> characteristics;
  for (auto const& [bit, characteristic] : table)
    if (field & bit) characteristics.push_back(characteristic);
  return characteristics;
}

// ---- From the kernel ----

// The value of a field, or the reason why the kernel's facts are missing altogether.
template <class T>
TFinding<T> FieldOf(TFinding<TProcessorFacts> const& kernel, TFinding<T> TProcessorFacts::*field) {
  return kernel.Then([field](TProcessorFacts const& facts) { return facts.*field; });
}

TFinding<std::uint16_t> NumberOf(TFinding<TProcessorFacts> const& kernel, std::uint16_t TProcessorFacts::*field) {
  return kernel.Then([field](TProcessorFacts const& facts) { return facts.*field; });
}

// Either all names or all values of the pairs.
TFinding<std::vector<std::string>> IdentityOf(TFinding<TProcessorFacts> const& kernel,
                                              std::string std::pair<std::string, std::string>::*part) {
  return kernel.Then([part](TProcessorFacts const& facts) {
    std::vector<std::string> parts;
    for (auto const& pair : facts.fIdentity) parts.push_back(pair.*part);
    return parts;
  });
}

template <class T>
struct TSourced {
  TFinding<T> fFinding;
  std::string fSource;
};

// Adds the value of the first source that has one; without any, the reason of the last source.
template <class T>
TRecordProperty& AddFirst(TRecord& record, char const* name, std::initializer_list<TSourced<T>> sources) {
  TSourced<T> const* chosen = sources.end() - 1;
  for (TSourced<T> const& source : sources)
    if (source.fFinding) {
      chosen = &source;
      break;
    }
  record.SetSource(chosen->fSource);
  return record.Add(name, chosen->fFinding);
}

std::string ProcessorName(unsigned number) { return "Processor " + std::to_string(number); }

// ---- Settings ----

// Whether the processor may run faster than its base frequency. The driver of Intel processors has a file of its own.
TFinding<bool> BoostOf(TMachineFiles const& files) {
  std::string const directory = kSysfs;
  if (auto const isOff = files.Number<unsigned>(directory + "/intel_pstate/no_turbo")) return *isOff == 0;
  return files.Number<unsigned>(directory + "/cpufreq/boost").Then([](unsigned isOn) { return isOn != 0; });
}

}  // namespace

TRecord ProcessorRecord(TSmbiosStructure const& processor, std::string const& source, unsigned number, TSystemName const& name,
                        TFinding<TProcessorFacts> const& kernel) {
  constexpr char const* megahertz = "hertz * 10^6";
  auto const speedAt = [&](std::size_t offset) { return NumberOf<std::uint32_t>(processor.Word(offset), std::uint16_t(0)); };

  TRecord record("CIM_Processor", source);
  record.AddKey("SystemCreationClassName", TCIMSchemaHelper::kSystemCreationClassName);
  record.AddPropagatedKey("SystemName", name.fName);
  record.AddKey("CreationClassName", "CIM_Processor");
  record.AddKey("DeviceID", ProcessorName(number));
  record.Add("Name", TextOf(processor, 0x04));
  AddFirst<std::string>(record, "ElementName",
                        {{FieldOf(kernel, &TProcessorFacts::fBrand), kCpuInfo}, {TextOf(processor, 0x10), source}});
  record.SetSource(source);
  record.Add("Role", RoleOf(processor));
  record.Add("Family", FamilyOf(processor));
  record.Add("UpgradeMethod", UpgradeMethodOf(processor)).Names(kUpgradeMethodNames);
  AddFirst<std::uint32_t>(record, "MaxClockSpeed",
                          {{FieldOf(kernel, &TProcessorFacts::fMaxMegahertz), kSysfs}, {speedAt(0x14), source}})
      .Unit(megahertz);
  AddFirst<std::uint32_t>(record, "CurrentClockSpeed",
                          {{FieldOf(kernel, &TProcessorFacts::fCurrentMegahertz), kCpuInfo}, {speedAt(0x16), source}})
      .Unit(megahertz);
  record.SetSource(source);
  record.Add("ExternalBusClockSpeed", speedAt(0x12)).Unit(megahertz);
  AddFirst<std::uint16_t>(
      record, "DataWidth",
      {{FieldOf(kernel, &TProcessorFacts::fDataWidth), kCpuInfo}, {processor.Word(0x26).Then(DataWidthFrom), source}})
      .Unit("bit");
  record.SetSource(source);
  record.Add("UniqueID", processor.Bytes(0x08, 8).Then(ProcessorIdFrom));
  record.Add("CPUStatus", processor.Byte(0x18).Then(CpuStatusFrom)).Names(kCPUStatusNames);
  AddFirst<std::uint16_t>(record, "NumberOfEnabledCores",
                          {{NumberOf(kernel, &TProcessorFacts::fCores), kSysfs}, {EnabledCoresOf(processor), source}});
  record.SetSource(source);
  record.Add("Characteristics", processor.Word(0x26).Then(CharacteristicsFrom)).Names(kProcessorCharacteristicNames);
  record.SetSource(kCpuInfo);
  record.Add("Stepping", FieldOf(kernel, &TProcessorFacts::fStepping));
  record.Add("IdentifyingDescriptions", IdentityOf(kernel, &std::pair<std::string, std::string>::first));
  record.Add("OtherIdentifyingInfo", IdentityOf(kernel, &std::pair<std::string, std::string>::second));
  return record;
}

bool IsSocketFilled(TSmbiosStructure const& processor) {
  constexpr std::uint8_t populated = 0x40;
  auto const status = processor.Byte(0x18);
  return !status || *status & populated;
}

TRecord CapabilitiesRecord(unsigned number, TFinding<TProcessorFacts> const& kernel) {
  TRecord record("CIM_ProcessorCapabilities", kSysfs);
  record.AddKey("InstanceID", ProcessorName(number));
  record.AddOwn("ElementName", ProcessorName(number));
  record.Add("NumberOfProcessorCores", NumberOf(kernel, &TProcessorFacts::fCores));
  record.Add("NumberOfHardwareThreads", NumberOf(kernel, &TProcessorFacts::fThreads));
  return record;
}

TRecord ProcessorSettingsRecord(unsigned number, TKernelProcessors::TSocket const* socket, TMachineFiles const& files) {
  TMissing const notRead{kMissingNotDescribed, "not read"};
  auto const info = [&](char const* name) { return socket ? socket->fInfo.Text(name) : TFinding<std::string>(notRead); };
  std::string const frequency = CpuDirectory(socket ? socket->FirstCpu() : 0) + "cpufreq/";
  constexpr char const* megahertz = "hertz * 10^6";

  TRecord record("ZEP_ProcessorSettings", kCpuInfo, "CIM_SettingData");
  record.AddKey("InstanceID", ProcessorName(number));
  record.AddOwn("ElementName", ProcessorName(number));
  record.Add("MicrocodeVersion", info("microcode"));
  record.Add("Flags", TFinding<std::vector<std::string>>(socket ? socket->fInfo.Flags() : std::vector<std::string>()));
  record.SetSource(kSysfs);
  record.Add("CPUs", TFinding<std::string>(socket ? CpuListOf(socket->Cpus()) : ""));
  record.Add("MinFrequency", MegahertzIn(files, frequency + "cpuinfo_min_freq")).Unit(megahertz);
  record.Add("MaxFrequency", MegahertzIn(files, frequency + "cpuinfo_max_freq")).Unit(megahertz);
  record.Add("BaseFrequency", MegahertzIn(files, frequency + "base_frequency")).Unit(megahertz);
  record.Add("MinAllowedFrequency", MegahertzIn(files, frequency + "scaling_min_freq")).Unit(megahertz);
  record.Add("MaxAllowedFrequency", MegahertzIn(files, frequency + "scaling_max_freq")).Unit(megahertz);
  record.Add("FrequencyDriver", files.Line(frequency + "scaling_driver"));
  record.Add("FrequencyGovernor", files.Line(frequency + "scaling_governor"));
  record.Add("BoostAllowed", BoostOf(files));
  record.Add("Multithreading", files.Line(kSysfs + std::string("/smt/control")));
  return record;
}

TRecord CoreRecord(unsigned processor, unsigned core, TKernelProcessors::TCore const& cpus) {
  constexpr unsigned short enabled = 2;
  TRecord record("CIM_ProcessorCore", kSysfs);
  record.AddKey("InstanceID", ProcessorName(processor) + " core " + std::to_string(core));
  record.AddOwn("ElementName", "Core " + std::to_string(core));
  record.Add("Description", TFinding<std::string>("CPU " + CpuListOf(cpus.fCpus)));
  record.Add("CoreEnabledState", TFinding<unsigned short>(enabled)).Names(kCoreEnabledStateNames);
  return record;
}

}  // namespace NQRVZEP20
