// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/recording/TRecorder.h"

#include "tests/Support.h"
#include "tools/zep/output/Failure.h"

#include <gmock/gmock.h>

#include <cstdlib>
#include <filesystem>

namespace NQRVZEP20::zep {
namespace {

namespace fs = std::filesystem;

using testing::ElementsAre;

class TRecorderTest : public testing::Test {
protected:
  // Writes a note, as a plug-in does that reads through TMachineFiles.
  static void Note(std::string const& plugIn, fs::perms permissions) {
    fs::path const note = fs::path(std::getenv("ZEP_ROOT")) / "zep-plug-ins" / plugIn;
    fs::create_directories(note.parent_path());
    WriteFile(note.string(), "");
    fs::permissions(note, permissions);
  }

  static TPlugIn PlugIn(std::string const& name, std::string const& error = "") { return {"", "/usr/lib/" + name, 0, error, {}}; }
};

TEST_F(TRecorderTest, EachPlugInIsRecordedOrHasTheReason) {
  TRecorder const recorder;
  Note("libWhole.nsp.so", fs::perms::owner_read);
  Note("libPart.nsp.so", fs::perms::owner_read | fs::perms::owner_write);
  auto const index = recorder
                         .Finish({PlugIn("libWhole.nsp.so"), PlugIn("libPart.nsp.so"), PlugIn("libOther.nsp.so"),
                                  PlugIn("libBad.nsp.so", "it crashed")},
                                 {})
                         .fIndex;
  EXPECT_THAT(index.fPlugIns, ElementsAre("libWhole.nsp.so"));
  std::vector<std::string> notRecorded;
  for (TNotRecorded const& row : index.fNotRecorded) notRecorded.push_back(row.fFile + ": " + row.fReason);
  EXPECT_THAT(
      notRecorded,
      ElementsAre("libPart.nsp.so: what it reads could not be written to the temporary directory; free space in it, or name "
                  "another directory in TMPDIR",
                  "libOther.nsp.so: it does not read through TMachineFiles of zepcore, so its reading cannot be recorded",
                  "libBad.nsp.so: it crashed"));
}

TEST_F(TRecorderTest, ALossIsAFailureThatNamesThePlugInAndTheRemedy) {
  TRecorder const recorder;
  EXPECT_NO_THROW(recorder.CheckNothingIsLost());
  Note("libWhole.nsp.so", fs::perms::owner_read);
  EXPECT_NO_THROW(recorder.CheckNothingIsLost());
  Note("libPart.nsp.so", fs::perms::owner_read | fs::perms::owner_write);
  try {
    recorder.CheckNothingIsLost();
    FAIL() << "no loss was found";
  } catch (TFailure const& failure) {
    EXPECT_EQ(failure.fStatus, kExitNotWritten);
    EXPECT_STREQ(failure.what(),
                 "the report would not be complete: libPart.nsp.so: what it reads could not be written to the temporary "
                 "directory; free space in it, or name another directory in TMPDIR");
  }
}

TEST_F(TRecorderTest, AFileWhoseNameIsNotUtf8IsLeftOutAndNamed) {
  TRecorder const recorder;
  Note("libWhole.nsp.so", fs::perms::owner_read);
  fs::path const root = std::getenv("ZEP_ROOT");
  WriteFile((root / "a\xff").string(), "");
  WriteFile((root / "b").string(), "");
  fs::create_symlink("x\xff", root / "c");
  TRecordingIndex const index = recorder.Finish({PlugIn("libWhole.nsp.so")}, {}).fIndex;
  std::vector<std::string> names, left;
  for (TRecordedMember const& member : index.fMembers) names.push_back(member.fMember.fName);
  for (TNotRecorded const& row : index.fNotRecorded) left.push_back(row.fFile);
  EXPECT_THAT(names, ElementsAre("root", "root/b", "root/zep-plug-ins", "root/zep-plug-ins/libWhole.nsp.so"));
  EXPECT_THAT(left, testing::UnorderedElementsAre("root/a\xff", "root/c"));
  EXPECT_EQ(index.fNotRecorded[0].fReason, "the name of this file, or the target of this link, is not UTF-8");
}

// The bytes become escapes in the index.
TEST_F(TRecorderTest, AReasonThatIsNotUtf8DoesNotPreventTheRecording) {
  TRecordingIndex const index = TRecorder().Finish({PlugIn("libBad.nsp.so", "it \xff")}, {}).fIndex;
  EXPECT_EQ(IndexFrom(TextOf(index)).fNotRecorded.at(0).fFile, "libBad.nsp.so");
  EXPECT_EQ(IndexFrom(TextOf(index)).fNotRecorded.at(0).fReason, "it \\xff");
}

TEST_F(TRecorderTest, TheThresholdsAndTheDirectoryOfThePlugInsAreRecorded) {
  TThresholds thresholds;
  thresholds.fFileSystemFreePercent = 99;
  TRecordingIndex const index = IndexFrom(TextOf(TRecorder().Finish({}, thresholds).fIndex));
  EXPECT_EQ(index.fThresholds.Settings(), thresholds.Settings());
  EXPECT_EQ(index.fPlugInDirectory, PlugInDirectory());
}

}  // namespace
}  // namespace NQRVZEP20::zep
