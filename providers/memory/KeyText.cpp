#include "KeyText.h"

#include "CIMNames.h"
#include "ICIMClass.h"

#include <map>

namespace NQRVZEP20 {

namespace {

std::string ValueText(TCIMValue const& value) {
  if (!value.IsReference()) return value.ToString();
  const TCIMReference path = value;
  const boost::shared_ptr<ICIMClass> cls = path.GetClass();
  return (cls ? FoldName(cls->GetName(TCIMContext())) : std::string()) + "." + KeyText(path);
}

}  // namespace

std::string KeyText(TCIMReference const& path) {
  std::map<std::string, std::string> keys;
  path.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> const& binding) {
    if (!binding.second.IsNull()) keys.emplace(FoldName(binding.first), ValueText(binding.second));
    return true;
  });

  std::string text;  // each value behind its length, so that no value can look like two
  for (auto const& [name, value] : keys) text += name + "=" + std::to_string(value.size()) + ":" + value;
  return text;
}

}  // namespace NQRVZEP20
