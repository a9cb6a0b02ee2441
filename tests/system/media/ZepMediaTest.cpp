// zep media and zep report --to-media on loop devices, and media that fail.

#include "tests/system/media/MediaSupport.h"
#include "tests/tools/zep/Zep.h"

#include <gmock/gmock.h>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

class ZepMediaTest : public testing::Test {
protected:
  void SetUp() override { NEEDS_IMAGES(); }

  // In a child, with zep at hand.
  template <class TFunction>
  std::string WithZep(TFunction function) {
    return InChild([&] {
      MakeMountPoints();
      installation_.emplace();
      std::string const text = function();
      installation_.reset();
      return text;
    });
  }

  std::string Zep(std::vector<std::string> const& arguments) {
    TRun const run = installation_->Run({arguments});
    return run.output + run.errors + "exit status " + std::to_string(run.status) + "\n";
  }
  std::string Report(std::string const& device, std::vector<std::string> arguments = {}) {
    arguments.insert(arguments.begin(), {"report", "--sample", "--to-media", device});
    return Zep(arguments);
  }

  // What an image holds, read through another mount.
  static std::vector<std::string> NamesIn(std::string const& image) {
    fs::create_directory("/mnt/look");
    Do("mount -o ro,noload " + image + " /mnt/look");
    std::vector<std::string> names;
    for (auto const& entry : fs::directory_iterator("/mnt/look"))
      if (entry.path().filename() != "lost+found") names.push_back(entry.path().filename());
    Do("umount /mnt/look");
    fs::remove("/mnt/look");
    return names;
  }
  static std::string Joined(std::vector<std::string> names) {
    std::sort(names.begin(), names.end());
    std::string text;
    for (std::string const& name : names) text += (text.empty() ? "" : " ") + name;
    return text;
  }

  static std::string Replaced(std::string text, std::string const& what, std::string const& by) {
    for (std::size_t at; (at = text.find(what)) != text.npos;) text.replace(at, what.size(), by);
    return text;
  }

  TTempDir dir_;
  std::optional<TInstallation> installation_;
};

TEST_F(ZepMediaTest, MountsAndUnmounts) {
  MakeImage(dir_.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(dir_.Path("key"));
              std::string text = Zep({"media", "mount", loop.Path()});
              text += ReadFile("/mnt/key/label.txt") + "\n";
              text += Zep({"media", "mount", loop.Path()});
              text += Zep({"media", "umount", "/mnt/key"});
              text += Zep({"media", "umount", "/mnt/key"});
              return Replaced(text, loop.Path(), "LOOP");
            }),
            "LOOP is mounted at /mnt/key\nexit status 0\nwhole\n"
            "LOOP is mounted at /mnt/key\nexit status 0\n"
            "/mnt/key is unmounted; the medium can be taken out\nexit status 0\n"
            "zep: nothing is mounted at /mnt/key\nexit status 1\n");
}

TEST_F(ZepMediaTest, MakesTheMountPointAndPrintsJson) {
  MakeImage(dir_.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              fs::remove("/mnt/key");
              TLoopDevice const loop(dir_.Path("key"));
              auto const mount = JsonOf(installation_->Run({{"media", "mount", loop.Path(), "--json"}}));
              auto const unmount = JsonOf(installation_->Run({{"media", "umount", "/mnt/key", "--json"}}));
              bool const isTheDevice = mount["device"] == loop.Path();
              return std::string(mount["mountPoint"]) + " " + std::string(unmount["mountPoint"]) + (isTheDevice ? "" : " other");
            }),
            "/mnt/key /mnt/key");
}

TEST_F(ZepMediaTest, AnotherMediumAtTheMountPointIsNeverTakenForTheDevice) {
  MakeImage(dir_.Path("first"), "first");
  MakeImage(dir_.Path("second"), "second");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const first(dir_.Path("first")), second(dir_.Path("second"));
              Zep({"media", "mount", first.Path()});
              std::string text = Zep({"media", "mount", second.Path()});
              text += Report(second.Path());
              Do("umount /mnt/key");
              return Replaced(text, first.Path(), "FIRST") + Joined(NamesIn(dir_.Path("first")));
            }),
            "zep: /mnt/key holds FIRST; unmount that first\nexit status 1\n"
            "zep: /mnt/key holds FIRST; unmount that first\nexit status 1\nlabel.txt");
}

TEST_F(ZepMediaTest, WhatHasNoFileSystemCannotBeMounted) {
  WriteFile(dir_.Path("key"), std::string(1 << 20, '\0'));
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(dir_.Path("key"));
              return Replaced(Zep({"media", "mount", loop.Path()}), loop.Path(), "LOOP");
            }),
            "zep: LOOP cannot be mounted: neither it nor LOOP1 has a file system that can be read\nexit status 1\n");
}

TEST_F(ZepMediaTest, ABusyMediumCannotBeUnmounted) {
  MakeImage(dir_.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(dir_.Path("key"));
              Zep({"media", "mount", loop.Path()});
              std::string text;
              {
                std::ifstream const user("/mnt/key/label.txt");
                text = Zep({"media", "umount", "/mnt/key"});
              }
              return text + Zep({"media", "umount", "/mnt/key"});
            }),
            "zep: /mnt/key cannot be unmounted: something still uses it\nexit status 1\n"
            "/mnt/key is unmounted; the medium can be taken out\nexit status 0\n");
}

// ---- The report ----

TEST_F(ZepMediaTest, AReportIsOnTheMediumWhenZepEnds) {
  MakeImage(dir_.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(dir_.Path("key"));
              TRun const run = installation_->Run({{"report", "--sample", "--to-media", loop.Path()}});
              EXPECT_EQ(run.status, 0) << run.errors;
              EXPECT_EQ(run.errors, "");
              std::vector<std::string> names = NamesIn(dir_.Path("key"));  // the image itself, not the device
              std::sort(names.begin(), names.end());
              EXPECT_EQ(names.size(), 2u) << Joined(names);
              if (names.size() != 2) return "no report";
              EXPECT_THAT(names[1], testing::MatchesRegex("zep-report-sample-server-20[0-9]{6}-[0-9]{6}\\.txt"));
              EXPECT_EQ(run.output, "The report is " + names[1] + " on " + loop.Path() + ", which can be taken out.\n");
              EXPECT_THAT(ReadFile("/proc/self/mounts"), Not(HasSubstr("/mnt/key")));

              Do("mount " + dir_.Path("key") + " /mnt/key");
              std::string const report = ReadFile("/mnt/key/" + names[1]);
              Do("umount /mnt/key");
              EXPECT_THAT(report, StartsWith("SAMPLE sample-server: "));
              EXPECT_THAT(report, HasSubstr("Plug-in "));
              EXPECT_EQ(report.back(), '\n');
              return "done";
            }),
            "done");
}

TEST_F(ZepMediaTest, AJsonReportIsAFileAndAnAnswer) {
  MakeImage(dir_.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(dir_.Path("key"));
              TRun const run = installation_->Run({{"report", "--json", "--sample", "--to-media", loop.Path()}});
              EXPECT_EQ(run.status, 0) << run.errors;
              auto const answer = JsonOf(run);
              EXPECT_EQ(answer["document"], "zep report --to-media");
              EXPECT_EQ(answer["device"], loop.Path());
              Do("mount " + dir_.Path("key") + " /mnt/key");
              std::string const report = ReadFile("/mnt/key/" + answer["file"].get<std::string>());
              Do("umount /mnt/key");
              EXPECT_EQ(answer["bytes"], report.size());
              EXPECT_EQ(nlohmann::json::parse(report)["document"], "zep report");
              return "done";
            }),
            "done");
}

// No success is told, no report is left, and the medium is unmounted.
void ExpectFailure(std::string const& text, std::string const& reason) {
  EXPECT_THAT(text, StartsWith("zep: zep-report-sample-server-"));
  EXPECT_THAT(text, HasSubstr(" cannot be written on LOOP: " + reason + "\n"));
  EXPECT_THAT(text, HasSubstr("exit status 1\n"));
  EXPECT_THAT(text, Not(HasSubstr("can be taken out")));
}

TEST_F(ZepMediaTest, AFullMediumIsAFailure) {
  MakeImage(dir_.Path("key"), "whole");
  std::string const text = WithZep([&] {
    TLoopDevice const loop(dir_.Path("key"));
    Do("mount " + loop.Path() + " /mnt/key");
    RunProgram("dd if=/dev/zero of=/mnt/key/filler bs=1k 2>/dev/null");
    Do("umount /mnt/key");
    std::string const report = Report(loop.Path(), {"--json"});
    return Replaced(report, loop.Path(), "LOOP") + Joined(NamesIn(dir_.Path("key"))) + " " +
           (fs::is_empty("/mnt/key") ? "unmounted" : "mounted");
  });
  ExpectFailure(text, "No space left on device");
  EXPECT_THAT(text, testing::EndsWith("filler label.txt unmounted"));
}

TEST_F(ZepMediaTest, AReadOnlyMediumIsAFailure) {
  MakeImage(dir_.Path("key"), "whole");
  std::string const text = WithZep([&] {
    TLoopDevice const loop(dir_.Path("key"), "--read-only");
    std::string const report = Report(loop.Path());
    return Replaced(report, loop.Path(), "LOOP") + Joined(NamesIn(dir_.Path("key"))) + " " +
           (fs::is_empty("/mnt/key") ? "unmounted" : "mounted");
  });
  ExpectFailure(text, "the medium is read-only");
  EXPECT_THAT(text, testing::EndsWith("label.txt unmounted"));
}

// The image lies where there is no room for what is written: write() succeeds, and only syncing tells that nothing arrives.
TEST_F(ZepMediaTest, AMediumThatTakesNoDataIsAFailure) {
  std::string const text = WithZep([&] {
    fs::create_directory("/mnt/store");
    if (!MountTmpfs("/mnt/store", "size=3m")) return std::string("cannot mount");
    MakeImage("/mnt/store/key", "whole", "16M");
    TLoopDevice const loop("/mnt/store/key");
    RunProgram("cat /dev/zero > /mnt/store/filler 2>/dev/null");
    std::string const report = Report(loop.Path());
    return Replaced(report, loop.Path(), "LOOP") + (fs::is_empty("/mnt/key") ? "unmounted" : "mounted");
  });
  EXPECT_THAT(text, StartsWith("zep: zep-report-sample-server-"));
  EXPECT_THAT(text, HasSubstr(" cannot be written on LOOP: "));
  EXPECT_THAT(text, testing::EndsWith("\nexit status 1\nunmounted"));
}

// The kernel keeps a loop device that is in use until the last user goes, so that the report arrives all the same.
TEST_F(ZepMediaTest, ALoopDeviceDetachedInTheMiddleStillGetsTheReport) {
  MakeImage(dir_.Path("key"), "whole");
  std::string const text = WithZep([&] {
    TLoopDevice const loop(dir_.Path("key"));
    TRun const run = installation_->Run(
        {{"report", "--sample", "--to-media", loop.Path()},
         {{"LD_PRELOAD", ZEP_PULLS_OUT}, {"ZEP_PULL", "/usr/sbin/losetup --detach " + loop.Path()}, {"ZEP_PULL_AT", "1"}}});
    return run.errors + "exit status " + std::to_string(run.status) + " " + Joined(NamesIn(dir_.Path("key")));
  });
  EXPECT_THAT(text, StartsWith("exit status 0 label.txt zep-report-sample-server-"));
}

TEST_F(ZepMediaTest, ADetachedLoopDeviceIsAFailure) {
  MakeImage(dir_.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(dir_.Path("key"));
              Do("/usr/sbin/losetup --detach " + loop.Path());
              return Replaced(Report(loop.Path()), loop.Path(), "LOOP") + Joined(NamesIn(dir_.Path("key")));
            }),
            "zep: LOOP cannot be mounted: neither it nor LOOP1 has a file system that can be read\nexit status 1\nlabel.txt");
}

}  // namespace
}  // namespace NQRVZEP20::zep
