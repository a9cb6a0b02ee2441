// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMInstance.h"
#include "collect/TAnswer.h"
#include "collect/TNamespaceView.h"

#include <boost/shared_ptr.hpp>
#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// An instance as a rule reads it: typed answers by property name. An answer is the value, or the reason why it is missing; a
// value of another type is missing with the code unexpected-form.
//
// Shares ownership of the instance; refers to the view, which must outlive it. Exceptions of the provider pass through.
class TElement {
public:
  TElement(TNamespaceView const& view, boost::shared_ptr<ICIMInstance> instance);

  std::string Path() const { return fView->PathOf(*fInstance); }

  // ElementName, or without one DeviceID, Name or Tag: the name that a person uses. Empty if there is none.
  std::string Label() const;

  // The text of a property that names the element, such as a key. Without one, which only a faulty plug-in leaves out: the path.
  std::string NameIn(std::string const& property) const;

  TAnswer<TCIMValue> Value(std::string const& property) const { return fView->Answer(*fInstance, property); }
  TAnswer<std::string> Text(std::string const& property) const;      // of a value that is not an array
  TAnswer<std::uint64_t> Number(std::string const& property) const;  // of a whole number that is not negative
  TAnswer<double> Real(std::string const& property) const;           // of any number
  TAnswer<bool> Flag(std::string const& property) const;
  TAnswer<std::vector<std::string>> Texts(std::string const& property) const;  // the elements of an array, of any type

  // The value of a key in the reference that the property holds: KeyOf("Antecedent", "DeviceID").
  TAnswer<std::string> KeyOf(std::string const& property, std::string const& key) const;

private:
  TNamespaceView const* fView;
  boost::shared_ptr<ICIMInstance> fInstance;
};

}  // namespace NQRVZEP20
