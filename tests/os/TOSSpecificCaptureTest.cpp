// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"
#include "core/Handles.h"
#include "tests/os/HostTools.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <optional>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;
using TEntries = std::vector<std::string>;

class CaptureTest : public testing::Test {
protected:
  TTempDir fDir;
};

// Contents of every kind and of sizes around those of one read.
std::vector<std::string> Contents() {
  std::vector<std::string> contents = {"", "text", "two\nlines\n", std::string("zero\0byte", 9), "\xff\xfe\r\n"};
  for (std::size_t const size : {4095u, 4096u, 4097u, 8192u, 131072u, 131073u, 262145u, 1000000u, 20000001u}) {
    std::string text(size, ' ');
    for (std::size_t i = 0; i < size; ++i) text[i] = static_cast<char>(i * 31 + i / 256);
    contents.push_back(text);
  }
  return contents;
}

// ---- GetFileContents ----

TEST_F(CaptureTest, GetFileContentsReadsToTheEndAndLeavesTheDescriptorOpen) {
  for (std::string const& contents : Contents()) {
    SCOPED_TRACE(contents.size());
    WriteFile(fDir.Path("file"), contents);
    TUniqueFd const file(::open(fDir.Path("file").c_str(), O_RDONLY));
    EXPECT_EQ(TOSSpecific::GetFileContents(file.get(), "file", false), contents);
    EXPECT_NE(::fcntl(file.get(), F_GETFD), -1);
    EXPECT_EQ(TOSSpecific::GetFileContents(file.get(), "file", false), "");  // it is at the end now
  }
}

TEST_F(CaptureTest, GetFileContentsStartsAtThePositionOfTheDescriptor) {
  WriteFile(fDir.Path("file"), "0123456789");
  TUniqueFd const file(::open(fDir.Path("file").c_str(), O_RDONLY));
  ::lseek(file.get(), 4, SEEK_SET);
  EXPECT_EQ(TOSSpecific::GetFileContents(file.get(), "file", false), "456789");
}

TEST_F(CaptureTest, GetFileContentsReadsAPipeToItsEnd) {
  int ends[2];
  ASSERT_EQ(::pipe(ends), 0);
  TUniqueFd const readEnd(ends[0]);
  std::string const text(300000, 'p');
  std::thread writer([&text, writeEnd = ends[1]] {
    EXPECT_EQ(::write(writeEnd, text.data(), text.size()), static_cast<ssize_t>(text.size()));
    ::close(writeEnd);
  });
  std::string const contents = TOSSpecific::GetFileContents(readEnd.get(), "pipe", false);
  writer.join();
  EXPECT_EQ(contents, text);
}

TEST_F(CaptureTest, GetFileContentsLogsTheContentsOnRequest) {
  WriteFile(fDir.Path("file"), "the contents");
  auto const read = [&](bool logContents) {
    TUniqueFd const file(::open(fDir.Path("file").c_str(), O_RDONLY));
    TOSSpecific::GetFileContents(file.get(), "path", logContents);
  };
  EXPECT_EQ(LogOf([&] { read(true); }), (TEntries{"[Debug] Debug (linux toss): GetFileContents() Returned: the contents"}));
  EXPECT_EQ(LogOf([&] { read(false); }), TEntries{});
}

TEST_F(CaptureTest, GetFileContentsThrowsWhenAReadFails) {
  TUniqueFd const writeOnly(::open(fDir.Path("file").c_str(), O_WRONLY | O_CREAT, 0600));
  TUniqueFd const directory(::open(fDir.Path().c_str(), O_RDONLY));
  for (int const fd : {-1, writeOnly.get(), directory.get()}) {
    SCOPED_TRACE(fd);
    EXPECT_EQ(LogOf([&] { EXPECT_STATUS(TOSSpecific::GetFileContents(fd, "the path", true), kZEPStatusFileSystemError); }),
              (TEntries{"[Status] GetFileContents failed to read file the path"}));
  }
}

// ---- CaptureFile and CaptureFileLoader ----

TEST_F(CaptureTest, BothReturnTheCompleteFile) {
  int const before = OpenDescriptors();
  for (std::string const& contents : Contents()) {
    SCOPED_TRACE(contents.size());
    WriteFile(fDir.Path("file"), contents);
    EXPECT_EQ(TOSSpecific::CaptureFile(fDir.Path("file")), contents);
    EXPECT_EQ(TOSSpecific::CaptureFileLoader(fDir.Path("file"), true), contents);
    EXPECT_EQ(TOSSpecific::CaptureFileLoader(fDir.Path("file"), false), contents);
  }
  EXPECT_EQ(OpenDescriptors(), before);
}

TEST_F(CaptureTest, PseudoFilesAreReadCompletely) {
  EXPECT_EQ(TOSSpecific::CaptureFile("/dev/null"), "");
  EXPECT_EQ(TOSSpecific::CaptureFile("/proc/version"), ReadFile("/proc/version"));
  EXPECT_EQ(TOSSpecific::CaptureFile("/proc/cpuinfo").rfind("processor", 0), 0u);
  EXPECT_EQ(TOSSpecific::CaptureFile("/proc/self/cmdline"), ReadFile("/proc/self/cmdline"));  // zero bytes in it
  EXPECT_EQ(TOSSpecific::CaptureFile("/sys/kernel/mm/transparent_hugepage/enabled"),
            ReadFile("/sys/kernel/mm/transparent_hugepage/enabled"));  // reports a size of 4096
}

TEST_F(CaptureTest, CaptureLogsTheContents) {
  WriteFile(fDir.Path("file"), "text");
  TEntries const withContents = {"[Debug] Debug (linux toss): GetFileContents() Returned: text"};
  EXPECT_EQ(LogOf([&] { TOSSpecific::CaptureFile(fDir.Path("file")); }), withContents);
  EXPECT_EQ(LogOf([&] { TOSSpecific::CaptureFileLoader(fDir.Path("file"), true); }), withContents);
  EXPECT_EQ(LogOf([&] { TOSSpecific::CaptureFileLoader(fDir.Path("file"), false); }), TEntries{});
}

TEST_F(CaptureTest, CaptureFileThrowsWhenItCannotBeOpened) {
  std::string const path = fDir.Path("missing");
  EXPECT_EQ(LogOf([&] { EXPECT_STATUS(TOSSpecific::CaptureFile(path), kZEPStatusFileNotFound); }),
            (TEntries{"[Error] ERROR: CaptureFile failed to open: " + path}));
  EXPECT_STATUS(TOSSpecific::CaptureFile(""), kZEPStatusFileNotFound);
}

TEST_F(CaptureTest, CaptureFileLoaderIsEmptyWhenItCannotBeOpened) {
  std::string const path = fDir.Path("missing");
  for (bool const logContents : {true, false})
    EXPECT_EQ(LogOf([&] { EXPECT_EQ(TOSSpecific::CaptureFileLoader(path, logContents), ""); }),
              (TEntries{"[Debug] CaptureFile failed to open: " + path,
                        "[Debug] Please confirm that the related software/driver is properly installed."}));
}

TEST_F(CaptureTest, AFileWithoutReadPermissionCannotBeOpened) {
  WriteFile(fDir.Path("secret"), "text");
  fs::permissions(fDir.Path(), fs::perms::all);
  fs::permissions(fDir.Path("secret"), fs::perms::none);
  EXPECT_EQ(InChild([&] { return BecomeUnprivileged() ? TOSSpecific::CaptureFile(fDir.Path("secret")) : "still root"; }),
            "threw kZEPStatusFileNotFound");
  EXPECT_EQ(
      InChild([&] { return BecomeUnprivileged() ? TOSSpecific::CaptureFileLoader(fDir.Path("secret"), true) : "still root"; }),
      "");
}

TEST_F(CaptureTest, ADirectoryOpensButCannotBeRead) {
  EXPECT_EQ(LogOf([&] { EXPECT_STATUS(TOSSpecific::CaptureFile(fDir.Path()), kZEPStatusFileSystemError); }),
            (TEntries{"[Status] GetFileContents failed to read file " + fDir.Path()}));
  EXPECT_STATUS(TOSSpecific::CaptureFileLoader(fDir.Path(), true), kZEPStatusFileSystemError);
  int const before = OpenDescriptors();
  EXPECT_STATUS(TOSSpecific::CaptureFile(fDir.Path()), kZEPStatusFileSystemError);
  EXPECT_EQ(OpenDescriptors(), before);
}

// ---- CapFileViaProc ----

TEST_F(CaptureTest, CapFileViaProcReadsTheFileThatTheProgramWrote) {
  std::string contents = "old";
  std::string const path = fDir.Path("file");
  EXPECT_EQ(LogOf([&] {
              TOSSpecific::CapFileViaProc(Child("WritesAFile"), {path, "by the program"}, path, contents);
            }),
            (TEntries{"[Debug] SpawnProcess: process " + Child("WritesAFile"),
                      "[Debug] Debug (linux toss): GetFileContents() Returned: by the program"}));
  EXPECT_EQ(contents, "by the program");
}

TEST_F(CaptureTest, CapFileViaProcIgnoresTheResultOfTheProgram) {
  std::string contents;
  WriteFile(fDir.Path("file"), "was there before");
  for (char const* program : {"/nonexistent", "ExitsWith3", "PrintsNothing"}) {
    contents = "old";
    TOSSpecific::CapFileViaProc(*program == '/' ? program : Child(program), {}, fDir.Path("file"), contents);
    EXPECT_EQ(contents, "was there before") << program;
  }
}

TEST_F(CaptureTest, CapFileViaProcIsEmptyWithoutAFile) {
  std::string contents = "old";
  std::string const path = fDir.Path("missing");
  EXPECT_EQ(
      LogOf([&] { TOSSpecific::CapFileViaProc(Child("PrintsNothing"), {}, path, contents); }),
      (TEntries{"[Debug] SpawnProcess: process " + Child("PrintsNothing"), "[Error] ERROR: CaptureFile failed to open: " + path,
                "[Error] failed to capture file content due to exception: kZEPStatusFileNotFound"}));
  EXPECT_EQ(contents, "");

  contents = "old";
  TEntries const entries = LogOf([&] { TOSSpecific::CapFileViaProc(Child("PrintsNothing"), {}, fDir.Path(), contents); });
  ASSERT_EQ(entries.size(), 3u);
  EXPECT_EQ(entries[2], "[Error] failed to capture file content due to exception: kZEPStatusFileSystemError");
  EXPECT_EQ(contents, "");
}

// ---- LaunchTextEditor ----

// With a vi of our own on PATH, which records its arguments and the contents of the files.
class LaunchTextEditorTest : public testing::Test {
protected:
  LaunchTextEditorTest() {
    fs::create_directories(fDir.Path("work"));
    fs::create_directories(fDir.Path("bin"));
    WriteFile(fDir.Path("bin/vi"),
              "#!/bin/sh\nfor name; do echo \"[$name]\" >> " + Record() + "; cat \"$name\" >> " + Record() + "; done\n");
    fs::permissions(fDir.Path("bin/vi"), fs::perms::all);
    fPath.emplace("PATH", (fDir.Path("bin") + ":/usr/bin:/bin").c_str());
  }

  // Commands that only write down their arguments: nothing is to be copied to the root.
  void RecordCommandsOnly() {
    for (char const* command : {"cp", "vi"}) {
      WriteFile(fDir.Path("bin/") + command, std::string("#!/bin/sh\nset -f\necho ") + command + " \"$@\" >> " + Record() + "\n");
      fs::permissions(fDir.Path("bin/") + command, fs::perms::all);
    }
  }
  std::string Record() const { return fDir.Path("record"); }
  std::string Edited() const { return ReadFile(Record()); }

  TTempDir fDir;
  std::optional<TEnvironmentGuard> fPath;
};

TEST_F(LaunchTextEditorTest, CopiesTheFileAndEditsTheCopyByTheEndOfItsPath) {
  std::string const name = "a-name-of-more-than-thirty-five-characters.log";
  WriteFile(fDir.Path(name), "text to edit");
  TWorkingDirectory const directory(fDir.Path("work"));
  WriteFile(name.substr(name.size() - 35) + ".old", "|its neighbour");
  TOSSpecific::LaunchTextEditor(fDir.Path(name));
  EXPECT_EQ(ReadFile(name), "text to edit");
  EXPECT_EQ(Edited(), "[" + name + "]\ntext to edit[" + name.substr(name.size() - 35) + ".old]\n|its neighbour");
}

TEST_F(LaunchTextEditorTest, APathOfThirtyFiveCharactersIsLongEnough) {
  TWorkingDirectory const directory(fDir.Path("work"));
  fs::create_directories("d");
  std::string const path = "d/" + std::string(33, 'x');
  WriteFile(path, "text");
  TOSSpecific::LaunchTextEditor(path);
  EXPECT_EQ(ReadFile(std::string(33, 'x')), "text");
  EXPECT_EQ(Edited(), "[" + path + "]\ntext");  // the pattern holds the directory here, so the shell finds the file itself
}

TEST_F(LaunchTextEditorTest, AShorterPathThrowsAfterTheCopy) {
  TWorkingDirectory const directory(fDir.Path("work"));
  fs::create_directories("d");
  std::string const path = "d/" + std::string(32, 'x');
  WriteFile(path, "text");
  EXPECT_THROW(TOSSpecific::LaunchTextEditor(path), std::out_of_range);
  EXPECT_EQ(ReadFile(std::string(32, 'x')), "text");
  EXPECT_FALSE(fs::exists(Record()));
}

TEST_F(LaunchTextEditorTest, WithoutAWorkingDirectoryTheCopyGoesToTheRoot) {
  RecordCommandsOnly();
  std::string const path = "/" + std::string(40, 'y');
  EXPECT_EQ(InChild([&] {
              fs::create_directory(fDir.Path("gone"));
              fs::current_path(fDir.Path("gone"));
              fs::remove(fDir.Path("gone"));
              TOSSpecific::LaunchTextEditor(path);
              return Edited();
            }),
            "cp " + path + " /\nvi /*" + std::string(35, 'y') + "*\n");
}

TEST_F(LaunchTextEditorTest, AWorkingDirectoryOfUpTo4095BytesIsAccepted) {
  RecordCommandsOnly();
  std::string const path = "/" + std::string(40, 'y');
  auto const editIn = [&](std::size_t length) {
    return InChild([&] {
      fs::create_directory(fDir.Path(std::to_string(length)));
      fs::current_path(fDir.Path(std::to_string(length)));
      GoDownTo(length);
      TOSSpecific::LaunchTextEditor(path);
      std::string const edited = Edited();
      fs::remove(Record());
      return std::to_string(edited.size()) + edited.substr(edited.find("vi "));
    });
  };
  std::string const name = "*" + std::string(35, 'y') + "*\n";
  std::size_t const withoutDirectory = ("cp " + path + " \nvi " + name).size();
  EXPECT_EQ(editIn(1100), std::to_string(withoutDirectory + 1100) + "vi " + name);
  EXPECT_EQ(editIn(4095), std::to_string(withoutDirectory + 4095) + "vi " + name);
  EXPECT_EQ(editIn(4096), std::to_string(withoutDirectory + 2) + "vi /" + name);
}

}  // namespace
}  // namespace NQRVZEP20
