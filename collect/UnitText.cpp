// SPDX-License-Identifier: Apache-2.0
#include "collect/UnitText.h"

#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"

#include <charconv>
#include <cmath>
#include <cstddef>
#include <cstdio>
#include <string_view>

namespace NQRVZEP20 {

namespace {

// How the numbers of a unit are shortened: 1536 bytes are 1.5 KiB, 1000 Hz are 1 kHz, 7200 revolutions stay what they are.
enum class EPrefixes { kNone, kDecimal, kBinary };

struct TUnit {
  char const* fName;    // in a PUnit
  char const* fSymbol;  // printed
  EPrefixes fPrefixes;
};

constexpr TUnit kUnits[] = {
    {"byte", "B", EPrefixes::kBinary},
    {"bit / second", "bit/s", EPrefixes::kDecimal},
    {"hertz", "Hz", EPrefixes::kDecimal},
    {"revolution / minute", "rpm", EPrefixes::kNone},
    {"bit", "bit", EPrefixes::kNone},
    {"percent", "%", EPrefixes::kNone},
    {"second", "s", EPrefixes::kNone},
    {"minute", "min", EPrefixes::kNone},
    {"hour", "h", EPrefixes::kNone},
    {"volt", "V", EPrefixes::kNone},
    {"ampere", "A", EPrefixes::kNone},
    {"watt", "W", EPrefixes::kNone},
    {"degree celsius", "°C", EPrefixes::kNone},
    {"inch", "inch", EPrefixes::kNone},
};

// The unit without its power of ten or two, and that power: "hertz * 10^6" is hertz and 1000000.
struct TScaledUnit {
  std::string fName;
  double fScale;
};

TScaledUnit ScaledUnitFrom(std::string const& unit) {
  int exponent = 0, length = 0;
  for (auto const& [format, base] : {std::pair("%*[^*]* 10^%d%n", 10), std::pair("%*[^*]* 2^%d%n", 2)})
    if (std::sscanf(unit.c_str(), format, &exponent, &length) == 1 && static_cast<std::size_t>(length) == unit.size())
      return {unit.substr(0, unit.find(" *")), std::pow(base, exponent)};
  return {unit, 1};
}

// At most that many decimals, without zeros at the end: "1.5", "2.933", "7200".
std::string Rounded(double number, int decimals) {
  char text[64];
  std::snprintf(text, sizeof text, "%.*f", decimals, number);
  std::string rounded = text;
  rounded.erase(rounded.find_last_not_of('0') + 1);
  if (rounded.back() == '.') rounded.pop_back();
  return rounded;
}

std::string Shortened(double number, TUnit const& unit) {
  constexpr char const* kDecimal[] = {"", "k", "M", "G", "T", "P"};
  constexpr char const* kBinary[] = {"", "Ki", "Mi", "Gi", "Ti", "Pi"};
  bool const isBinary = unit.fPrefixes == EPrefixes::kBinary;
  double const step = isBinary ? 1024 : 1000;
  std::size_t prefix = 0;
  if (unit.fPrefixes != EPrefixes::kNone)
    for (; prefix + 1 < std::size(kDecimal) && number >= step - 0.05; ++prefix) number /= step;
  return Rounded(number, isBinary ? 1 : 3) + " " + (isBinary ? kBinary : kDecimal)[prefix] + unit.fSymbol;
}

}  // namespace

std::string UnitOf(ICIMPropertyDecl const& property) {
  auto const qualifier = property.GetQualifier("PUnit", TCIMContext());
  TCIMValue const unit = qualifier ? qualifier->GetValue(TCIMContext()) : TCIMValue();
  return unit.IsNull() ? "" : unit.ToString();
}

std::string TextWithUnit(TCIMValue const& value, std::string const& unit) {
  std::string const text = value.ToString();
  double number = 0;
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (unit.empty() || error != std::errc() || end != text.data() + text.size()) return text;
  TScaledUnit const scaled = ScaledUnitFrom(unit);
  for (TUnit const& known : kUnits)
    if (scaled.fName == known.fName) return Shortened(number * scaled.fScale, known);
  return text + " " + unit;
}

}  // namespace NQRVZEP20
