// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMReference.h"
#include "TCIMValue.h"
#include "collect/answer/TByteReader.h"
#include "collect/answer/TByteWriter.h"

#include <cstdint>
#include <map>
#include <string>

namespace NQRVZEP20 {

// One value as bytes: the type tag, whether it is NULL, and the data to the last bit; for an array also the bound, for a
// reference the class, the label and the keys, and for a NULL reference the referenced class. A class of the same namespace is
// written as its number, any other as its name.

using TClassNumbers = std::map<std::string, std::size_t>;  // by lower-case name

// Throws TBadAnswer for references that are nested too deeply (AnswerLimits.h).
void WriteValue(TByteWriter& writer, TCIMValue const& value, TClassNumbers const& classes);
void WriteReference(TByteWriter& writer, TCIMReference const& reference, TClassNumbers const& classes);

// Marks a value that could not be had; the failure follows it.
void WriteMissingValue(TByteWriter& writer);
bool IsMissingValue(TByteReader& reader);  // reads the mark, if there is one

// Checks the form of the value that follows, and skips it. `values` counts the values. Throws TBadAnswer.
class TValueChecker {
public:
  explicit TValueChecker(std::size_t classes) : fClasses(classes) {}
  void CheckValue(TByteReader& reader, std::uint64_t depth = 0);
  void CheckReference(TByteReader& reader, std::uint64_t depth = 0);

private:
  void CheckClass(TByteReader& reader) const;
  void CheckData(TByteReader& reader, unsigned int type, std::uint64_t depth);

  std::size_t fClasses;
  std::uint64_t fValues = 0;
};

// Skips a value that was checked.
void SkipValue(TByteReader& reader);

// The namespace that the values are read into.
class TReadingNamespace {
public:
  virtual ~TReadingNamespace() = default;
  virtual boost::shared_ptr<ICIMNamespace> Namespace() const = 0;
  virtual boost::shared_ptr<ICIMClass> ClassAt(std::size_t number) const = 0;

  // A class of another namespace, of which only the name and the declarations of these keys are known.
  virtual boost::shared_ptr<ICIMClass> OutsideClass(std::string const& name) const = 0;
  virtual void DeclareOutside(boost::shared_ptr<ICIMClass> const& cls, std::string const& key, TCIMValue const& value) const = 0;
};

// Read a value or reference that was checked. They throw kZEPStatusInvalidDateTime for a datetime that the time zone of this
// process does not have, and the exceptions of TCIMReference::AddKeyValue.
TCIMValue ReadValue(TByteReader& reader, TReadingNamespace const& ns);
TCIMReference ReadReference(TByteReader& reader, TReadingNamespace const& ns);

}  // namespace NQRVZEP20
