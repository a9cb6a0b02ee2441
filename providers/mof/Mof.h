// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"

#include <string>

namespace NQRVZEP20 {

// MOF, the DMTF's Managed Object Format for schemas and instances. docs/formats.md describes the supported syntax.

// Reads a file and the files that it includes, and declares their qualifiers, classes and instances in the namespace. The path
// of an included file is relative to the directory of the including one, and must be in the directory of the first file or below
// it. A class must come after its superclass; otherwise the order does not matter.
//
// Throws TMofError, which has the position of the error, including when the namespace refuses a declaration. A syntax error
// leaves the namespace unchanged; when the namespace refuses a declaration, the earlier ones remain.
void ReadMofFile(std::string const& path, boost::shared_ptr<ICIMNamespace> ns);

// The same for a string, which is called `name` in error messages. A string cannot include files.
void ReadMofText(std::string const& text, std::string const& name, boost::shared_ptr<ICIMNamespace> ns);

// The complete namespace as MOF: qualifier declarations, plain classes, associations, instances, each in the order of the
// enumerations. ReadMofText creates an equal namespace from it, and a copy of the namespace has the same MOF. Throws
// kZEPStatusNotSupported for everything that MOF cannot express: references without a class, arrays of references as
// properties, numbers that are not finite, datetimes of more than 25 characters, NULL characters, and a static value whose
// class does not declare it or whose property also has a default.
std::string WriteMof(ICIMNamespace const& ns);

// One class, without instances.
std::string WriteMofClass(ICIMClass const& cls);

}  // namespace NQRVZEP20
