// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPStatusCode.h"
#include "core/Handles.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// Where to find a library: the names, in the order in which they are tried, and the mode for dlopen.
struct TLibraryPlace {
  std::vector<std::string> fNames;
  int fMode;
};

// The result of opening a library.
struct TLoadOutcome {
  enum EKind { kComplete, kNotLoaded, kFunctionMissing };

  EKind fKind = kComplete;
  std::string fReason;  // why it failed: the dynamic linker's message, if there is one

  explicit operator bool() const { return fKind == kComplete; }
};

// A row of a table of functions: the name of the function, and the pointer that receives its address.
class TLibraryFunction {
public:
  enum ENeed { kRequired, kOptional };  // the pointer to an optional function is null if the library lacks it

  template <class TFunction>
  TLibraryFunction(char const* name, TFunction*& function, ENeed need = kRequired)
      : fName(name), fNeed(need), fFunction(&function), fFind(&Find<TFunction>) {}

  // False when a required function is missing.
  bool FindIn(void* library) const { return fFind(library, *this) || fNeed == kOptional; }

private:
  template <class TFunction>
  static bool Find(void* library, TLibraryFunction const& row) {
    auto*& function = *static_cast<TFunction**>(row.fFunction);
    function = FunctionOf<TFunction>(library, row.fName);
    return function != nullptr;
  }

  char const* fName;
  ENeed fNeed;
  void* fFunction;  // TFunction**
  bool (*fFind)(void*, TLibraryFunction const&);
};

// Opens the library under the first name that can be loaded. Returns null if there is none, or if the library lacks a function
// that the table requires. `outcome` receives the result.
TSharedLibrary OpenLibrary(TLibraryPlace const& place, std::vector<TLibraryFunction> const& table, TLoadOutcome& outcome);

// The status code that represents the outcome in log lines.
EZEPStatusCode StatusOf(TLoadOutcome const& outcome);

// A library opened at run time, and its functions. The library is closed with the object.
//
// TFunctions holds a pointer to each function. Its member Place() returns where the library is, and its member Table()
// returns one row for each pointer:
//
//   struct TClockFunctions {
//     decltype(ReadClock)* fRead = nullptr;
//
//     static TLibraryPlace Place() { return {{"libclock.so"}, RTLD_NOW}; }
//     std::vector<TLibraryFunction> Table() { return {{"ReadClock", fRead}}; }
//   };
//   TLoadedLibrary<TClockFunctions> const clock;
//   if (clock.Outcome()) clock->fRead();
template <class TFunctions>
class TLoadedLibrary {
public:
  TLoadedLibrary() : fLibrary(OpenLibrary(TFunctions::Place(), fFunctions.Table(), fOutcome)) {}

  // An incomplete library is closed immediately; its functions must not be called.
  TLoadOutcome const& Outcome() const { return fOutcome; }

  TFunctions const& operator*() const { return fFunctions; }
  TFunctions const* operator->() const { return &fFunctions; }

private:
  TLoadOutcome fOutcome;
  TFunctions fFunctions;
  TSharedLibrary fLibrary;
};

}  // namespace NQRVZEP20
