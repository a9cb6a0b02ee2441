// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20 {

// A sample: the SMBIOS table of another machine, read instead of this machine's tables, and a label that distinguishes its
// values from those of this machine.
//
// Pass it to LoadPlugIns or LoadPlugInsApart, and to MakeReport. Every source of a value is then labelled: sources in the
// sample have the label, and those on this machine, such as its operating system, are marked "(not of the sample)".
struct TSample {
  std::string fTableFile;  // the path of the table, in the form that ZEP_SMBIOS_TABLE accepts
  std::string fHostName;   // the host name to report; empty for this machine's own
  std::string fLabel;      // such as "SAMPLE"; not empty
};

// Makes providers read the sample, by setting the environment variables ZEP_SMBIOS_TABLE, ZEP_HOST_NAME and ZEP_SAMPLE of this
// process. The variables stay set, because a provider may read them at any later time. LoadPlugIns calls this function. Not
// thread-safe: no other thread may read or change the environment during the call.
void SetForProviders(TSample const& sample);

// The value of ZEP_SMBIOS_TABLE: the table file to read instead of this machine's tables; empty if it is not set. After
// SetForProviders this is the sample's file.
std::string NamedTableFile();

// The source of a value in the form to print. `label` is the label of the sample; if it is empty, because there is no sample,
// the source is returned unchanged.
std::string LabelledSource(std::string const& source, std::string const& label);

}  // namespace NQRVZEP20
