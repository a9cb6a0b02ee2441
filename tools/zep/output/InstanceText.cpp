// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/InstanceText.h"

#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "collect/TValueWords.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Text.h"

namespace NQRVZEP20::zep {

std::string Heading(TNamespaceView const& view, std::string const& text) {
  std::string const& label = view.GetSampleLabel();
  return Printable(label.empty() ? text : label + " " + text) + "\n\n";
}

std::string InstanceAsText(TNamespaceView const& view, ICIMInstance const& instance) {
  TTable table({24, 10, 42});
  table.Add({"Property", "Type", "Value"});
  instance.EnumerateProperties(
      [&](boost::shared_ptr<ICIMProperty> property) {
        std::string const name = property->GetName(TCIMContext());
        TCIMValue const value = property->GetValue(TCIMContext());
        std::string const reason = value.IsNull() ? ": " + view.WhyMissing(instance, name).fReason : "";
        TValueWords const words(*property->GetDeclaration(TCIMContext()));
        table.Add({name, NameOf(value.GetType()), words.TextOf(value) + reason});
        return true;
      },
      TCIMContext());
  return Heading(view, view.PathOf(instance)) + table.GetText();
}

}  // namespace NQRVZEP20::zep
