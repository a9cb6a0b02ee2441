// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"

#include <functional>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// The serialised form of a namespace: its name, qualifier declarations, classes with all their elements, and instances with
// typed values and paths. If an operation of the provider throws, the exception is written instead of the result.
// TReceivedNamespace is the deserialised namespace, whose operations return or throw the same. The bytes must be read on the
// machine on which they were written, by the same build.
//
// The parts come in the order below. TByteWriter defines the encoding of numbers and strings, ValueBytes.h that of values, and
// TRecordedFailure that of failures. A list begins with its length.
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
// Only root classes are asked for instances: ICIMClass::EnumerateInstances visits those of the classes below, too. An instance
// that a provider enumerates for a class, but not for its root class, is missing.
//
// A qualifier is its name, the number of its declaration plus 1 or 0, the flavor and the value. A declaration is the number of
// its class plus 1, and its number in that class; or 0. An ending is 0, or 1 and the failure of the enumeration.
constexpr char const* kNamespaceForm = "zep namespace";
constexpr unsigned int kNamespaceVersion = 1;

enum EClassFlags : unsigned int { kAssociationFlag = 1, kAbstractFlag = 2 };
enum EDeclFlags : unsigned int { kKeyFlag = 1, kKeyFailedFlag = 2, kOwnerFlag = 4 };

enum ERecord : unsigned int {
  kEnd,      // ends the instances of a root class and its subclasses; an ending follows
  kLayout,   // a class, an ending (with the failure, if GetClass failed), and a list of properties: name, declaration
  kInstance  // the index of a layout, the values of its properties (a missing one is followed by its failure), and the path
};

enum EPath : unsigned int {
  kPathFailed,  // the failure follows
  kPathOfKeys,  // a path of the instance's own class; the indexes of its keys among the properties follow
  kPathApart    // any other path, as a reference
};

// Serialises the namespace and passes the bytes to `send` in chunks, in order; the first chunk ends with the classes. Calls the
// provider for every element, so it blocks as long as the provider does. These exceptions pass through: those of the provider for
// which the format has no place, std::bad_alloc, and those of `send`. `noteInstance`, which may be empty, is called after each
// instance with the name of its class.
void WriteNamespace(ICIMNamespace const& ns, std::function<void(std::string_view bytes)> const& send,
                    std::function<void(std::string const& className)> const& noteInstance = {});

}  // namespace NQRVZEP20
