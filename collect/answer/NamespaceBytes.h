// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"

#include <functional>
#include <string_view>

namespace NQRVZEP20 {

// A namespace as bytes: its name, qualifier declarations, classes with all their elements, and instances with typed values and
// paths. Where the provider throws, the exception is written in place of the answer. TReceivedNamespace makes a namespace of the
// bytes that answers in the same way. The bytes are read on the machine on which they were written, by the same build.
//
// In this order; numbers and texts are those of TByteWriter, values those of ValueBytes.h, failures those of TRecordedFailure,
// and a list begins with its length:
//
//   kNamespaceForm, kNamespaceVersion, name, number of classes
//   qualifier declarations: name, type, scope, flavor, default value
//   classes, each after its superclass: name, number of the superclass plus 1 or 0, EClassFlags, qualifiers, and
//     property declarations: name, type, EDeclFlags, the failure of IsKey if it failed, default value, qualifiers
//     static properties: name, declaration, value; then an ending
//     methods: name, return type, qualifiers; parameters: name, type, array bound, referenced class, qualifiers
//   the ending of the classes
//   for each root class: records (ERecord), which end with kEnd
//
// A qualifier is its name, the number of its declaration plus 1 or 0, the flavor and the value. A declaration is the number of
// its class plus 1, and its number in that class; or 0. An ending is 0, or 1 and the failure of the enumeration.
constexpr char const* kNamespaceForm = "zep namespace";
constexpr unsigned int kNamespaceVersion = 1;

enum EClassFlags : unsigned int { kAssociationFlag = 1, kAbstractFlag = 2 };
enum EDeclFlags : unsigned int { kKeyFlag = 1, kKeyFailedFlag = 2, kOwnerFlag = 4 };

enum ERecord : unsigned int {
  kEnd,      // of the instances of a root class and the classes below it; an ending follows
  kLayout,   // a class, an ending in place of which GetClass may have failed, and a list of properties: name, declaration
  kInstance  // the number of a layout, the values of its properties (a missing value has its failure after it), and the path
};

enum EPath : unsigned int {
  kPathFailed,  // the failure follows
  kPathOfKeys,  // of the class of the instance; the positions of the keys among the properties follow
  kPathApart    // any other path, as a reference
};

// Writes the namespace. `send` gets the bytes in pieces, in order. Calls every operation of the provider from here, so it blocks
// as long as the provider does. Passes on what the provider throws where no ending is provided for it, std::bad_alloc, and what
// `send` throws.
void WriteNamespace(ICIMNamespace const& ns, std::function<void(std::string_view bytes)> const& send);

}  // namespace NQRVZEP20
