// SPDX-License-Identifier: Apache-2.0

// A stand-in for ovdusblan.so, which logs each call and is controlled by environment variables:
//
//   STANDIN_NODES    the number of nodes
//   STANDIN_UP       the nodes that are up, as digits
//   STANDIN_THROWS   the function that throws, and the kind of exception: "GetNodes int", "BringupOvdLan text"

#include "ILogger.h"
#include "TRootObject.h"
#include "platform/include/usblan.h"

#include <cstdlib>
#include <stdexcept>
#include <string>

namespace {

std::string Variable(char const* name) {
  char const* const value = std::getenv(name);
  return value != nullptr ? value : "";
}

void Called(std::string const& function, std::string const& arguments) {
  using namespace NQRVZEP20;
  TRootObject::GetCoreLogger()->OutputLogEntry(ILogger::kLogDebug, "> " + function + "(" + arguments + ")");
  std::string const thrown = Variable("STANDIN_THROWS");
  if (thrown == function + " int") throw 7;
  if (thrown == function + " text") throw std::runtime_error("no USB");
}

}  // namespace

#pragma GCC visibility push(default)

#ifdef STANDIN_UNRESOLVED
int UndefinedFunction();
int CallUndefinedFunction() { return UndefinedFunction(); }
#endif

#ifndef STANDIN_WITHOUT_NODES
int GetNodes() {
  Called("GetNodes", "");
  return std::atoi(Variable("STANDIN_NODES").c_str());
}
#endif

#ifndef STANDIN_WITHOUT_QUERY
int QueryOvdLanState(int node) {
  Called("QueryOvdLanState", std::to_string(node));
  if (Variable("STANDIN_UP").find(std::to_string(node)) != std::string::npos) return 1;
  return node % 2 == 0 ? 0 : 2;  // neither means up
}
#endif

#ifndef STANDIN_WITHOUT_BRINGUP
int BringupOvdLan(int node) {
  Called("BringupOvdLan", std::to_string(node));
  return 5;  // ignored by the caller
}
#endif

#pragma GCC visibility pop
