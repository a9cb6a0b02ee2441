// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMReference.h"
#include "TCIMValue.h"
#include "collect/answer/TByteReader.h"
#include "collect/answer/TByteWriter.h"

#include <cstdint>
#include <map>
#include <string>
#include <utility>

namespace NQRVZEP20 {

// The serialised form of a value: the type tag, whether it is NULL, and the data, without loss of precision; for an array also
// the bound, for a reference the class, the label and the keys, and for a NULL reference the referenced class. A class of the
// same namespace is written as its index, any other as its name.

using TClassNumbers = std::map<std::string, std::size_t>;  // by lower-case name

// Throws TBadAnswer for references that are nested too deeply or have too many keys (AnswerLimits.h).
void WriteValue(TByteWriter& writer, TCIMValue const& value, TClassNumbers const& classes);
void WriteReference(TByteWriter& writer, TCIMReference const& reference, TClassNumbers const& classes);

// Writes a mark for a value that could not be read; the failure must follow it.
void WriteMissingValue(TByteWriter& writer);
bool IsMissingValue(TByteReader& reader);  // reads the mark, if there is one

// Checks the form of the value that follows, and skips it. `values`, which outlives the checker, counts the values. Throws
// TBadAnswer.
class TValueChecker {
public:
  TValueChecker(std::size_t classes, std::uint64_t& values) : fClasses(classes), fValues(&values) {}
  void CheckValue(TByteReader& reader, std::uint64_t depth = 0);
  void CheckReference(TByteReader& reader, std::uint64_t depth = 0);

  // Whether a value since the last call was a NULL of a type that does not exist, which cannot be shown.
  bool TakeForeignType() { return std::exchange(fHasForeignType, false); }

private:
  void CheckClass(TByteReader& reader) const;
  void CheckData(TByteReader& reader, unsigned int type, std::uint64_t depth);

  std::size_t fClasses;
  std::uint64_t* fValues;
  bool fHasForeignType = false;
};

// Skips a value that has been validated.
void SkipValue(TByteReader& reader);

// The namespace to which the values that are read belong.
class TReadingNamespace {
public:
  virtual ~TReadingNamespace() = default;
  virtual boost::shared_ptr<ICIMNamespace> Namespace() const = 0;
  virtual boost::shared_ptr<ICIMClass> ClassAt(std::size_t number) const = 0;

  // A class of another namespace, of which only the name and the key declarations added by DeclareOutside are known.
  virtual boost::shared_ptr<ICIMClass> OutsideClass(std::string const& name) const = 0;
  virtual void DeclareOutside(boost::shared_ptr<ICIMClass> const& cls, std::string const& key, TCIMValue const& value) const = 0;
};

// Read a value or reference that has been validated. Both throw kZEPStatusInvalidDateTime for a datetime that is not valid in
// the time zone of this process, and the exceptions of TCIMReference::AddKeyValue.
TCIMValue ReadValue(TByteReader& reader, TReadingNamespace const& ns);
TCIMReference ReadReference(TByteReader& reader, TReadingNamespace const& ns);

}  // namespace NQRVZEP20
