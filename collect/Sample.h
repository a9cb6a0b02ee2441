// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20 {

// A sample: the SMBIOS table of another machine, read instead of this machine's tables, and the label that keeps the two apart.
//
// Pass it to LoadPlugIns and MakeReport. Every source of a value is then labelled: the sample's values bear the label, and
// values that providers still read from this machine, such as its operating system, are marked "(not of the sample)".
struct TSample {
  std::string fTableFile;  // the path of the table, in the form that ZEP_SMBIOS_TABLE accepts
  std::string fHostName;   // the host name to report; empty for this machine's own
  std::string fLabel;      // such as "SAMPLE"; not empty
};

// Makes providers read the sample, by setting the environment variables ZEP_SMBIOS_TABLE and ZEP_HOST_NAME of this process.
// The variables stay set, because a provider may read them at any later time. LoadPlugIns calls this. Like every change of the
// environment, it must not run beside other threads that read or change the environment.
void SetForProviders(TSample const& sample);

// The table file that the user named in ZEP_SMBIOS_TABLE, to be read instead of this machine's tables; empty when there is none.
// After SetForProviders this is the sample's file.
std::string NamedTableFile();

// The source of a value as it is to be printed. `label` is that of the sample, or empty without a sample: then the source is
// returned unchanged.
std::string LabelledSource(std::string const& source, std::string const& label);

}  // namespace NQRVZEP20
