// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"

#include <string>

namespace NQRVZEP20 {

// MOF, the DMTF's text form of schemas and instances. docs/formats.md tells what is read and written.

// Declares what the file and the files that it includes declare: qualifiers, classes, instances. Files are looked for
// beside the one that includes them, and must lie in the folder of the first file or below it. A class comes after its
// superclass; everything else may come in any order.
//
// Throws TMofError, which names the place; also for what the namespace refuses. A file that is wrong in form changes
// nothing; when the namespace refuses something, what was declared before stays.
void ReadMofFile(std::string const& path, boost::shared_ptr<ICIMNamespace> ns);

// The same with a text; `name` stands for it in errors. A text includes nothing.
void ReadMofText(std::string const& text, std::string const& name, boost::shared_ptr<ICIMNamespace> ns);

// The whole namespace: qualifier declarations, plain classes, associations, instances, each in the order of the
// enumerations. ReadMofText makes an equal namespace of it, and a copy of the namespace has the same text. Throws
// kZEPStatusNotSupported for what MOF cannot say: references to no class, arrays of references as properties, numbers
// that are not finite, datetimes of more than 25 characters, NULL characters, a static value that its class does not
// declare or that has a default besides.
std::string WriteMof(ICIMNamespace const& ns);

// One class, without instances.
std::string WriteMofClass(ICIMClass const& cls);

}  // namespace NQRVZEP20
