// SPDX-License-Identifier: Apache-2.0
#include "TCIMSchemaHelper.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMNamespace.h"
#include "ICIMProperty.h"
#include "TAddToVectorCallback.h"
#include "TZEPException.h"
#include "core/Failure.h"
#include "core/Log.h"

#include <algorithm>
#include <cctype>
#include <optional>
#include <string_view>

namespace NQRVZEP20 {

std::string const TCIMSchemaHelper::kSystemCreationClassName = "QRVSG_ComputerSystem";
std::string const TCIMSchemaHelper::kOperatingSystemCreationClassName = "QRVSG_OperatingSystem";
std::string const TCIMSchemaHelper::kContextName = "nspID";
std::string const TCIMSchemaHelper::kPluginNSPName = "plugin";
std::string const TCIMSchemaHelper::kCMPINSPName = "cmpi";

namespace {

using TInstances = std::vector<boost::shared_ptr<ICIMInstance>>;

constexpr char kProductClassName[] = "QRVSG_ZEPProduct";
constexpr char kUnknown[] = "Unknown";
constexpr char kUnknownModel[] = "xxx";

// ---- Reading ----

// Adds the name of the plug-in provider to the caller's context, unless the caller names a provider.
TCIMContext QueryContext(TCIMContext context = TCIMContext()) {
  context.emplace(TCIMSchemaHelper::kContextName, TCIMValue(TCIMSchemaHelper::kPluginNSPName));
  return context;
}

// Returns the result of a lookup, or an empty pointer when the lookup throws kZEPStatusNotFound.
template <class TLookup>
auto FindOrEmpty(TLookup lookup) -> decltype(lookup()) {
  try {
    return lookup();
  } catch (TZEPException const& failure) {
    if (failure.GetStatusCode() != kZEPStatusNotFound) throw;
    return nullptr;
  }
}

boost::shared_ptr<ICIMClass> FindClass(ICIMNamespace const& ns, std::string const& name, TCIMContext const& context) {
  return FindOrEmpty([&] { return ns.GetClass(name, context); });
}

boost::shared_ptr<ICIMProperty> FindProperty(ICIMInstance const& instance, std::string const& name, TCIMContext const& context) {
  return FindOrEmpty([&] { return instance.GetProperty(name, context); });
}

// Empty when the enumeration throws kZEPStatusNotFound.
TInstances InstancesOf(ICIMClass const& cls, TCIMContext const& context) {
  TInstances instances;
  try {
    cls.EnumerateInstances(TAddToVectorCallback<ICIMInstance>(instances), context);
  } catch (TZEPException const& failure) {
    if (failure.GetStatusCode() != kZEPStatusNotFound) throw;
    instances.clear();
  }
  return instances;
}

// Reads a property of the only instance of a class. Anything missing throws kZEPStatusNotFound and is not logged.
std::string ReadOnlyInstance(ICIMNamespace const& ns, std::string const& className, std::string const& propertyName,
                             TCIMContext const& context) {
  auto const cls = FindClass(ns, className, context);
  if (!cls) throw TZEPException(kZEPStatusNotFound);
  TInstances const instances = InstancesOf(*cls, context);
  if (instances.size() != 1) throw TZEPException(kZEPStatusNotFound);
  auto const property = FindProperty(*instances.front(), propertyName, context);
  if (!property) throw TZEPException(kZEPStatusNotFound);
  return property->GetValue(context);
}

[[noreturn]] void ThrowNotFound(std::string const& reason) {
  LogAndThrow(ILogger::kLogDebug, kZEPStatusNotFound, "TCIMSchemaHelper: ", reason);
}

// Reads a property of the computer system in the same way, but logs each failure, and treats a value that is NULL or not a
// string as missing.
std::string ReadComputerSystem(ICIMNamespace const& ns, std::string const& propertyName, TCIMContext const& context) {
  auto const cls = FindClass(ns, TCIMSchemaHelper::kSystemCreationClassName, context);
  if (!cls) ThrowNotFound("no computer system");
  TInstances const instances = InstancesOf(*cls, context);
  if (instances.size() != 1) ThrowNotFound("computer system instances != 1");
  auto const property = FindProperty(*instances.front(), propertyName, context);
  if (!property) ThrowNotFound("didn't find " + propertyName + " property");
  TCIMValue const value = property->GetValue(context);
  if (value.IsNull()) ThrowNotFound(propertyName + " is NULL");
  if (value.GetType() != TCIMValue::TCIMType::kCIMTypeString) ThrowNotFound(propertyName + " wasn't a string");
  return value;
}

// The values that a property has in the instances of a class; NULL values are left out.
std::vector<TCIMValue> ReadEveryInstance(TInstances const& instances, std::string const& propertyName,
                                         TCIMContext const& context) {
  std::vector<TCIMValue> values;
  for (auto const& instance : instances) {
    auto const property = FindProperty(*instance, propertyName, context);
    if (!property) continue;
    TCIMValue value = property->GetValue(context);
    if (!value.IsNull()) values.push_back(std::move(value));
  }
  return values;
}

TInstances FindInstances(ICIMNamespace const& ns, std::string const& className, TCIMContext const& context) {
  auto const cls = FindClass(ns, className, context);
  return cls ? InstancesOf(*cls, context) : TInstances();
}

bool IsString(TCIMValue const& value) { return value.GetType() == TCIMValue::TCIMType::kCIMTypeString && !value.IsNull(); }

// Some hosts report the build number as a string, others as an integer.
bool IsStringOrInteger(TCIMValue const& value) {
  TCIMValue::TCIMType const type = value.GetType();
  return IsString(value) || (type >= TCIMValue::TCIMType::kCIMTypeUint8 && type <= TCIMValue::TCIMType::kCIMTypeSint64);
}

// ---- Texts ----

bool IsLetterOrDigit(char c) { return std::isalnum(static_cast<unsigned char>(c)) != 0; }

bool Contains(std::string const& text, std::string_view part) { return text.find(part) != std::string::npos; }

bool HasCharacterAt(std::string const& text, std::size_t pos, char c) { return pos < text.size() && text[pos] == c; }

void RemoveTrailingBlanks(std::string& text) { text.erase(text.find_last_not_of(' ') + 1); }

// ---- Machine type and model ----

// Product names of older servers, which have the MTM at a fixed position after the model name.
struct TLegacyName {
  std::size_t fLength;
  std::string_view fPrefix;  // the MTM follows it
  char fClosing;             // the last character
};

constexpr TLegacyName kLegacyNames[] = {
    {27, "System Model 1000-[", ']'},
    {26, "System Model 200-[", ']'},
    {28, "System Model 3000- ", '-'},
};

std::string WithoutLegacyName(std::string const& text) {
  for (TLegacyName const& name : kLegacyNames) {
    if (text.size() != name.fLength || text.back() != name.fClosing) continue;
    if (text.compare(0, name.fPrefix.size(), name.fPrefix) != 0) continue;
    std::string const mtm = text.substr(name.fPrefix.size(), 7);
    if (TCIMSchemaHelper::IsValidMTM(mtm)) return mtm;
  }
  return text;
}

std::string MTMWithoutBrackets(std::string const& text) {
  if (text.size() == 4 && TCIMSchemaHelper::IsValidMachineType(text)) return text + kUnknownModel;
  if (text.size() == 7 && TCIMSchemaHelper::IsValidMTM(text)) return text;
  throw TZEPException(kZEPStatusInvalidFormat);
}

// `bracket` is the position of "-[".
std::string MTMInBrackets(std::string const& text, std::size_t bracket) {
  std::string const code = text.substr(bracket + 2, 7);
  if (HasCharacterAt(text, bracket + 9, ']') && TCIMSchemaHelper::IsValidMTM(code)) return code;
  if (HasCharacterAt(text, bracket + 6, ']') && TCIMSchemaHelper::IsValidMachineType(code))
    return code.substr(0, 4) + kUnknownModel;
  throw TZEPException(kZEPStatusInvalidFormat);
}

std::string MTMFrom(std::string const& productName) {
  std::string const text = WithoutLegacyName(productName);
  std::size_t const bracket = text.find("-[");
  std::string mtm = bracket == std::string::npos ? MTMWithoutBrackets(text) : MTMInBrackets(text, bracket);
  if (mtm.compare(4, 3, "   ") == 0) mtm.replace(4, 3, kUnknownModel);
  return mtm;
}

// ---- Serial numbers ----

bool IsPlaceholder(std::string const& serialNumber) { return serialNumber == "XxXxXxX" || serialNumber == "none"; }

// The text after the ":" of the first entry that contains one.
std::optional<std::string> IdentifyingInfoIn(std::vector<TCIMValue> const& entries) {
  for (TCIMValue const& entry : entries) {
    if (!IsString(entry)) continue;
    std::string const text = entry;
    std::size_t const colon = text.find(':');
    if (colon != std::string::npos) return text.substr(colon + 1);
  }
  return std::nullopt;
}

std::string IdentifyingInfo(ICIMNamespace const& ns, TCIMContext const& context) {
  std::string info = kUnknown;
  for (TCIMValue const& value :
       ReadEveryInstance(FindInstances(ns, "OMC_UnitaryComputerSystem", context), "OtherIdentifyingInfo", context)) {
    if (!value.IsArray()) continue;
    std::vector<TCIMValue> const& entries = value;
    info = IdentifyingInfoIn(entries).value_or(info);
  }
  return info;
}

}  // namespace

std::string TCIMSchemaHelper::GetSystemCreationClassName() { return kSystemCreationClassName; }
std::string TCIMSchemaHelper::GetOperatingSystemCreationClassName() { return kOperatingSystemCreationClassName; }

// ---- Single properties ----

std::string TCIMSchemaHelper::GetSystemProductName(boost::shared_ptr<ICIMNamespace> ns) {
  return ReadOnlyInstance(*ns, kSystemCreationClassName, "ProductName", QueryContext());
}

std::string TCIMSchemaHelper::GetSystemName(boost::shared_ptr<ICIMNamespace> ns) {
  return ReadOnlyInstance(*ns, kSystemCreationClassName, "Name", QueryContext());
}

std::string TCIMSchemaHelper::GetOperatingSystemName(boost::shared_ptr<ICIMNamespace> ns) {
  return ReadOnlyInstance(*ns, kOperatingSystemCreationClassName, "Name", QueryContext());
}

std::string TCIMSchemaHelper::GetOperatingSystemVersion(boost::shared_ptr<ICIMNamespace> ns) {
  return ReadOnlyInstance(*ns, kOperatingSystemCreationClassName, "Version", QueryContext());
}

std::string TCIMSchemaHelper::GetOperatingSystemType(boost::shared_ptr<ICIMNamespace> ns) {
  return ReadOnlyInstance(*ns, kOperatingSystemCreationClassName, "OSType", QueryContext());
}

std::string TCIMSchemaHelper::GetDataSourceVersion(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context) {
  return ReadOnlyInstance(*ns, kProductClassName, "Version", QueryContext(std::move(context)));
}

std::string TCIMSchemaHelper::GetDataSourceBuild(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context) {
  return ReadOnlyInstance(*ns, kProductClassName, "Build", QueryContext(std::move(context)));
}

// ---- Machine type and model ----

std::string TCIMSchemaHelper::GetRawMTMString(boost::shared_ptr<ICIMNamespace> ns) {
  return ReadComputerSystem(*ns, "ProductName", QueryContext());
}

std::string TCIMSchemaHelper::GetMTM(boost::shared_ptr<ICIMNamespace> ns) {
  LogDebug("TCIMSchemaHelper- Detected MTM Entered");
  std::string productName = GetRawMTMString(ns);
  RemoveTrailingBlanks(productName);
  std::string const mtm = MTMFrom(productName);
  LogDebug("TCIMSchemaHelper- Detected MTM ", mtm);
  return mtm;
}

std::string TCIMSchemaHelper::GetMachineType(boost::shared_ptr<ICIMNamespace> ns) { return GetMTM(ns).substr(0, 4); }
std::string TCIMSchemaHelper::GetModelNumber(boost::shared_ptr<ICIMNamespace> ns) { return GetMTM(ns).substr(4, 3); }

bool TCIMSchemaHelper::IsValidMachineType(std::string const& text) {
  return text.size() >= 4 && std::all_of(text.begin(), text.begin() + 4, IsLetterOrDigit);
}

bool TCIMSchemaHelper::IsValidMTM(std::string const& text) {
  auto const isOfModel = [](char c) { return IsLetterOrDigit(c) || c == ' '; };
  return text.size() >= 7 && IsValidMachineType(text) && std::all_of(text.begin() + 4, text.begin() + 7, isOfModel);
}

// ---- Serial number ----

std::string TCIMSchemaHelper::GetRawSerialNumberString(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context) {
  return ReadComputerSystem(*ns, "SerialNumber", QueryContext(std::move(context)));
}

std::string TCIMSchemaHelper::GetSerialNumber(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context) {
  std::string serialNumber = GetRawSerialNumberString(ns, std::move(context));
  RemoveTrailingBlanks(serialNumber);
  if (serialNumber.size() != 7 || !std::all_of(serialNumber.begin(), serialNumber.end(), IsLetterOrDigit))
    throw TZEPException(kZEPStatusInvalidFormat);
  return serialNumber;
}

// ---- Parts of the data source's version ----

std::string TCIMSchemaHelper::GetDataSourceMajorVersion(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context) {
  std::string const version = GetDataSourceVersion(ns, std::move(context));
  std::size_t const dot = version.find('.');
  if (dot == std::string::npos) {
    LogDebug("TCIMSchemaHelper::GetDataSourceMajorVersion - Throwing");
    throw TZEPException(kZEPStatusNotFound);
  }
  return version.substr(0, dot);
}

std::string TCIMSchemaHelper::GetDataSourceMinorVersion(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context) {
  std::string const version = GetDataSourceVersion(ns, std::move(context));
  std::size_t const first = version.find('.');
  if (first == std::string::npos) throw TZEPException(kZEPStatusNotFound);
  std::size_t const second = version.find('.', first + 1);
  if (second == std::string::npos) throw TZEPException(kZEPStatusNotFound);
  return version.substr(first + 1, second - first - 1);
}

std::string TCIMSchemaHelper::GetDataSourceBuildVersion(boost::shared_ptr<ICIMNamespace> ns) {
  std::string const version = GetDataSourceVersion(ns, TCIMContext());
  std::size_t const dot = version.rfind('.');
  if (dot == std::string::npos) throw TZEPException(kZEPStatusNotFound);
  return version.substr(dot + 1);
}

// ---- VMware ESXi hosts ----

std::string TCIMSchemaHelper::GetSystemProductName_vmwesxi(boost::shared_ptr<ICIMNamespace> ns) {
  TCIMContext const context = QueryContext();
  std::string productName = kUnknown;
  for (TCIMValue const& value : ReadEveryInstance(FindInstances(*ns, "CIM_PhysicalElement", context), "Model", context)) {
    if (!IsString(value)) continue;
    std::string const model = value;
    if (Contains(model, "-[") && Contains(model, "]-")) productName = model;
  }
  return productName;
}

std::string TCIMSchemaHelper::GetMTM_vmwesxi(boost::shared_ptr<ICIMNamespace> ns) {
  std::string const productName = GetSystemProductName_vmwesxi(ns);
  std::size_t const bracket = productName.find("-[");
  std::size_t const end = productName.find("]-");
  if (bracket == std::string::npos || end == std::string::npos || bracket + 2 >= end) return kUnknown;
  return productName.substr(bracket + 2, end - bracket - 2);
}

std::string TCIMSchemaHelper::GetOperatingSystemName_vmwesxi(boost::shared_ptr<ICIMNamespace> ns) {
  TCIMContext const context = QueryContext();
  TInstances const software = FindInstances(*ns, "VMware_HypervisorSoftwareIdentity", context);
  std::string name = kUnknown;
  for (TCIMValue const& build : ReadEveryInstance(software, "LargeBuildNumber", context))
    if (IsStringOrInteger(build)) name = build.ToString(10);
  return name;
}

std::string TCIMSchemaHelper::GetSerialNumber_vmwesxi(boost::shared_ptr<ICIMNamespace> ns, TCIMContext context) {
  TCIMContext const query = QueryContext(std::move(context));
  TInstances const chassis = FindInstances(*ns, "OMC_Chassis", query);
  if (chassis.empty()) throw TZEPException(kZEPStatusNotFound);
  std::string serialNumber = kUnknown;
  for (TCIMValue const& value : ReadEveryInstance(chassis, "SerialNumber", query))
    if (IsString(value)) serialNumber = value.operator std::string();
  return IsPlaceholder(serialNumber) ? IdentifyingInfo(*ns, query) : serialNumber;
}

}  // namespace NQRVZEP20
