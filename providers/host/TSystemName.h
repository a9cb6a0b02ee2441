// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <string>
#include <utility>

namespace NQRVZEP20 {

// The machine's host name, and its source.
struct TSystemName {
  TSystemName(std::string name, std::string source) : fName(std::move(name)), fSource(std::move(source)) {}
  TSystemName(TFinding<std::string> name, std::string source) : fName(std::move(name)), fSource(std::move(source)) {}

  TFinding<std::string> fName;
  std::string fSource;
};

}  // namespace NQRVZEP20
