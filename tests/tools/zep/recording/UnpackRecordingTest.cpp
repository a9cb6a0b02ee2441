// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/recording/UnpackRecording.h"

#include "tests/Support.h"

#include <gmock/gmock.h>
#include <sys/stat.h>

#include <cstdio>
#include <functional>

namespace NQRVZEP20::zep {
namespace {

using testing::StartsWith;

constexpr char const* kSumOfHello = "5891b5b522d5df086d0ff0b110fbd9d21bb4fc7163af34d08286a2e846f6be03";  // of "hello\n"

struct TPart {
  TMember fMember;
  std::string fContent = {};
};

// A small recording, which a test changes before it is packed.
struct TRecorded {
  TRecordingIndex fIndex;
  std::vector<TPart> fParts;

  void Add(TMember const& member, std::string const& content = "", std::string const& sum = "") {
    fIndex.fMembers.push_back({member, "2026-11-23T04:05:06Z", content.size(), sum});
    fParts.push_back({member, content});
  }
};

TRecorded GoodRecording() {
  TRecorded good;
  good.fIndex.fTime = "2026-11-23T04:05:06Z";
  good.fIndex.fTool = "1.2.3";
  good.Add({EMemberKind::kDirectory, "root", {}, 0700});
  good.Add({EMemberKind::kFile, "root/a", {}, 0400}, "hello\n", kSumOfHello);
  good.Add({EMemberKind::kDirectory, "root/d", {}, 0700});
  good.Add({EMemberKind::kLink, "root/d/l", "../a", 0777});
  good.Add({EMemberKind::kFile, "root/Müller", {}, 0400}, "hello\n", kSumOfHello);
  return good;
}

std::string Packed(std::string const& index, std::vector<TPart> const& parts) {
  auto const archive = NewArchiveWriter();
  archive->Add({EMemberKind::kFile, kIndexName, {}, 0600}, index);
  for (TPart const& part : parts) archive->Add(part.fMember, part.fContent);
  return archive->Finish();
}
std::string Packed(TRecorded const& recorded) { return Packed(TextOf(recorded.fIndex), recorded.fParts); }

class UnpackRecordingTest : public testing::Test {
protected:
  // Why the archive is refused; empty if it is unpacked.
  std::string WhyRefused(std::string const& bytes) {
    TTempDir const to;
    WriteFile(fDir.Path("archive"), bytes);
    try {
      UnpackRecording(fDir.Path("archive"), to.Path());
    } catch (TArchiveError const& failure) {
      return failure.what();
    }
    return "";
  }

  TTempDir fDir;
};

TEST_F(UnpackRecordingTest, AGoodRecordingIsUnpacked) {
  WriteFile(fDir.Path("archive"), Packed(GoodRecording()));
  TTempDir const to;
  EXPECT_EQ(UnpackRecording(fDir.Path("archive"), to.Path()).fTool, "1.2.3");
  EXPECT_EQ(ReadFile(to.Path("root/d/l")), "hello\n");
  EXPECT_EQ(ReadFile(to.Path("root/Müller")), "hello\n");
}

TEST_F(UnpackRecordingTest, AChangedRecordingIsRefusedByNameAndPlace) {
  struct TRow {
    char const* fWhy;
    std::function<void(TRecorded&)> fChange;
  } const rows[] = {
      {"its member root/a was altered: its SHA-256 differs", [](TRecorded& r) { r.fParts[1].fContent = "jello\n"; }},
      {"its member root/a was altered: its SHA-256 differs", [](TRecorded& r) { r.fParts[1].fContent = "hell"; }},
      {"its member root/a was altered: its size differs", [](TRecorded& r) { r.fIndex.fMembers[1].fBytes = 7; }},
      {"its member root/a was altered: its mark differs", [](TRecorded& r) { r.fIndex.fMembers[1].fMark = "listed"; }},
      {"its member root/a is longer than 6 bytes", [](TRecorded& r) { r.fParts[1].fContent = "hello\n\n"; }},
      {"its member root/a was altered",
       [](TRecorded& r) {
         r.fParts[1] = {{EMemberKind::kDirectory, "root/a", {}, 0700}};
       }},
      {"its member root/d/l was altered", [](TRecorded& r) { r.fParts[3].fMember.fTarget = "../b"; }},
      {"it is cut: its member root/Müller is missing", [](TRecorded& r) { r.fParts.pop_back(); }},
      {"its member root/x is foreign, or contained twice", [](TRecorded& r) { r.fParts[1].fMember.fName = "root/x"; }},
      {"its member root/a is foreign, or contained twice", [](TRecorded& r) { r.fParts.push_back(r.fParts[1]); }},
      {"recording.json is not sound: the time soon is invalid", [](TRecorded& r) { r.fIndex.fTime = "soon"; }},
      {"recording.json is not sound: the time 2026-13-01T00:00:00Z is invalid",
       [](TRecorded& r) { r.fIndex.fMembers[1].fTime = "2026-13-01T00:00:00Z"; }},
      {"recording.json is not sound: root/a is named twice",
       [](TRecorded& r) { r.fIndex.fMembers.push_back(r.fIndex.fMembers[1]); }},
      {"recording.json is not sound: the path root/../a leads out of the recording",
       [](TRecorded& r) {
         r.Add({EMemberKind::kFile, "root/../a", {}, 0400});
       }},
      {"recording.json is not sound: the path /etc/passwd leads out of the recording",
       [](TRecorded& r) {
         r.Add({EMemberKind::kFile, "/etc/passwd", {}, 0400});
       }},
      {"recording.json is not sound: root/a/b is not in a directory",
       [](TRecorded& r) {
         r.Add({EMemberKind::kFile, "root/a/b", {}, 0400});
       }},
      {"recording.json is not sound: the files have more than 268435456 bytes",
       [](TRecorded& r) { r.fIndex.fMembers[1].fBytes = std::uint64_t(1) << 40; }},
      {"its link root/out leads out of the recording",
       [](TRecorded& r) {
         r.Add({EMemberKind::kLink, "root/out", "../../etc", 0777});
       }},
      {"its link root/out leads out of the recording",
       [](TRecorded& r) {
         r.Add({EMemberKind::kLink, "root/out", "/etc", 0777});
       }},
      {"its link root/out leads out of the recording",
       [](TRecorded& r) {
         r.Add({EMemberKind::kLink, "root/d/up", "../d", 0777});
         r.Add({EMemberKind::kLink, "root/out", "d/up/up/../../../etc", 0777});
       }},
  };
  for (TRow const& row : rows) {
    TRecorded recorded = GoodRecording();
    row.fChange(recorded);
    EXPECT_EQ(WhyRefused(Packed(recorded)), row.fWhy);
  }
}

TEST_F(UnpackRecordingTest, ThresholdsAreAnObject) {
  auto index = nlohmann::json::parse(TextOf(GoodRecording().fIndex));
  index["thresholds"] = {1};
  EXPECT_EQ(WhyRefused(Packed(index.dump(), GoodRecording().fParts)),
            "recording.json is not sound: the thresholds are not an object");
}

TEST_F(UnpackRecordingTest, ANewerRecordingSaysSo) {
  EXPECT_EQ(WhyRefused(Packed(R"({"recordingVersion": 2, "zepVersion": "9.9.9"})", {})),
            "it is a recording of the version 2, written by zep 9.9.9; this zep reads only the version 1");
  for (std::string const version : {"4294967297", "1.9", "-1", "true"})
    EXPECT_THAT(WhyRefused(Packed("{\"recordingVersion\": " + version + "}", {})),
                StartsWith("it is a recording of the version " + version + ", written by zep ?"));
}

// An index within its 64 MiB could otherwise take minutes or gigabytes.
TEST_F(UnpackRecordingTest, AnIndexBeyondItsBoundsIsRefused) {
  std::string wide = "{";
  for (int at = 0; at < 80000; ++at) wide += "\"" + std::to_string(at) + "\":0,";
  std::string many = "[0";
  for (int at = 0; at < 2000000; ++at) many += ",0";
  EXPECT_EQ(WhyRefused(Packed(std::string(1000000, '['), {})), "recording.json is not sound: the document is nested too deeply");
  EXPECT_EQ(WhyRefused(Packed(wide + "\"x\":0}", {})), "recording.json is not sound: an object has more than 100 members");
  EXPECT_EQ(WhyRefused(Packed(many + "]", {})), "recording.json is not sound: it has more than 2000000 values");
}

TEST_F(UnpackRecordingTest, AForeignOrCutFileIsRefused) {
  std::string const good = Packed(GoodRecording());
  for (std::string const& bytes : {std::string(), std::string("hello"), good.substr(0, good.size() / 2), good.substr(0, 20)})
    EXPECT_THAT(WhyRefused(bytes), testing::AnyOf(StartsWith("it is cut, damaged or not a zstd-compressed tar archive"),
                                                  StartsWith("it is not a recording: its first member is not recording.json")));
  EXPECT_THAT(WhyRefused(Packed("no json", {})), StartsWith("recording.json is not sound: "));
}

TEST_F(UnpackRecordingTest, AFifoIsRefused) {
  ::mkfifo(fDir.Path("recording.json").c_str(), 0600);
  ASSERT_EQ(std::system(("tar -C '" + fDir.Path() + "' -cf '" + fDir.Path("fifo.tar") + "' recording.json").c_str()), 0);
  EXPECT_EQ(WhyRefused(ReadFile(fDir.Path("fifo.tar"))), "it is not a recording: its first member is not recording.json");
}

TEST_F(UnpackRecordingTest, AHardLinkIsRefusedByName) {
  WriteFile(fDir.Path("packed"), Packed(GoodRecording()));
  std::string const repack = "cd '" + fDir.Path() +
                             "' && tar --zstd -xf packed && find root -type f | sort | head -n 1 > name && "
                             "ln -f recording.json \"$(cat name)\" && tar --zstd -cf packed recording.json root";
  ASSERT_EQ(std::system(repack.c_str()), 0);
  std::string name = ReadFile(fDir.Path("name"));
  name.pop_back();
  EXPECT_EQ(WhyRefused(ReadFile(fDir.Path("packed"))), "its member " + name + " was altered");
}

// The old tar programs of GNU stored the names in a directory as its content. Skipping one could take hours.
TEST_F(UnpackRecordingTest, ADirectoryWithAContentIsRefused) {
  std::string header(512, '\0');
  auto const put = [&header](std::size_t at, std::string const& text) { header.replace(at, text.size(), text); };
  put(0, "root");
  put(100, "0000700");
  put(124, "77777777777");
  put(148, "        ");
  put(156, "D");
  put(257, "ustar  ");
  unsigned sum = 0;
  for (char const byte : header) sum += static_cast<unsigned char>(byte);
  char digits[8];
  std::snprintf(digits, sizeof digits, "%06o", sum);
  put(148, digits);
  EXPECT_EQ(WhyRefused(header), "its member root has a content, but is not a file");
}

}  // namespace
}  // namespace NQRVZEP20::zep
