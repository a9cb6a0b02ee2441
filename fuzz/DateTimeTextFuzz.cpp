// SPDX-License-Identifier: Apache-2.0

// Reads any text as a datetime. The text must be refused with kZEPStatusInvalidDateTime, or print as it was read.

#include "TCIMDateTime.h"
#include "TZEPException.h"
#include "fuzz/Require.h"

#include <cstddef>
#include <cstdint>
#include <string>

namespace {

using NQRVZEP20::TCIMDateTime;
using NQRVZEP20::TZEPException;

// Sets the datetime and returns whether the text was accepted.
bool SetOrRefuse(TCIMDateTime& dateTime, std::string const& text) {
  try {
    dateTime.Set(text);
    return true;
  } catch (TZEPException const& e) {
    Require(e.GetStatusCode() == NQRVZEP20::kZEPStatusInvalidDateTime);
    return false;
  }
}

// The text as ToString prints it. Printing fixes what reading ignores: the point, the digits after a colon, and the sign of
// a zero offset.
std::string AsPrinted(std::string text) {
  text[14] = '.';
  if (text[21] == ':') text.replace(22, 3, "000");
  if (text.substr(21) == "-000") text[21] = '+';
  return text;
}

// Runs an operation, which may throw kZEPStatusInvalidDateTime (for an instant that mktime reports as -1) but nothing else.
template <class TOperation>
void DoOrRefuse(TOperation operation) {
  try {
    operation();
  } catch (TZEPException const& e) {
    Require(e.GetStatusCode() == NQRVZEP20::kZEPStatusInvalidDateTime);
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string const text(reinterpret_cast<char const*>(data), size);
  TCIMDateTime dateTime(1, 2, 3, 4, 5);
  if (!SetOrRefuse(dateTime, text)) {
    Require(dateTime.ToString() == "00000001020304.000005:000");
    return 0;
  }
  Require(dateTime.ToString() == AsPrinted(text));
  Require(dateTime.IsInterval() == (text[21] == ':'));
  Require(dateTime.IsInterval() || !dateTime.ToUIString().empty());

  TCIMDateTime const day(1, 0, 0, 0, 0);
  DoOrRefuse([&] { Require(dateTime == dateTime && !(dateTime < dateTime)); });
  DoOrRefuse([&] { Require((dateTime + day).IsInterval() == dateTime.IsInterval()); });
  DoOrRefuse([&] { Require((day - dateTime).IsInterval() == dateTime.IsInterval()); });
  DoOrRefuse([&] { Require((dateTime - dateTime).ToUIString().empty()); });
  return 0;
}
