// SPDX-License-Identifier: Apache-2.0
#include "tests/providers/mof/MofTexts.h"

namespace NQRVZEP20 {
namespace {

using testing::HasSubstr;

std::vector<std::string> PathsOf(ICIMNamespace const& ns, std::string const& cls) {
  return InstancePaths(*ns.GetClass(cls, kNone));
}

TCIMValue ValueOf(ICIMNamespace const& ns, std::string const& path, std::string const& property) {
  TCIMReference const reference(boost::const_pointer_cast<ICIMNamespace>(ns.GetClass("X_Disk", kNone)->GetNamespace(kNone)),
                                "ns:" + path, kNone);
  return boost::dynamic_pointer_cast<ICIMInstance>(reference.GetCIMElement(false))->GetProperty(property, kNone)->GetValue(kNone);
}

TEST(TMofInstancesTest, InstancesHaveTheirValues) {
  auto const ns = Read(std::string(kDisks) +
                       "instance of X_Disk { Id = 1; Name = \"sda\"; Sizes = {5, 6}; };\n"
                       "[Description(\"dropped\")] INSTANCE OF x_disk { [Key] id = 0x2; Name = NULL; };\n"
                       "instance of X_Disk { Id = 3; };");
  EXPECT_THAT(PathsOf(*ns, "X_Disk"), ElementsAre("X_Disk.Id=\"1\"", "X_Disk.Id=\"2\"", "X_Disk.Id=\"3\""));
  EXPECT_EQ(ValueOf(*ns, "X_Disk.Id=\"1\"", "Name").ToString(), "sda");
  EXPECT_EQ(ValueOf(*ns, "X_Disk.Id=\"1\"", "Sizes").ToString(), "{ 5, 6 }");
  EXPECT_EQ(ValueOf(*ns, "X_Disk.Id=\"1\"", "Sizes").GetMaxArraySize(), 4u);
  EXPECT_TRUE(ValueOf(*ns, "X_Disk.Id=\"2\"", "Name").IsNull());
  EXPECT_EQ(ValueOf(*ns, "X_Disk.Id=\"3\"", "Name").ToString(), "unnamed");
}

TEST(TMofInstancesTest, AReferenceIsAPathOrAnAlias) {
  auto const ns = Read(std::string(kDisks) +
                       "instance of X_Link { From = $A; To = \"X_Disk.Id=2\"; };\n"
                       "instance of X_Disk as $a { Id = 1; Mirror = $B; };\n"
                       "instance of X_Disk as $B { Id = 2; Mirror = $A; };\n"
                       "instance of X_Link { From = \"root/x:X_Disk.Id=\\\"2\\\"\"; To = \"//h.example/ns:x_disk.id=0x1\"; };");
  EXPECT_THAT(PathsOf(*ns, "X_Link"), ElementsAre("X_Link.From=\"X_Disk.Id=\"1\"\",To=\"X_Disk.Id=\"2\"\"",
                                                  "X_Link.From=\"X_Disk.Id=\"2\"\",To=\"X_Disk.id=\"1\"\""));
  EXPECT_EQ(ValueOf(*ns, "X_Disk.Id=\"1\"", "Mirror").ToString(), "X_Disk.Id=\"2\"");
  EXPECT_EQ(ValueOf(*ns, "X_Disk.Id=\"2\"", "Mirror").ToString(), "X_Disk.Id=\"1\"");
}

TEST(TMofInstancesTest, KeysThatDependOnThemselvesAreRefused) {
  constexpr char kNodes[] = "class X_N { [Key] X_N REF Next; };\n";
  EXPECT_EQ(ErrorOf(std::string(kNodes) + "instance of X_N as $A { Next = $A; };"), "3:32: the keys of $A depend on themselves");
  EXPECT_EQ(ErrorOf(std::string(kNodes) + "instance of X_N as $A { Next = $B; };\ninstance of X_N as $B { Next = $A; };"),
            "4:32: the keys of $A depend on themselves");

  std::string chain = kNodes;
  for (int at = 0; at < 30; ++at)
    chain += "instance of X_N as $N" + std::to_string(at) + " { Next = $N" + std::to_string(at + 1) + "; };\n";
  EXPECT_THAT(ErrorOf(chain + "instance of X_N as $N30 { };"),
              HasSubstr("keys refer to other instances more than 8 levels deep"));
}

TEST(TMofInstancesTest, AWrongInstanceIsNamed) {
  ExpectErrors({
      {"instance of X_A { };", "2:13: X_A is not a declared class"},
      {kDisks + std::string("instance of X_Thing { };"), "3:13: X_Thing is abstract and cannot have instances"},
      {kDisks + std::string("instance of X_Disk { Size = 1; };"), "3:22: Size is not a property of the class"},
      {kDisks + std::string("instance of X_Disk { Id = 1; ID = 2; };"), "3:30: ID already has a value"},
      {kDisks + std::string("instance of X_Disk { Id = 1; };\ninstance of X_Disk { Id = 1; };"),
       "4:13: X_Disk already has an instance with the same keys"},
      {kDisks + std::string("instance of X_Disk { Id = $A; };"), "3:27: $A is not the alias of any instance"},
      {kDisks + std::string("instance of X_Disk as $A { Id = 1; Name = $A; };"), "3:36: Name is not a reference"},
      {kDisks + std::string("instance of X_Disk as $A { Id = 1; }; instance of X_Disk as $a { Id = 2; };"),
       "3:61: $a is already the alias of another instance"},
  });
}

}  // namespace
}  // namespace NQRVZEP20
