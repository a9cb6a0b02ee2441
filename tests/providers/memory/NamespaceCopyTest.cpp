// SPDX-License-Identifier: Apache-2.0

// A copy that is made only through the interfaces equals its source.

#include "Collect.h"
#include "ICIMQualifierDecl.h"

#include <sstream>

namespace NQRVZEP20 {
namespace {

// ---- A namespace as text, one line for each element ----

std::string TextOf(TCIMValue const& value) {
  std::string text = std::to_string(value.GetType()) + "/" + std::to_string(value.GetMaxArraySize());
  if (value.IsReference() && value.GetReferencedClass()) text += " to " + value.GetReferencedClass()->GetName(kNone);
  return text + " " + (value.IsNull() ? "NULL" : "'" + value.ToString() + "'");
}

void DumpQualifiers(std::ostream& out, std::string const& indent, ICIMNamedElement const& element) {
  for (auto const& qualifier : All(element, &ICIMNamedElement::EnumerateQualifiers))
    out << indent << "[" << qualifier->GetName(kNone) << " " << TextOf(qualifier->GetValue(kNone)) << " flavor "
        << qualifier->GetFlavor(kNone) << "]\n";
}

void DumpMethod(std::ostream& out, ICIMMethodDecl const& method) {
  out << "  method " << method.GetName(kNone) << " returns " << method.GetReturnType(kNone) << "\n";
  DumpQualifiers(out, "    ", method);
  for (auto const& parameter : All(method, &ICIMMethodDecl::EnumerateParameterDecls)) {
    out << "    parameter " << parameter->GetName(kNone) << " " << static_cast<int>(parameter->GetType(kNone)) << "/"
        << parameter->GetMaxArraySize(kNone) << " " << parameter->GetReferencedClassName(kNone) << "\n";
    DumpQualifiers(out, "      ", *parameter);
  }
}

void DumpInstances(std::ostream& out, ICIMClass const& cls) {
  for (auto const& instance : All(cls, &ICIMClass::EnumerateInstances)) {
    if (instance->GetClass(kNone).get() != &cls) continue;
    out << "  instance " << instance->GetPath(kNone).GetPath() << "\n";
    for (auto const& property : All(*instance, &ICIMInstance::EnumerateProperties))
      out << "    " << property->GetName(kNone) << " = " << TextOf(property->GetValue(kNone)) << "\n";
  }
}

void DumpClass(std::ostream& out, ICIMClass const& cls) {
  out << "class " << cls.GetName(kNone) << " : " << (cls.IsRootClass(kNone) ? "-" : cls.GetSuperClass(kNone)->GetName(kNone))
      << (cls.GetClassFlag(kNone) ? " association" : "") << (cls.IsAbstract(kNone) ? " abstract" : "") << "\n";
  DumpQualifiers(out, "  ", cls);
  for (auto const& property : All(cls, &ICIMClass::EnumeratePropertyDecls)) {
    out << "  property " << property->GetName(kNone) << (property->IsKey(kNone) ? " key " : " ")
        << TextOf(property->GetDefaultValue(kNone)) << "\n";
    DumpQualifiers(out, "    ", *property);
  }
  for (auto const& property : All(cls, &ICIMClass::EnumerateStaticProperties))
    out << "  static " << property->GetName(kNone) << " = " << TextOf(property->GetValue(kNone)) << "\n";
  for (auto const& method : All(cls, &ICIMClass::EnumerateMethodDecls)) DumpMethod(out, *method);
  DumpInstances(out, cls);
}

std::string Dump(ICIMNamespace const& ns) {
  std::ostringstream out;
  for (auto const& decl : All(ns, &ICIMNamespace::EnumerateQualifierDecls))
    out << "qualifier " << decl->GetName(kNone) << " " << TextOf(decl->GetDefaultValue(kNone)) << " scope "
        << decl->GetScope(kNone) << " flavor " << decl->GetFlavor(kNone) << "\n";
  for (auto const& root : All(ns, &ICIMNamespace::EnumerateClasses)) {
    DumpClass(out, *root);
    for (auto const& cls : All(*root, &ICIMClass::EnumerateSubClasses)) DumpClass(out, *cls);
  }
  return out.str();
}

// ---- A copy, through the interfaces only ----

TCIMValue CopyOf(TCIMValue const& value, boost::shared_ptr<ICIMNamespace> ns);

TCIMValue CopyOfReference(TCIMValue const& value, boost::shared_ptr<ICIMNamespace> ns) {
  if (value.IsNull()) {
    TCIMValue null(value);
    if (value.GetReferencedClass()) null.SetReferencedClass(ns->GetClass(value.GetReferencedClass()->GetName(kNone), kNone));
    return null;
  }
  TCIMReference const source = value;
  TCIMReference path(ns, source.GetClassName(), kNone);
  source.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> const& key) {
    path.AddKeyValue(key.first, CopyOf(key.second, ns));
    return true;
  });
  return TCIMValue(path);
}

TCIMValue CopyOf(TCIMValue const& value, boost::shared_ptr<ICIMNamespace> ns) {
  return value.IsReference() ? CopyOfReference(value, ns) : value;
}

void CopyQualifiers(ICIMNamedElement const& from, ICIMNamedElement& to, ICIMNamespace const& ns) {
  for (auto const& qualifier : All(from, &ICIMNamedElement::EnumerateQualifiers))
    to.AddQualifier(ns.GetQualifierDecl(qualifier->GetName(kNone), kNone), qualifier->GetValue(kNone),
                    qualifier->GetFlavor(kNone), kNone);
}

void CopyMethod(ICIMMethodDecl const& from, ICIMClass& cls, ICIMNamespace const& ns) {
  auto const to = cls.AddMethodDecl(from.GetName(kNone), from.GetReturnType(kNone), kNone);
  CopyQualifiers(from, *to, ns);
  for (auto const& parameter : All(from, &ICIMMethodDecl::EnumerateParameterDecls)) {
    auto const copy = to->AddParameterDecl(parameter->GetName(kNone), parameter->GetType(kNone),
                                           parameter->GetMaxArraySize(kNone), parameter->GetReferencedClassName(kNone), kNone);
    CopyQualifiers(*parameter, *copy, ns);
  }
}

void CopyClass(ICIMClass const& from, boost::shared_ptr<ICIMNamespace> ns) {
  boost::shared_ptr<ICIMClass> superClass;
  if (!from.IsRootClass(kNone)) superClass = ns->GetClass(from.GetSuperClass(kNone)->GetName(kNone), kNone);
  auto const to = ns->CreateClass(superClass, from.GetName(kNone), kNone);
  CopyQualifiers(from, *to, *ns);

  to->BeginDeclarations(kNone);
  for (auto const& property : All(from, &ICIMClass::EnumeratePropertyDecls)) {
    auto const declared = to->GetPropertyDecl(property->GetName(kNone), kNone);  // may belong to a superclass; must not throw
    auto const copy = to->AddPropertyDecl(property->GetName(kNone), CopyOf(property->GetDefaultValue(kNone), ns), kNone);
    EXPECT_NE(copy, declared);
    CopyQualifiers(*property, *copy, *ns);
  }
  to->EndDeclarations(kNone);

  for (auto const& property : All(from, &ICIMClass::EnumerateStaticProperties))
    to->SetStaticProperty(property->GetName(kNone), CopyOf(property->GetValue(kNone), ns), kNone);
  for (auto const& method : All(from, &ICIMClass::EnumerateMethodDecls)) CopyMethod(*method, *to, *ns);
}

void CopyInstance(ICIMInstance const& from, boost::shared_ptr<ICIMNamespace> ns) {
  auto const cls = ns->GetClass(from.GetClass(kNone)->GetName(kNone), kNone);
  auto const to = cls->CreateInstance(kNone);
  for (auto const& property : All(from, &ICIMInstance::EnumerateProperties))
    to->GetProperty(property->GetName(kNone), kNone)->SetValue(CopyOf(property->GetValue(kNone), ns), kNone);
  cls->CommitInstance(to, kNone);
}

// The classes in two passes, associations in the second; then the instances of the root classes and of all classes below.
void CopyNamespace(ICIMNamespace const& from, boost::shared_ptr<ICIMNamespace> to) {
  for (auto const& decl : All(from, &ICIMNamespace::EnumerateQualifierDecls))
    to->CreateQualifierDecl(decl->GetName(kNone), decl->GetDefaultValue(kNone), decl->GetScope(kNone), decl->GetFlavor(kNone),
                            kNone);
  for (bool const pass : {false, true})
    for (auto const& root : All(from, &ICIMNamespace::EnumerateClasses)) {
      if (root->GetClassFlag(kNone) == pass) CopyClass(*root, to);
      for (auto const& cls : All(*root, &ICIMClass::EnumerateSubClasses))
        if (cls->GetClassFlag(kNone) == pass) CopyClass(*cls, to);
    }
  for (auto const& root : All(from, &ICIMNamespace::EnumerateClasses))
    for (auto const& instance : All(*root, &ICIMClass::EnumerateInstances)) CopyInstance(*instance, to);
}

// ---- A source with one of everything ----

boost::shared_ptr<TMemoryNamespace> NewSource() {
  auto const ns = NewNamespace();
  ns->CreateQualifierDecl("X_Words", TCIMValue(TType::kCIMTypeString, 3, {TCIMValue("a"), TCIMValue("b")}),
                          ICIMQualifierDecl::kScopeClass, ICIMQualifierDecl::kFlavorTranslatable, kNone);
  ns->DefineClass("X_Device")
      .Abstract()
      .Description("What has an Id.")
      .Qualifier("X_Words", TCIMValue(TType::kCIMTypeString, 3, {TCIMValue("c")}))
      .Key("Id", "uint32")
      .Property("Name", "string", "unnamed")
      .Static("Count", "uint16", 2)
      .Method("Reset", "uint32")
      .Description("Starts anew.")
      .In("Force", "boolean")
      .Out("Log", "string[8]");
  ns->DefineClass("X_Disk", "X_Device")
      .Property("Name", "string")
      .Override()
      .Property("State", "uint8", 1)
      .ValueMap({"0", "1"}, {"Unknown", "Ready"})
      .Property("Letter", "char16", TCIMChar16(67))
      .Property("Installed", "datetime", TCIMDateTime("20070315143000.000000+060"))
      .Property("Serial", "uint8[16]")
      .Property("Load", "real64", 0.5);
  std::string superClass = "X_Disk";
  for (int depth = 3; depth <= 9; ++depth) {
    std::string const name = "X_Disk" + std::to_string(depth);
    ns->DefineClass(name, superClass).Property("Depth" + std::to_string(depth), "sint64", -depth);
    superClass = name;
  }
  ns->DefineClass("X_Plain");  // before the associations, which a copy creates last
  auto link = ns->DefineClass("X_Link").Association().KeyReference("From", "X_Device").KeyReference("To", "X_Device");
  link.Class()
      ->AddMethodDecl("Move", TType::kCIMTypeBoolean, kNone)
      ->AddParameterDecl("Where", TType::kCIMTypeReference, 0, "X_Disk", kNone);
  ns->DefineClass("X_FastLink", "X_Link").Reference("Instead", "X_Link");

  auto const disk =
      ns->AddInstance("X_Disk", {{"Id", 1},
                                 {"Name", "a\"b\\c"},
                                 {"Serial", TCIMValue(TType::kCIMTypeUint8, 0, {TCIMValue(static_cast<unsigned char>(1))})}});
  auto const deep = ns->AddInstance("X_Disk9", {{"Id", 1}, {"Depth9", 9}, {"Letter", TCIMValue()}});
  auto const slow = ns->AddInstance("X_Link", {{"From", disk->GetReference()}, {"To", deep->GetReference()}});
  ns->AddInstance("X_FastLink",
                  {{"From", deep->GetReference()}, {"To", disk->GetReference()}, {"Instead", slow->GetReference()}});
  ns->AddInstance("X_Plain", {});
  ns->AddInstance("X_Plain", {});
  return ns;
}

TEST(NamespaceCopyTest, TheTextOfANamespaceContainsEverything) {
  std::string const text = Dump(*NewSource());
  for (char const* line : {
           "qualifier Key 1/0 'false' scope 24 flavor 2\n",
           "qualifier X_Words 29/3 '{ a, b }' scope 1 flavor 4\n",
           "class X_Device : - abstract\n  [Abstract 1/0 'true' flavor 1]\n",
           "  [X_Words 29/3 '{ c }' flavor 4]\n",
           "  property Id key 6/0 NULL\n    [Key 1/0 'true' flavor 2]\n",
           "  property Serial 18/16 NULL\n",
           "  property Letter 12/0 '67'\n",
           "  static Count = 4/0 '2'\n",
           "  method Reset returns uint32\n",
           "    parameter Log 29/8 \n      [In 1/0 'false' flavor 2]\n      [Out 1/0 'true' flavor 2]\n",
           "    parameter Where 15/0 X_Disk\n",
           "class X_Disk9 : X_Disk8\n",
           "class X_FastLink : X_Link association\n  property Instead 15/0 to X_Link NULL\n",
           "  instance X_Disk.Id=\"1\"\n    Id = 6/0 '1'\n    Name = 13/0 'a\"b\\c'\n",
           "    Serial = 18/16 '{ 1 }'\n",
           "    From = 15/0 to X_Disk9 'X_Disk9.Id=\"1\"'\n",
       })
    EXPECT_THAT(text, testing::HasSubstr(line));
}

TEST(NamespaceCopyTest, CopyThroughTheInterfacesEqualsItsSource) {
  auto source = NewSource();
  std::string const text = Dump(*source);
  auto const copy = boost::make_shared<TMemoryNamespace>("root/copy");
  CopyNamespace(*source, copy);
  EXPECT_EQ(Dump(*copy), text);

  source.reset();  // the copy must not depend on it
  EXPECT_EQ(Dump(*copy), text);
}

TEST(NamespaceCopyTest, CopiedReferencesLeadToCopiedInstances) {
  auto const source = NewSource();
  auto const copy = boost::make_shared<TMemoryNamespace>("root/copy");
  CopyNamespace(*source, copy);
  auto const link = All(*copy->GetClass("X_FastLink", kNone), &ICIMClass::EnumerateInstances).front();
  TCIMReference const from = link->GetProperty("From", kNone)->GetValue(kNone);
  EXPECT_EQ(from.GetCIMElement(false), All(*copy->GetClass("X_Disk9", kNone), &ICIMClass::EnumerateInstances).front());
  EXPECT_EQ(copy->GetInstance(link->GetPath(kNone), kNone), link);
}

}  // namespace
}  // namespace NQRVZEP20
