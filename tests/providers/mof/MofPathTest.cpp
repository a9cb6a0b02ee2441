// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/MofValues.h"
#include "tests/providers/mof/MofTexts.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

using testing::HasSubstr;

TEST(MofPathTest, KeysOfEveryTypeAreReadFromPaths) {
  auto const ns = Read(
      "class X_K { [Key] string S; [Key] boolean B; [Key] sint8 N; [Key] real64 R; [Key] datetime D; [Key] char16 C; };"
      "class X_L { [Key] X_K REF K; }; class X_M { X_L REF L; };"
      "class X_Disk { X_M REF M; };"
      "instance of X_M { L = \"X_L.K=\\\"X_K.S=\\\\\\\"a,\\\\\\\\\\\\\\\"=b\\\\\\\",B=TRUE,N=-5,R=0.5,"
      "D=\\\\\\\"20070315143000.000000+060\\\\\\\",C=','\\\"\"; };");
  auto const instance = All(*ns->GetClass("X_M", kNone), &ICIMClass::EnumerateInstances).front();
  TCIMReference const link = instance->GetProperty("L", kNone)->GetValue(kNone);
  link.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> const& key) {
    EXPECT_EQ(key.second.ToString(), "X_K.B=\"true\",C=\"44\",D=\"20070315143000.000000+060\",N=\"-5\",R=\"0.5\",S=\"a,\\\"=b\"");
    return true;
  });
  EXPECT_EQ(link.GetClassName(), "X_L");
}

// In the form in which the library prints paths.
TEST(MofPathTest, KeysOfEveryTypeMayBeQuoted) {
  auto const ns = Read(
      "class X_K { [Key] boolean B; [Key] sint8 N; [Key] real64 R; [Key] char16 C; X_K REF Next; };"
      "instance of X_K { B = true; Next = \"X_K.B=\\\"false\\\",C=\\\"65\\\",N=\\\"-5\\\",R=\\\"0.5\\\"\"; };");
  auto const instance = All(*ns->GetClass("X_K", kNone), &ICIMClass::EnumerateInstances).front();
  EXPECT_EQ(instance->GetProperty("Next", kNone)->GetValue(kNone).ToString(), "X_K.B=\"false\",C=\"65\",N=\"-5\",R=\"0.5\"");
}

TEST(MofPathTest, MalformedPathsAreRefused) {
  for (char const* path : {"",
                           ".",
                           "X_Disk.",
                           "X_Disk.Id",
                           "X_Disk.Id=",
                           "X_Disk.Id=x",
                           "X_Disk.Id=1,",
                           "X_Disk.Id=1;Id=2",
                           "X_Disk.Id=\\\"1",
                           "X_Disk.Id=1 2",
                           "X_Disk.Size=1",
                           "X_Disk.Id==1",
                           "X_Disk.Id={1}",
                           "X_Disk.Id=NULL",
                           "X_Disk.Id=256x",
                           "X_Disk.Id=\\\"\\\"",
                           "X_Disk.Id=\\\"x\\\"",
                           "X_Disk.Id=-1",
                           "=",
                           ":",
                           "X_Disk:"})
    EXPECT_THAT(ErrorOf(std::string(kDisks) + "instance of X_Disk { Mirror = \"" + path + "\"; };"),
                HasSubstr("expected the path of an object"))
        << path;
}

TEST(MofPathTest, AnErrorHasThePositionOfThePath) {
  ExpectErrors({
      {kDisks + std::string("instance of X_Disk { Mirror = \"X_Disc.Id=1\"; };"),
       "3:31: expected the path of an object whose class is declared, such as \"X_Disk.Id=5\""},
  });
}

TEST(MofPathTest, APathIsReadBackAsItIsWritten) {
  auto const ns = Read(std::string("class X_K { [Key] string S; [Key] boolean B; [Key] sint8 N; };") + kDisks);
  TMofFile const file{"path", "path"};
  for (char const* text : {R"(X_K.B=TRUE,N=-5,S="a, \"b\"")", "X_Disk.Id=5", R"(X_Link.From="X_Disk.Id=1",To="X_Disk.Id=2")"}) {
    SCOPED_TRACE(text);
    TCIMReference const path = ReadMofPath(text, {&file, file.fText}, ns);
    EXPECT_EQ(MofPathText(path), text);
  }
}

TEST(MofPathTest, APathWithoutAClassIsNotWritten) {
  EXPECT_STATUS(MofPathText(TCIMReference(NewNamespace(), kNone)), kZEPStatusNotSupported);
}

}  // namespace
}  // namespace NQRVZEP20
