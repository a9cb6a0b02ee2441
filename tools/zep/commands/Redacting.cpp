// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/Redacting.h"

#include "collect/redaction/Redaction.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/secrets/RedactionMap.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <iostream>
#include <sstream>

namespace NQRVZEP20::zep {

namespace {

using TKinds = std::vector<ESecretKind>;

TKinds KindsFrom(std::string const& list) {
  if (list.empty()) return {kSecretKinds.begin(), kSecretKinds.end()};
  TKinds kinds;
  std::istringstream names(list);
  for (std::string name; std::getline(names, name, ',');) {
    auto const kind = SecretKindFrom(name);
    if (!kind) throw TWrongUsage("--redact takes serials, hosts, addresses and users, separated by commas");
    if (std::find(kinds.begin(), kinds.end(), *kind) == kinds.end()) kinds.push_back(*kind);
  }
  std::sort(kinds.begin(), kinds.end());
  return kinds;
}

// "1 user", "31 serials"
std::string CountText(std::size_t count, ESecretKind kind) {
  std::string name = NameOf(kind);
  if (count == 1) name.resize(name.size() - (kind == ESecretKind::kAddresses ? 2 : 1));
  return std::to_string(count) + " " + name;
}

std::string NamesOf(TKinds const& kinds) {
  std::vector<std::string> names;
  std::transform(kinds.begin(), kinds.end(), std::back_inserter(names), [](ESecretKind kind) { return NameOf(kind); });
  return Joined(names, ", ");
}

// A report that is redacted already must have no secrets of the wanted kinds.
void CheckRedaction(TRedactedWith const& with, TKinds const& wanted, std::string const& map, std::string const& mapFile) {
  if (with.fMap != map) throw TFailure(kExitNoInput, "the report was redacted with another map than " + mapFile);
  TKinds missing;
  for (ESecretKind const kind : wanted)
    if (std::find(with.fKinds.begin(), with.fKinds.end(), kind) == with.fKinds.end()) missing.push_back(kind);
  if (missing.empty()) return;
  throw TFailure(kExitNoInput, "the report was redacted without " + NamesOf(missing) +
                                   "; give the original back with zep unredact, and redact that");
}

}  // namespace

void AddRedactionOptions(CLI::App& command, TRedactionArguments& arguments) {
  auto* const redact =
      command
          .add_option_function<std::string>(
              "--redact", [&arguments](std::string const& list) { arguments.fKinds = KindsFrom(list); },
              "Replace secrets by pseudonyms such as serial-1: these kinds, of serials, hosts, addresses and users, separated\n"
              "by commas; all four without a list. zep unredact gives the original back")
          ->type_name("KINDS")
          ->expected(0, 1);
  command
      .add_option("--redaction-map", arguments.fMapFile,
                  "The file that keeps which pseudonym stands for which secret; created if it does not exist, otherwise\n"
                  "used again. Without it, ~/.local/state/zep/redaction-map.json")
      ->type_name("FILE")
      ->needs(redact);
}

void RedactDocument(TJson& document, TRedactionArguments const& arguments) {
  std::string const file = arguments.fMapFile.empty() ? UsualRedactionMap() : arguments.fMapFile;
  TRedactionMap map(file);
  try {
    if (IsRedacted(document)) return CheckRedaction(RedactedWith(document), arguments.fKinds, map.Pseudonyms().Id(), file);
    if (!document.contains("classes"))
      throw TRedactionError("an older zep wrote it, without the superclasses of its classes, which decide what is a secret");
    Redact(document, arguments.fKinds, map.Pseudonyms());
  } catch (TRedactionError const& failure) {
    throw TFailure(kExitNoInput, "the report cannot be redacted: " + std::string(failure.what()));
  }
  map.Save();
  std::cerr << "zep: the redaction map is " << Printable(file) << "\n";
}

std::string ContentsText(TSecretCounts const& counts, TKinds const& redacted) {
  std::string text;
  for (ESecretKind const kind : kSecretKinds) {
    char const* const separator = kind == kSecretKinds.front() ? "" : kind == kSecretKinds.back() ? " and " : ", ";
    text += separator + CountText(counts[static_cast<std::size_t>(kind)], kind);
  }
  if (redacted.empty()) return text + ", not redacted";
  return text + (redacted.size() == kSecretKinds.size() ? ", all redacted" : ", redacted: " + NamesOf(redacted));
}

}  // namespace NQRVZEP20::zep
