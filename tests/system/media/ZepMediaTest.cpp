// SPDX-License-Identifier: Apache-2.0

// Tests zep media and zep report --to-media with loop devices, and with media that fail.

#include "ZEPExport.h"
#include "tests/system/media/MediaSupport.h"
#include "tests/tools/zep/Envelope.h"
#include "tests/tools/zep/Zep.h"
#include "tools/zep/media/TMountedMedium.h"

#include <dlfcn.h>
#include <gmock/gmock.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>

#include <cerrno>
#include <csignal>
#include <cstdio>

namespace {
int gRenameError = 0;
}

// Replaces the function of the C library. Fails with gRenameError unless it is 0, as on some file systems in user space.
ZEP_EXPORT int renameat2(int oldDirectory, char const* oldName, int newDirectory, char const* newName, unsigned flags) noexcept {
  if (gRenameError != 0) {
    errno = gRenameError;
    return -1;
  }
  static auto const next =
      reinterpret_cast<int (*)(int, char const*, int, char const*, unsigned)>(::dlsym(RTLD_NEXT, "renameat2"));
  return next(oldDirectory, oldName, newDirectory, newName, flags);
}

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

class ZepMediaTest : public testing::Test {
protected:
  void SetUp() override { NEEDS_IMAGES(); }

  // Runs the function in a child that has an installation of zep and private mount points.
  template <class TFunction>
  std::string WithZep(TFunction function) {
    return InChild([&] {
      MakeMountPoints();
      fInstallation.emplace();
      std::string const text = function();
      fInstallation.reset();
      return text;
    });
  }

  std::string Zep(std::vector<std::string> const& arguments) {
    TRun const run = fInstallation->Run({arguments});
    return run.fOutput + run.fErrors + "exit status " + std::to_string(run.fStatus) + "\n";
  }
  std::string Report(std::string const& device, std::vector<std::string> arguments = {}) {
    arguments.insert(arguments.begin(), {"report", "--sample", "--to-media", device});
    return Zep(arguments);
  }

  static std::vector<std::string> NamesAt(std::string const& directory) {
    std::vector<std::string> names;
    for (auto const& entry : fs::directory_iterator(directory))
      if (entry.path().filename() != "lost+found") names.push_back(entry.path().filename());
    return names;
  }
  // The names of the files in an image, read through another mount.
  static std::vector<std::string> NamesIn(std::string const& image) {
    fs::create_directory("/mnt/look");
    Do("mount -o ro,noload " + image + " /mnt/look");
    std::vector<std::string> const names = NamesAt("/mnt/look");
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

  TTempDir fDir;
  std::optional<TInstallation> fInstallation;
};

TEST_F(ZepMediaTest, MountsAndUnmounts) {
  MakeImage(fDir.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(fDir.Path("key"));
              std::string text = Zep({"media", "mount", loop.Path()});
              text += ReadFile("/mnt/key/label.txt") + "\n";
              text += Zep({"media", "mount", loop.Path()});
              text += Zep({"media", "umount", "/mnt/key/"});
              text += Zep({"media", "umount", "/mnt/key"});
              return Replaced(text, loop.Path(), "LOOP");
            }),
            "LOOP is mounted at /mnt/key\nexit status 0\nwhole\n"
            "LOOP is mounted at /mnt/key\nexit status 0\n"
            "/mnt/key is unmounted; the medium can be removed\nexit status 0\n"
            "zep: nothing is mounted at /mnt/key\nexit status 1\n");
}

TEST_F(ZepMediaTest, MountsForACallerThatIgnoresItsChildren) {
  MakeImage(fDir.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(fDir.Path("key"));
              std::string text;
              for (std::vector<std::string> const& arguments :
                   {std::vector<std::string>{"media", "mount", loop.Path()}, {"media", "umount", "/mnt/key"}}) {
                TCall call = {arguments};
                call.fIgnoresChildren = true;
                TRun const run = fInstallation->Run(call);
                text += run.fOutput + run.fErrors;
              }
              return Replaced(text, loop.Path(), "LOOP");
            }),
            "LOOP is mounted at /mnt/key\n/mnt/key is unmounted; the medium can be removed\n");
}

TEST_F(ZepMediaTest, WithoutTheProgramMountItsPackageIsNamed) {
  MakeImage(fDir.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(fDir.Path("key"));
              TCall call = {{"media", "mount", loop.Path()}};
              call.fEnvironment = {{"PATH", fDir.Path()}};
              TRun const run = fInstallation->Run(call);
              return run.fErrors + std::to_string(run.fStatus);
            }),
            "zep: the program mount is missing; install the package mount\n1");
}

TEST_F(ZepMediaTest, CreatesTheMountPointAndPrintsJson) {
  MakeImage(fDir.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              fs::remove("/mnt/key");
              TLoopDevice const loop(fDir.Path("key"));
              auto const mount = JsonOf(fInstallation->Run({{"media", "mount", loop.Path(), "--json"}}));
              auto const unmount = JsonOf(fInstallation->Run({{"media", "umount", "/mnt/key", "--json"}}));
              ExpectEnvelope(mount, 0, "zep media mount");
              ExpectEnvelope(unmount, 0, "zep media umount");
              bool const isTheDevice = mount["device"] == loop.Path();
              return std::string(mount["mountPoint"]) + " " + std::string(unmount["mountPoint"]) + (isTheDevice ? "" : " other");
            }),
            "/mnt/key /mnt/key");
}

TEST_F(ZepMediaTest, AnotherMediumAtTheMountPointIsNeverUsed) {
  MakeImage(fDir.Path("first"), "first");
  MakeImage(fDir.Path("second"), "second");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const first(fDir.Path("first")), second(fDir.Path("second"));
              Zep({"media", "mount", first.Path()});
              std::string text = Zep({"media", "mount", second.Path()});
              text += Report(second.Path());
              Do("umount /mnt/key");
              return Replaced(text, first.Path(), "FIRST") + Joined(NamesIn(fDir.Path("first")));
            }),
            "zep: FIRST is already mounted at /mnt/key; unmount it first\nexit status 1\n"
            "zep: FIRST is already mounted at /mnt/key; unmount it first\nexit status 1\nlabel.txt");
}

// ---- Devices with chosen names ----

// For use in a child: covers /dev/shm and the block devices in sysfs with private file systems of the child.
class TFakeDisks {
public:
  TFakeDisks() {
    if (!MountTmpfs("/dev/shm", "") || !MountTmpfs("/sys/dev", "")) throw std::runtime_error("cannot mount");
    fs::create_directories("/sys/dev/block");
  }

  // Adds a node such as "/dev/shm/key1" for a loop device.
  void AddNode(std::string const& name, TLoopDevice const& loop) const {
    if (::mknod(("/dev/shm/" + name).c_str(), S_IFBLK | 0600, NumberOf(loop)) != 0)
      throw std::runtime_error("cannot create a node");
  }
  // Adds a loop device to sysfs at a place such as "key1/key11", which is a partition of key1.
  void AddPlace(std::string const& place, TLoopDevice const& loop) const {
    fs::path const path = "/sys/dev/disks/" + place;
    fs::create_directories(path);
    if (place.find('/') != place.npos) WriteFile(path / "partition", "1\n");
    auto const number = NumberOf(loop);
    std::string const name = std::to_string(major(number)) + ":" + std::to_string(minor(number));
    fs::create_directory_symlink("../disks/" + place, "/sys/dev/block/" + name);
  }
  void AddSlave(std::string const& place, std::string const& slave) const {
    fs::create_directories("/sys/dev/disks/" + place + "/slaves");
    fs::create_directory_symlink("/sys/dev/disks/" + slave, "/sys/dev/disks/" + place + "/slaves/slave");
  }

private:
  static dev_t NumberOf(TLoopDevice const& loop) {
    struct stat status;
    if (::stat(loop.Path().c_str(), &status) != 0) throw std::runtime_error("no " + loop.Path());
    return status.st_rdev;
  }
};

TEST_F(ZepMediaTest, AnotherDevicesPartitionIsNeverUsedAsTheFirstPartition) {
  WriteFile(fDir.Path("none"), std::string(1 << 20, '\0'));
  MakeImage(fDir.Path("other"), "other");
  EXPECT_EQ(WithZep([&] {
              TFakeDisks const disks;
              TLoopDevice const none(fDir.Path("none")), other(fDir.Path("other"));
              disks.AddNode("key1", none);
              disks.AddNode("key11", other);
              disks.AddPlace("key/key1", none);
              disks.AddPlace("key/key11", other);
              std::string text = Zep({"media", "mount", "/dev/shm/key1"});
              text += Report("/dev/shm/key1");
              text += fs::is_empty("/mnt/key") ? "unmounted\n" : "mounted\n";
              Do("mount /dev/shm/key11 /mnt/key");
              text += Zep({"media", "mount", "/dev/shm/key1"});
              text += Report("/dev/shm/key1");
              text += Joined(NamesAt("/mnt/key"));
              Do("umount /mnt/key");
              return text;
            }),
            "zep: /dev/shm/key1 was not mounted: mounting it would also try /dev/shm/key11, which is not a partition of "
            "/dev/shm/key1\nexit status 1\n"
            "zep: /dev/shm/key1 was not mounted: mounting it would also try /dev/shm/key11, which is not a partition of "
            "/dev/shm/key1\nexit status 1\n"
            "unmounted\n"
            "zep: /dev/shm/key11 is already mounted at /mnt/key; unmount it first\nexit status 1\n"
            "zep: /dev/shm/key11 is already mounted at /mnt/key; unmount it first\nexit status 1\n"
            "label.txt");
}

TEST_F(ZepMediaTest, ADevicesOwnFirstPartitionIsMounted) {
  WriteFile(fDir.Path("none"), std::string(1 << 20, '\0'));
  MakeImage(fDir.Path("part"), "partition");
  EXPECT_EQ(WithZep([&] {
              TFakeDisks const disks;
              TLoopDevice const none(fDir.Path("none")), part(fDir.Path("part"));
              disks.AddNode("key", none);
              disks.AddNode("key1", part);
              disks.AddPlace("key", none);
              disks.AddPlace("key/key1", part);
              std::string text = Zep({"media", "mount", "/dev/shm/key"});
              text += Zep({"media", "mount", "/dev/shm/key"});
              text += Zep({"media", "umount", "/mnt/key"});
              return text;
            }),
            "/dev/shm/key1 is mounted at /mnt/key\nexit status 0\n"
            "/dev/shm/key1 is mounted at /mnt/key\nexit status 0\n"
            "/mnt/key is unmounted; the medium can be removed\nexit status 0\n");
}

TEST_F(ZepMediaTest, AMediumThatIsAlsoMountedElsewhereCannotBeRemoved) {
  MakeImage(fDir.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(fDir.Path("key"));
              fs::create_directory("/mnt/a");
              fs::create_directory("/mnt/b c");
              for (char const* directory : {"/mnt/a", "'/mnt/b c'"}) Do("mount " + loop.Path() + " " + directory);
              std::string text = Zep({"media", "mount", loop.Path()});
              text += Zep({"media", "umount", "/mnt/key"});
              TRun const report = fInstallation->Run({{"report", "--sample", "--to-media", loop.Path()}});
              text += "..." + report.fOutput.substr(report.fOutput.find(" on ")) + "exit status " +
                      std::to_string(report.fStatus) + "\n";
              Do("umount '/mnt/b c'; mount " + loop.Path() + " /mnt/key");
              TRun const unmounted = fInstallation->Run({{"media", "umount", "/mnt/key", "--json"}});
              ExpectEnvelope(unmounted.fOutput, 2, "zep media umount");
              text += JsonOf(unmounted)["stillMountedAt"].dump() + "\n";
              TRun const asJson = fInstallation->Run({{"report", "--json", "--sample", "--to-media", loop.Path()}});
              text += JsonOf(asJson)["stillMountedAt"].dump() + "\n";
              text += Zep({"media", "umount", "/mnt/a"});
              return Replaced(text, loop.Path(), "LOOP");
            }),
            "LOOP is mounted at /mnt/key\nexit status 0\n"
            "/mnt/key is unmounted; the medium is still mounted at /mnt/a /mnt/b c\nexit status 2\n"
            "... on LOOP, which is still mounted at /mnt/a /mnt/b c.\nexit status 0\n"
            "[\"/mnt/a\"]\n[\"/mnt/a\"]\n"
            "/mnt/a is unmounted; the medium can be removed\nexit status 0\n");
}

TEST_F(ZepMediaTest, ADriveCanBeRemovedWhenAllItsPartitionsAndVolumesAreUnmounted) {
  for (char const* name : {"first", "second", "volume", "unrelated"}) MakeImage(fDir.Path(name), name);
  EXPECT_EQ(WithZep([&] {
              TFakeDisks const disks;
              TLoopDevice const first(fDir.Path("first")), second(fDir.Path("second")), volume(fDir.Path("volume"));
              TLoopDevice const unrelated(fDir.Path("unrelated"));
              disks.AddPlace("key/key1", first);
              disks.AddPlace("key/key2", second);
              disks.AddPlace("other/other1", unrelated);
              disks.AddPlace("volume", volume);
              disks.AddSlave("volume", "key/key2");
              for (char const* name : {"a", "b", "c"}) fs::create_directory(std::string("/mnt/") + name);
              Do("mount " + first.Path() + " /mnt/key; mount " + second.Path() + " /mnt/a; mount " + volume.Path() + " /mnt/b");
              Do("mount " + unrelated.Path() + " /mnt/c");
              std::string text;
              for (char const* directory : {"/mnt/key", "/mnt/a", "/mnt/c", "/mnt/b"})
                text += Zep({"media", "umount", directory});
              return text;
            }),
            "/mnt/key is unmounted; the medium is still mounted at /mnt/a /mnt/b\nexit status 2\n"
            "/mnt/a is unmounted; the medium is still mounted at /mnt/b\nexit status 2\n"
            "/mnt/c is unmounted; the medium can be removed\nexit status 0\n"
            "/mnt/b is unmounted; the medium can be removed\nexit status 0\n");
}

// ---- Failures ----

TEST_F(ZepMediaTest, AMediumWithoutAFileSystemCannotBeMounted) {
  WriteFile(fDir.Path("key"), std::string(1 << 20, '\0'));
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(fDir.Path("key"));
              return Replaced(Zep({"media", "mount", loop.Path()}), loop.Path(), "LOOP");
            }),
            "zep: LOOP cannot be mounted: neither it nor LOOP1 has a readable file system\nexit status 1\n");
}

TEST_F(ZepMediaTest, ABusyMediumCannotBeUnmounted) {
  MakeImage(fDir.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(fDir.Path("key"));
              Zep({"media", "mount", loop.Path()});
              std::string text;
              {
                std::ifstream const user("/mnt/key/label.txt");
                text = Zep({"media", "umount", "/mnt/key"});
              }
              text += Zep({"media", "umount", "/mnt/key"});
              return text;
            }),
            "zep: /mnt/key cannot be unmounted: it is still in use\nexit status 1\n"
            "/mnt/key is unmounted; the medium can be removed\nexit status 0\n");
}

// ---- The report ----

TEST_F(ZepMediaTest, AReportIsOnTheMediumWhenZepEnds) {
  MakeImage(fDir.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(fDir.Path("key"));
              TRun const run = fInstallation->Run({{"report", "--sample", "--to-media", loop.Path()}});
              EXPECT_EQ(run.fStatus, 0) << run.fErrors;
              EXPECT_EQ(run.fErrors, "");
              std::vector<std::string> names = NamesIn(fDir.Path("key"));  // read from the image itself, not through the device
              std::sort(names.begin(), names.end());
              EXPECT_EQ(names.size(), 2u) << Joined(names);
              if (names.size() != 2) return "no report";
              EXPECT_THAT(names[1], testing::MatchesRegex("zep-report-sample-server-20[0-9]{6}T[0-9]{6}Z\\.txt"));
              EXPECT_EQ(run.fOutput, "The report is " + names[1] + " on " + loop.Path() + ", which can be removed.\n");
              EXPECT_THAT(ReadFile("/proc/self/mounts"), Not(HasSubstr("/mnt/key")));

              Do("mount " + fDir.Path("key") + " /mnt/key");
              std::string const report = ReadFile("/mnt/key/" + names[1]);
              Do("umount /mnt/key");
              EXPECT_THAT(report, StartsWith("SAMPLE sample-server: "));
              EXPECT_THAT(report, HasSubstr("Plug-in "));
              EXPECT_EQ(report.back(), '\n');
              return "done";
            }),
            "done");
}

TEST_F(ZepMediaTest, WithJsonBothTheFileAndTheOutputAreJson) {
  MakeImage(fDir.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(fDir.Path("key"));
              TRun const run = fInstallation->Run({{"report", "--json", "--sample", "--to-media", loop.Path()}});
              EXPECT_EQ(run.fStatus, 0) << run.fErrors;
              auto const answer = JsonOf(run);
              ExpectEnvelope(answer, 0, "zep report --to-media");
              EXPECT_EQ(answer["device"], loop.Path());
              Do("mount " + fDir.Path("key") + " /mnt/key");
              std::string const report = ReadFile("/mnt/key/" + answer["file"].get<std::string>());
              Do("umount /mnt/key");
              EXPECT_EQ(answer["bytes"], report.size());
              EXPECT_EQ(nlohmann::json::parse(report)["document"], "zep report");
              return "done";
            }),
            "done");
}

// Expects the failure, and that success is not reported.
void ExpectFailure(std::string const& text, std::string const& reason) {
  EXPECT_THAT(text, HasSubstr("zep: zep-report-sample-server-"));
  EXPECT_THAT(text, HasSubstr(" cannot be written to LOOP: " + reason + "\n"));
  EXPECT_THAT(text, HasSubstr("exit status 1\n"));
  EXPECT_THAT(text, Not(HasSubstr("can be removed")));
}

TEST_F(ZepMediaTest, AFullMediumIsAFailure) {
  MakeImage(fDir.Path("key"), "whole");
  std::string const text = WithZep([&] {
    TLoopDevice const loop(fDir.Path("key"));
    Do("mount " + loop.Path() + " /mnt/key");
    RunProgram("dd if=/dev/zero of=/mnt/key/filler bs=1k 2>/dev/null");
    Do("umount /mnt/key");
    std::string const report = Report(loop.Path(), {"--json"});
    return Replaced(report, loop.Path(), "LOOP") + Joined(NamesIn(fDir.Path("key"))) + " " +
           (fs::is_empty("/mnt/key") ? "unmounted" : "mounted");
  });
  ExpectFailure(text, "No space left on device");
  EXPECT_THAT(text, testing::EndsWith("filler label.txt unmounted"));
}

TEST_F(ZepMediaTest, AReadOnlyMediumIsAFailure) {
  MakeImage(fDir.Path("key"), "whole");
  std::string const text = WithZep([&] {
    TLoopDevice const loop(fDir.Path("key"), "--read-only");
    std::string const report = Report(loop.Path());
    return Replaced(report, loop.Path(), "LOOP") + Joined(NamesIn(fDir.Path("key"))) + " " +
           (fs::is_empty("/mnt/key") ? "unmounted" : "mounted");
  });
  ExpectFailure(text, "the medium is read-only");
  EXPECT_THAT(text, testing::EndsWith("label.txt unmounted"));
}

// The image is on a full file system: write() succeeds, and only syncing reports that no data can be stored.
TEST_F(ZepMediaTest, AMediumThatCannotStoreDataIsAFailure) {
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
  EXPECT_THAT(text, HasSubstr(" cannot be written to LOOP: "));
  EXPECT_THAT(text, testing::EndsWith("\nexit status 1\nunmounted"));
}

// The kernel detaches a loop device that is in use only after its last user has closed it, so the report is written nevertheless.
TEST_F(ZepMediaTest, ALoopDeviceDetachedDuringTheWriteStillReceivesTheReport) {
  MakeImage(fDir.Path("key"), "whole");
  std::string const text = WithZep([&] {
    TLoopDevice const loop(fDir.Path("key"));
    TRun const run = fInstallation->Run(
        {{"report", "--sample", "--to-media", loop.Path()},
         {{"LD_PRELOAD", ZEP_PULLS_OUT}, {"ZEP_PULL", "/usr/sbin/losetup --detach " + loop.Path()}, {"ZEP_PULL_AT", "1"}}});
    return run.fErrors + "exit status " + std::to_string(run.fStatus) + " " + Joined(NamesIn(fDir.Path("key")));
  });
  EXPECT_THAT(text, StartsWith("exit status 0 label.txt zep-report-sample-server-"));
}

// The signal arrives while the report is being written: before the first fsync the file still has its temporary name.
TEST_F(ZepMediaTest, AfterAnInterruptTheMediumIsUnmountedAndHasNoPartOfTheReport) {
  MakeImage(fDir.Path("key"), "whole");
  for (int const signal : {SIGINT, SIGTERM, SIGHUP}) {
    SCOPED_TRACE(signal);
    std::string const text = WithZep([&] {
      TLoopDevice const loop(fDir.Path("key"));
      TCall call = {{"report", "--sample", "--json", "--to-media", loop.Path()}};
      call.fEnvironment = {{"LD_PRELOAD", ZEP_PULLS_OUT}, {"ZEP_RAISE", std::to_string(signal)}, {"ZEP_PULL_AT", "1"}};
      TRun const run = fInstallation->Run(call);
      bool const isMounted = !fs::is_empty("/mnt/key");
      if (isMounted) Do("umount /mnt/key");
      return Replaced(run.fErrors, loop.Path(), "LOOP") + std::to_string(run.fStatus) + " " + JsonOf(run)["exitStatus"].dump() +
             (isMounted ? " mounted " : " unmounted ") + Joined(NamesIn(fDir.Path("key")));
    });
    std::string const status = std::to_string(128 + signal);
    EXPECT_THAT(text,
                testing::MatchesRegex("zep: zep-report-sample-server-[0-9TZ]*\\.json cannot be written to LOOP: interrupted\n" +
                                      status + " " + status + " unmounted label.txt"));
  }
}

// At the second fsync, the file already has its final name.
TEST_F(ZepMediaTest, InterruptAfterTheReportIsCompleteStillUnmountsTheMedium) {
  MakeImage(fDir.Path("key"), "whole");
  std::string const text = WithZep([&] {
    TLoopDevice const loop(fDir.Path("key"));
    TCall call = {{"report", "--sample", "--to-media", loop.Path()}};
    call.fEnvironment = {{"LD_PRELOAD", ZEP_PULLS_OUT}, {"ZEP_RAISE", std::to_string(SIGINT)}, {"ZEP_PULL_AT", "2"}};
    TRun const run = fInstallation->Run(call);
    bool const isMounted = !fs::is_empty("/mnt/key");
    if (isMounted) Do("umount /mnt/key");
    return Replaced(run.fOutput + run.fErrors, loop.Path(), "LOOP") + std::to_string(run.fStatus) +
           (isMounted ? " mounted " : " unmounted ") + Joined(NamesIn(fDir.Path("key")));
  });
  EXPECT_THAT(text,
              testing::MatchesRegex("zep: (zep-report-sample-server-[0-9TZ]*\\.txt) was written to LOOP, which can be removed: "
                                    "interrupted\n130 unmounted label.txt zep-report-.*\\.txt"));
}

TEST_F(ZepMediaTest, AReportIsWrittenToABusyMediumThatCannotBeUnmounted) {
  MakeImage(fDir.Path("key"), "whole");
  std::string const text = WithZep([&] {
    TLoopDevice const loop(fDir.Path("key"));
    Do("mount " + loop.Path() + " /mnt/key");
    std::string report;
    {
      std::ifstream const user("/mnt/key/label.txt");
      report = Report(loop.Path());
    }
    Do("umount /mnt/key");
    return Replaced(report, loop.Path(), "LOOP") + Joined(NamesIn(fDir.Path("key")));
  });
  EXPECT_THAT(text,
              testing::MatchesRegex("zep: (zep-report-sample-server-[0-9TZ]*\\.txt) was written to LOOP, but /mnt/key cannot be "
                                    "unmounted: it is still in use\nexit status 1\nlabel.txt zep-report-.*\\.txt"));
}

// Some file systems do not support a rename that replaces nothing.
TEST_F(ZepMediaTest, AnExistingFileIsNeverReplacedOnAnyFileSystem) {
  MakeImage(fDir.Path("key"), "whole");
  for (int const error : {0, EINVAL, ENOSYS}) {
    SCOPED_TRACE(error);
    EXPECT_EQ(WithZep([&] {
                TLoopDevice const loop(fDir.Path("key"));
                TMountedMedium const medium(loop.Path());
                gRenameError = error;
                medium.Write("report", "first");
                std::string text;
                fs::create_symlink("nowhere", "/mnt/key/link");
                for (char const* name : {"report", "link"}) try {
                    medium.Write(name, "second");
                  } catch (std::runtime_error const& failure) {
                    text += std::string(failure.what()) + "\n";
                  }
                gRenameError = 0;
                text += ReadFile("/mnt/key/report") + " ";
                fs::remove("/mnt/key/report");
                fs::remove("/mnt/key/link");
                UnmountDirectory("/mnt/key");
                return Replaced(text, loop.Path(), "LOOP") + Joined(NamesIn(fDir.Path("key")));
              }),
              "report cannot be written to LOOP: File exists\nlink cannot be written to LOOP: File exists\nfirst label.txt");
  }
}

TEST_F(ZepMediaTest, AnyOtherFailureToRenameIsReported) {
  MakeImage(fDir.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(fDir.Path("key"));
              TMountedMedium const medium(loop.Path());
              gRenameError = EIO;
              std::string text;
              try {
                medium.Write("report", "first");
              } catch (std::runtime_error const& failure) {
                text = failure.what();
              }
              UnmountDirectory("/mnt/key");
              return Replaced(text, loop.Path(), "LOOP") + "\n" + Joined(NamesIn(fDir.Path("key")));
            }),
            "report cannot be written to LOOP: Input/output error\nlabel.txt");
}

TEST_F(ZepMediaTest, ADetachedLoopDeviceIsAFailure) {
  MakeImage(fDir.Path("key"), "whole");
  EXPECT_EQ(WithZep([&] {
              TLoopDevice const loop(fDir.Path("key"));
              Do("/usr/sbin/losetup --detach " + loop.Path());
              return Replaced(Report(loop.Path()), loop.Path(), "LOOP") + Joined(NamesIn(fDir.Path("key")));
            }),
            "zep: LOOP cannot be mounted: neither it nor LOOP1 has a readable file system\nexit status 1\nlabel.txt");
}

}  // namespace
}  // namespace NQRVZEP20::zep
