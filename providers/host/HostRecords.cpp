// SPDX-License-Identifier: Apache-2.0
#include "HostRecords.h"

#include "Placeholder.h"
#include "TCIMSchemaHelper.h"

#include <sys/utsname.h>

#include <cstdlib>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;

TText KernelText(char const* text) { return std::string(text); }

}  // namespace

TSystemName SystemNameOf(utsname const& kernel) {
  char const* named = std::getenv("ZEP_HOST_NAME");
  if (named != nullptr && *named != '\0') return {named, "ZEP_HOST_NAME"};
  return {HostNameOf(kernel.nodename), "uname"};
}

TRecord OperatingSystemRecord(TOsRelease const& release, utsname const& kernel, TSystemName const& name) {
  TRecord record(TCIMSchemaHelper::kOperatingSystemCreationClassName, release.GetFile(), "CIM_OperatingSystem");
  record.AddKey("CSCreationClassName", TCIMSchemaHelper::kSystemCreationClassName);
  record.AddPropagatedKey("CSName", name.fName);
  record.AddKey("CreationClassName", TCIMSchemaHelper::kOperatingSystemCreationClassName);
  record.AddKey("Name", release.Value({"NAME"}));
  record.Add("Caption", release.Value({"PRETTY_NAME"}));
  record.Add("Version", release.Value({"VERSION", "VERSION_ID", "BUILD_ID"}));

  record.SetSource("uname");
  record.Add("OSType", KernelText(kernel.sysname));
  record.Add("KernelRelease", KernelText(kernel.release));
  record.Add("KernelVersion", KernelText(kernel.version));
  record.Add("Architecture", KernelText(kernel.machine));
  return record;
}

TRecord ProductRecord() {
  TRecord record("QRVSG_ZEPProduct", "this build of zepcore");
  record.AddKey("Name", "zepcore");
  record.AddKey("Version", TText(ZEP_VERSION));
  record.Add("Build", TText(ZEP_BUILD_ID));
  return record;
}

}  // namespace NQRVZEP20
