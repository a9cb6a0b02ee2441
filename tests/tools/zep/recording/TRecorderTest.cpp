// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/recording/TRecorder.h"

#include "tests/Support.h"

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
                                  PlugIn("libBad.nsp.so", "it crashed")})
                         .fIndex;
  EXPECT_THAT(index.fPlugIns, ElementsAre("libWhole.nsp.so"));
  std::vector<std::string> notRecorded;
  for (TNotRecorded const& row : index.fNotRecorded) notRecorded.push_back(row.fPlugIn + ": " + row.fReason);
  EXPECT_THAT(
      notRecorded,
      ElementsAre("libPart.nsp.so: what it reads could not be written to the temporary directory; free space in it, or name "
                  "another directory in TMPDIR",
                  "libOther.nsp.so: it does not read through TMachineFiles of zepcore, so its reading cannot be recorded",
                  "libBad.nsp.so: it crashed"));
}

}  // namespace
}  // namespace NQRVZEP20::zep
