// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugIns.h"
#include "collect/TAnswer.h"

#include <cstddef>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// A table of a report on one subject, such as the disks: a row for each instance of a class, from all providers.
//
// A plain value; the cells are texts, with units and with the names of enumerated values.
struct TReportSection {
  using TCell = TAnswer<std::string>;

  std::string fKey;                       // a fixed identifier: "disks"
  std::string fTitle;                     // "Disks"
  std::vector<std::string> fColumns;      // titles
  std::vector<std::vector<TCell>> fRows;  // a cell for each column
  std::string fWhyEmpty;                  // why there are no rows; only then
};

// The keys of all sections, in their order.
std::vector<std::string> SectionKeys();

// Makes the sections with these keys, in their order; an unknown key is ignored. The last one, "other", counts the instances of
// the classes that no other section shows, those of other people's plug-ins among them. If a provider throws, its rows are
// missing, with the reason if the section is empty; its exceptions do not pass through. Blocks while it reads the namespaces.
std::vector<TReportSection> MakeSections(std::vector<TPlugIn> const& plugIns, std::vector<std::string> const& keys);

}  // namespace NQRVZEP20
