// SPDX-License-Identifier: Apache-2.0

// Tests file transfer with a stand-in for libcurl (tests/os/curl): the options, their order and values, and the result of each
// failure. tests/system/transfer tests it with real servers.

#include "os/ProxyCheck.h"
#include "tests/os/HostTools.h"
#include "tests/os/Programs.h"
#include "tests/os/curl/StandInCurl.h"

#include <dlfcn.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>

namespace NQRVZEP20 {
namespace {

namespace fs = std::filesystem;
using testing::ElementsAre;
using testing::ElementsAreArray;
using testing::IsEmpty;
using testing::StartsWith;
using TLines = std::vector<std::string>;

// Makes the stand-in the library "libcurl.so" until it is destroyed.
class TStandIn {
public:
  explicit TStandIn(TCurlRecord& record, std::string const& variant = "whole")
      : fLibrary(::dlopen(Path(variant).c_str(), RTLD_LAZY)) {
    reinterpret_cast<TUseRecord*>(::dlsym(fLibrary, "StandInUse"))(&record);
  }
  ~TStandIn() { ::dlclose(fLibrary); }
  TStandIn(TStandIn const&) = delete;
  TStandIn& operator=(TStandIn const&) = delete;

  static std::string Path(std::string const& variant) { return ZEP_CURL_DIR "/" + variant + "/libcurl.so"; }

private:
  void* fLibrary;
};

// Runs `work` with a stand-in for libcurl, and expects that it leaks nothing: no descriptor, no loaded library.
void WithStandIn(TCurlRecord& record, std::function<void()> const& work, std::string const& variant = "whole") {
  int const descriptors = OpenDescriptors();
  {
    TStandIn const standIn(record, variant);
    work();
    EXPECT_TRUE(record.fCalls.empty() || record.fCalls.back() != "unload");
  }
  EXPECT_EQ(OpenDescriptors(), descriptors);
  ASSERT_FALSE(record.fCalls.empty());
  EXPECT_EQ(record.fCalls.back(), "unload") << "libcurl is still loaded";
  record.fCalls.pop_back();
}

TLines const kStart = {"global_init 3", "easy_init", "setopt ERRORBUFFER buffer", "setopt FTP_USE_EPSV 0", "setopt PROXY ''"};
TLines const kEnd = {"easy_cleanup", "global_cleanup"};

TLines Joined(TLines a, TLines const& b, TLines const& c) {
  a.insert(a.end(), b.begin(), b.end());
  a.insert(a.end(), c.begin(), c.end());
  return a;
}

// Expects that the work throws a failure with that reason and logs the name of the operation and the reason as one line.
void ExpectReason(std::function<void()> const& work, std::string const& operation, std::string const& reason) {
  EXPECT_THAT(LogOf([&] { EXPECT_EQ(ReasonOf(work), reason); }), ElementsAre("[Error] " + operation + reason));
}

class TransferTest : public testing::Test {
protected:
  TTempDir fDir;
  std::string const fFile = fDir.Path("file");
  TCurlRecord fRecord;
};

TEST_F(TransferTest, DownloadSetsItsOptionsInOrder) {
  fRecord.fChunks = {"first ", "second"};
  fRecord.fFileToWatch = fFile;
  TLines log;
  WithStandIn(fRecord, [&] { log = LogOf([&] { TOSSpecific::CurlTransferFile("ftp://h/a b?c", fFile, true); }); });
  EXPECT_THAT(fRecord.fCalls,
              ElementsAreArray(Joined(kStart,
                                      {"setopt WRITEFUNCTION function", "setopt WRITEDATA context", "setopt URL 'ftp://h/a b?c'",
                                       "setopt FTP_CREATE_MISSING_DIRS 1", "perform", "write 6 file 6", "write 6 file 12"},
                                      kEnd)));
  EXPECT_EQ(ReadFile(fFile), "first second");
  EXPECT_EQ(fRecord.fErrorTextAtStart, "");
  EXPECT_THAT(log, IsEmpty());
}

TEST_F(TransferTest, UploadSetsItsOptionsInOrder) {
  std::string const text = std::string("a\0b\r\n", 5) + std::string(100000, 'x');
  WriteFile(fFile, text);
  TLines log;
  WithStandIn(fRecord, [&] { log = LogOf([&] { TOSSpecific::CurlTransferFile("sftp://h/f", fFile, false); }); });
  EXPECT_THAT(fRecord.fCalls, ElementsAreArray(Joined(kStart,
                                                      {"setopt UPLOAD 1", "setopt URL 'sftp://h/f'", "setopt READDATA stream",
                                                       "setopt FTP_CREATE_MISSING_DIRS 1", "perform"},
                                                      kEnd)));
  EXPECT_EQ(fRecord.fUploaded, text);
  EXPECT_THAT(log, IsEmpty());
}

TEST_F(TransferTest, AnEmptyDownloadLeavesNoFile) {
  WithStandIn(fRecord, [&] { TOSSpecific::CurlTransferFile("ftp://h/f", fFile, true); });
  EXPECT_FALSE(fs::exists(fFile));
}

TEST_F(TransferTest, AnEmptyFileIsUploaded) {
  WriteFile(fFile, "");
  WithStandIn(fRecord, [&] { TOSSpecific::CurlTransferFile("ftp://h/f", fFile, false); });
  EXPECT_THAT(fRecord.fCalls, testing::Contains("perform"));
  EXPECT_EQ(fRecord.fUploaded, "");
}

struct TRefusal {
  int fOption;
  char const* fMessage;
  char const* fLastCall;
};

// Expects that the operation ends at the refused option: checks the log, the last call, and that everything was released.
void ExpectRefusals(std::vector<TRefusal> const& rows, std::function<void()> const& operation) {
  for (TRefusal const& row : rows) {
    SCOPED_TRACE(row.fMessage);
    TCurlRecord record;
    record.fRefusedOption = row.fOption;
    TLines log;
    WithStandIn(record, [&] { log = LogOf([&] { EXPECT_STATUS(operation(), kZEPStatusLibCurlFailure); }); });
    EXPECT_THAT(log, ElementsAre(std::string("[Error] ") + row.fMessage));
    ASSERT_GE(record.fCalls.size(), 3u);
    EXPECT_EQ(TLines(record.fCalls.end() - 2, record.fCalls.end()), kEnd);
    EXPECT_EQ(*(record.fCalls.end() - 3), row.fLastCall);
  }
}

TEST_F(TransferTest, ARefusedOptionEndsADownload) {
  ExpectRefusals({{10010, "TOSSpecific|CurlTransferFile: Error configuring curl error buffer", "setopt ERRORBUFFER buffer"},
                  {85, "TOSSpecific|CurlTransferFile: Error configuring curl passive mode", "setopt FTP_USE_EPSV 0"},
                  {10004, "TOSSpecific|CurlTransferFile: Error configuring curl proxy server", "setopt PROXY ''"},
                  {20011, "TOSSpecific|CurlTransferFile: Error setting curl write function", "setopt WRITEFUNCTION function"},
                  {10001, "TOSSpecific|CurlTransferFile: Error setting curl write function", "setopt WRITEDATA context"},
                  {10002, "TOSSpecific|CurlTransferFile: Error setting curl target", "setopt URL 'ftp://h/f'"},
                  {110, "TOSSpecific|CurlTransferFile: Error setting curl option: CURLOPT_FTP_CREATE_MISSING_DIRS",
                   "setopt FTP_CREATE_MISSING_DIRS 1"}},
                 [&] { TOSSpecific::CurlTransferFile("ftp://h/f", fFile, true); });
  EXPECT_FALSE(fs::exists(fFile));
}

TEST_F(TransferTest, ARefusedOptionEndsAnUpload) {
  WriteFile(fFile, "text");
  ExpectRefusals({{10010, "TOSSpecific|CurlTransferFile: Error configuring curl error buffer", "setopt ERRORBUFFER buffer"},
                  {85, "TOSSpecific|CurlTransferFile: Error configuring curl passive mode", "setopt FTP_USE_EPSV 0"},
                  {10004, "TOSSpecific|CurlTransferFile: Error configuring curl proxy server", "setopt PROXY ''"},
                  {46, "TOSSpecific|CurlTransferFile: Error setting curl upload", "setopt UPLOAD 1"},
                  {10002, "TOSSpecific|CurlTransferFile: Error setting curl target", "setopt URL 'ftp://h/f'"},
                  {10009, "TOSSpecific|CurlTransferFile: Error setting curl upload file", "setopt READDATA stream"},
                  {110, "TOSSpecific|CurlTransferFile: Error setting curl option: CURLOPT_FTP_CREATE_MISSING_DIRS",
                   "setopt FTP_CREATE_MISSING_DIRS 1"}},
                 [&] { TOSSpecific::CurlTransferFile("ftp://h/f", fFile, false); });
}

TEST_F(TransferTest, WithoutAHandleNothingIsSet) {
  fRecord.fGivesNoHandle = true;
  TLines log;
  WithStandIn(fRecord, [&] {
    log = LogOf([&] { EXPECT_STATUS(TOSSpecific::CurlTransferFile("ftp://h/f", fFile, true), kZEPStatusLibCurlFailure); });
  });
  EXPECT_THAT(log, ElementsAre("[Error] TOSSpecific|CurlTransferFile: Error initalizing curl"));
  EXPECT_THAT(fRecord.fCalls, ElementsAre("global_init 3", "easy_init", "global_cleanup"));
}

TEST_F(TransferTest, AFileThatCannotBeReadEndsAnUploadAfterTheCommonOptions) {
  TLines log;
  WithStandIn(fRecord, [&] {
    log = LogOf([&] { EXPECT_STATUS(TOSSpecific::CurlTransferFile("ftp://h/f", fFile, false), kZEPStatusLibCurlFailure); });
  });
  EXPECT_THAT(log, ElementsAre("[Error] TOSSpecific|CurlTransferFile: Error getting file size"));
  EXPECT_THAT(fRecord.fCalls, ElementsAreArray(Joined(kStart, {}, kEnd)));
}

TEST_F(TransferTest, AnUploadThatCannotBeReadToItsEndIsAccessDenied) {
  for (std::string const& file : {fDir.Path(), std::string("/proc/self/mem")}) {  // both open; the second one fails with EIO
    SCOPED_TRACE(file);
    TCurlRecord record;
    TLines log;
    WithStandIn(record, [&] {
      log = LogOf([&] { EXPECT_STATUS(TOSSpecific::CurlTransferFile("ftp://h/f", file, false), kZEPStatusAccessDenied); });
    });
    EXPECT_THAT(log, ElementsAre("[Error] TOSSpecific|CurlTransferFile: Error performing command: "
                                 "the local file cannot be read to its end"));
    EXPECT_EQ(TLines(record.fCalls.end() - 3, record.fCalls.end()), Joined({"perform"}, kEnd, {}));
  }
}

TEST_F(TransferTest, AFailedPerformKeepsItsReasonEvenWhenTheFileCannotBeRead) {
  fRecord.fResult = 67;
  fRecord.fErrorText = "Access denied: 530";
  TLines log;
  WithStandIn(fRecord, [&] {
    log = LogOf([&] { EXPECT_STATUS(TOSSpecific::CurlTransferFile("ftp://h/f", fDir.Path(), false), kZEPStatusAccessDenied); });
  });
  EXPECT_THAT(log, ElementsAre("[Error] TOSSpecific|CurlTransferFile: Error performing command: Access denied: 530"));
}

TEST_F(TransferTest, TheResultOfPerformBecomesAStatus) {
  struct TRow {
    int fResult;
    char const* fErrorText;
    EZEPStatusCode fStatus;
    char const* fMessage;
  };
  TRow const rows[] = {
      {5, "Could not resolve proxy: p", kZEPStatusAccessDenied,
       "[Error] TOSSpecific|CurlTransferFile: Error performing command: Could not resolve proxy: p"},
      {6, "Could not resolve host: h", kZEPStatusConnectionFailed,
       "[Error] TOSSpecific|CurlTransferFile: Error connecting to Server"},
      {7, "Failed to connect", kZEPStatusConnectionFailed, "[Error] TOSSpecific|CurlTransferFile: Error connecting to Server"},
      {8, "", kZEPStatusAccessDenied, "[Error] TOSSpecific|CurlTransferFile: Error performing command: "},
      {1, "Protocol \"x\" not supported", kZEPStatusAccessDenied,
       "[Error] TOSSpecific|CurlTransferFile: Error performing command: Protocol \"x\" not supported"},
      {28, "server response timeout", kZEPStatusAccessDenied,
       "[Error] TOSSpecific|CurlTransferFile: Error performing command: server response timeout"},
      {67, "Access denied: 530", kZEPStatusAccessDenied,
       "[Error] TOSSpecific|CurlTransferFile: Error performing command: Access denied: 530"},
      {99, "", kZEPStatusAccessDenied, "[Error] TOSSpecific|CurlTransferFile: Error performing command: "},
  };
  WriteFile(fDir.Path("there"), "text");
  for (TRow const& row : rows)
    for (bool const download : {true, false}) {
      SCOPED_TRACE(std::to_string(row.fResult) + (download ? " down" : " up"));
      TCurlRecord record;
      record.fResult = row.fResult;
      record.fErrorText = row.fErrorText;
      std::string const file = download ? fFile : fDir.Path("there");
      TLines log;
      WithStandIn(record, [&] {
        log = LogOf([&] { EXPECT_STATUS(TOSSpecific::CurlTransferFile("ftp://h/f", file, download), row.fStatus); });
      });
      EXPECT_THAT(log, ElementsAre(row.fMessage));
      EXPECT_EQ(TLines(record.fCalls.end() - 3, record.fCalls.end()), Joined({"perform"}, kEnd, {}));
    }
}

TEST_F(TransferTest, APartOfABrokenDownloadStays) {
  fRecord.fChunks = {"part"};
  fRecord.fResult = 18;
  WithStandIn(fRecord, [&] { EXPECT_STATUS(TOSSpecific::CurlTransferFile("ftp://h/f", fFile, true), kZEPStatusAccessDenied); });
  EXPECT_EQ(ReadFile(fFile), "part");
}

// ---- Loading libcurl ----

TEST_F(TransferTest, EachOfTheSixFunctionsIsNeeded) {
  for (std::string const name : {"curl_global_init", "curl_easy_init", "curl_easy_setopt", "curl_easy_perform",
                                 "curl_easy_cleanup", "curl_global_cleanup"}) {
    SCOPED_TRACE(name);
    TCurlRecord record;
    TLines transfer, proxyCheck;
    WithStandIn(
        record,
        [&] {
          transfer =
              LogOf([&] { EXPECT_STATUS(TOSSpecific::CurlTransferFile("ftp://h/f", fFile, true), kZEPStatusLibCurlFailure); });
          proxyCheck =
              LogOf([&] { EXPECT_STATUS(TOSSpecific::CheckProxySetting("p", "1", "u:p", 0), kZEPStatusLibCurlFailure); });
        },
        "without_" + name);
    std::string const reason = TStandIn::Path("without_" + name) + ": undefined symbol: " + name;
    EXPECT_THAT(transfer, ElementsAre("[Error] TOSSpecific|CurlTransferFile: Error loading curl library: " + reason));
    EXPECT_THAT(proxyCheck, ElementsAre("[Error] TOSSpecific|CheckProxySetting: Error loading curl library: " + reason));
    EXPECT_THAT(record.fCalls, IsEmpty());
  }
}

// Directories with the core library and with the copies of libcurl that the linker may find beside it and elsewhere.
class LoadingCurlTest : public testing::Test {
protected:
  LoadingCurlTest() {
    fs::create_directory(fDir.Path("root"));
    fs::create_directory(fDir.Path("system"));
    fs::copy(ZEP_LIBRARY, Root("libzepcore.so"));
    for (char const* name : {"libcurl.so", "libcurl.so.4"}) fs::copy(kStandIn, Root(name));
    for (char const* name : {"libcurl.so", "libcurl.so.4", "libcurl.so.3", "libcurl.so.2"}) fs::copy(kStandIn, System(name));
  }

  std::string Root(std::string const& name) const { return fDir.Path("root/" + name); }
  std::string System(std::string const& name) const { return fDir.Path("system/" + name); }

  // A file that is not a library: the loader finds it first, fails, and does not continue its search for the name.
  static void Spoil(std::string const& path) { WriteFile(path, ""); }

  TProgramRun Probe(std::string const& arguments = "") const {
    return RunProgram("LD_LIBRARY_PATH=" + fDir.Path("root") + ":" + fDir.Path("system") + " " ZEP_CURL_DIR "/TransferProbe " +
                      arguments + " 2>&1");
  }

  std::string const kStandIn = TStandIn::Path("whole");
  TTempDir fDir;
};

TEST_F(LoadingCurlTest, TheFirstThatLoadsIsUsedByEachCall) {
  // Each stand-in names its file, once for each call.
  struct TRow {
    std::function<void()> fPrepare;
    std::string fUsed;
  };
  TRow const rows[] = {
      {[] {}, Root("libcurl.so")},
      {[this] { Spoil(Root("libcurl.so")); }, Root("libcurl.so.4")},
      {[this] {
         fs::remove(Root("libcurl.so"));
         fs::remove(Root("libcurl.so.4"));
       },
       System("libcurl.so")},
      {[this] { Spoil(System("libcurl.so")); }, System("libcurl.so.4")},
      {[this] { Spoil(System("libcurl.so.4")); }, System("libcurl.so.3")},
      {[this] { Spoil(System("libcurl.so.3")); }, System("libcurl.so.2")},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fUsed);
    row.fPrepare();
    TProgramRun const run = Probe();
    EXPECT_EQ(run.fOutput, row.fUsed + "\ndone\n" + row.fUsed + "\ndone\n");
    EXPECT_EQ(run.fExitCode, 0);
  }
}

TEST_F(LoadingCurlTest, WithoutOneEachCallTriesEveryNameAgain) {
  fs::remove(Root("libcurl.so"));
  fs::remove(Root("libcurl.so.4"));
  fs::remove(System("libcurl.so.2"));
  for (char const* name : {"libcurl.so", "libcurl.so.4", "libcurl.so.3"}) Spoil(System(name));
  std::string const failure =
      "kZEPStatusLibCurlFailure\n"
      "TOSSpecific|CurlTransferFile: Error opening curl library: "
      "libcurl.so.2: cannot open shared object file: No such file or directory\n";
  EXPECT_EQ(Probe().fOutput, failure + failure);
  std::string const ofProxy =
      "kZEPStatusLibCurlFailure\n"
      "TOSSpecific|CheckProxySetting: Error opening curl library: "
      "libcurl.so.2: cannot open shared object file: No such file or directory\n";
  EXPECT_EQ(Probe("--proxy").fOutput, ofProxy + ofProxy);
  // A library that is added between the two calls is found by the second call.
  std::string const late = Root("libcurl.so.4");
  EXPECT_EQ(Probe(kStandIn + " " + late).fOutput, failure + late + "\ndone\n");
}

// ---- The write callback ----

TEST_F(TransferTest, WriteCallbackAppendsAndCloses) {
  TCurlWriteContext context{fFile, nullptr};
  int const descriptors = OpenDescriptors();
  char first[] = "abcd", second[] = "efghij";
  EXPECT_EQ(curl_fwrite(first, 1, 4, &context), 4u);
  EXPECT_EQ(context.fStream, nullptr);
  EXPECT_EQ(curl_fwrite(second, 3, 2, &context), 2u) << "items, not bytes";
  EXPECT_EQ(curl_fwrite(second, 1, 0, &context), 0u);
  EXPECT_EQ(curl_fwrite(second, 0, 5, &context), 0u);
  EXPECT_EQ(ReadFile(fFile), "abcdefghij");
  EXPECT_EQ(OpenDescriptors(), descriptors);
}

TEST_F(TransferTest, WriteCallbackRefusesWithoutContextPathOrFile) {
  char data[] = "abcd";
  TCurlWriteContext noPath{"", nullptr}, noDirectory{fDir.Path("no/file"), nullptr}, directory{fDir.Path(), nullptr};
  EXPECT_EQ(curl_fwrite(data, 1, 4, nullptr), 0xFFFFFFFFu);
  EXPECT_EQ(curl_fwrite(data, 1, 4, &noPath), 0xFFFFFFFFu);
  EXPECT_EQ(curl_fwrite(data, 1, 4, &noDirectory), 0xFFFFFFFFu);
  EXPECT_EQ(curl_fwrite(data, 1, 4, &directory), 0xFFFFFFFFu);
}

TEST_F(TransferTest, AChunkThatDoesNotGetToTheDiskIsNotWritten) {
  TCurlWriteContext context{"/dev/full", nullptr};
  for (unsigned long const size : {1ul, 100ul, 4096ul, 16384ul, 16385ul}) {
    SCOPED_TRACE(size);
    std::string data(size, 'x');
    EXPECT_LT(curl_fwrite(data.data(), 1, size, &context), size);
  }
}

TEST_F(TransferTest, ADownloadEndsAtTheFirstChunkThatIsRefused) {
  fRecord.fChunks = {"one", "two"};
  WithStandIn(fRecord, [&] {
    EXPECT_STATUS(TOSSpecific::CurlTransferFile("ftp://h/f", fDir.Path("no/file"), true), kZEPStatusAccessDenied);
  });
  EXPECT_THAT(fRecord.fCalls, testing::Contains("write 4294967295").Times(1));
}

// ---- A local file in the way of a download ----

// Downloads onto the file in a process that has the input as its standard input: everything that it printed, and then the
// calls of libcurl in a line each.
std::string DownloadOnto(std::string const& file, std::string const& input, TTempDir const& dir) {
  WriteFile(dir.Path("input"), input);
  return InChild([&] {
    TCurlRecord record;
    record.fChunks = {"new"};
    if (std::freopen(dir.Path("input").c_str(), "r", stdin) == nullptr) return std::string("no input");
    if (std::freopen(dir.Path("output").c_str(), "w", stdout) == nullptr) return std::string("no output");
    {
      TStandIn const standIn(record);
      TOSSpecific::CurlTransferFile("ftp://h/f", file, true);
    }
    std::fflush(stdout);
    std::string text = ReadFile(dir.Path("output"));
    for (std::string const& call : record.fCalls) text += "\n" + call;
    return text;
  });
}

std::string const kQuestion = "Local file exists, overwrite it anyway?(y/n): ";
std::string const kQuietEnd =
    "\nglobal_init 3\neasy_init\nsetopt ERRORBUFFER buffer\nsetopt FTP_USE_EPSV 0\nsetopt PROXY ''\neasy_cleanup\nglobal_cleanup"
    "\nunload";

std::string Repeated(std::string const& text, int times) {
  std::string all;
  while (times-- > 0) all += text;
  return all;
}

TEST_F(TransferTest, ReasonTravelsWithTheFailureWithoutTheOperationsName) {
  struct TRow {
    int fResult;
    std::string fText, fReason;
  };
  std::string const operation = "TOSSpecific|CurlTransferFile: ";
  for (TRow const& row : {TRow{6, "Could not resolve host: h", "Error connecting to Server"},
                          TRow{67, "Access denied: 530", "Error performing command: Access denied: 530"},
                          TRow{67, "", "Error performing command: "}}) {
    SCOPED_TRACE(row.fReason);
    TCurlRecord record;
    record.fResult = row.fResult;
    record.fErrorText = row.fText;
    WithStandIn(record,
                [&] { ExpectReason([&] { TOSSpecific::CurlTransferFile("ftp://h/f", fFile, true); }, operation, row.fReason); });
  }
  WithStandIn(fRecord, [&] {
    ExpectReason([&] { TOSSpecific::CurlTransferFile("ftp://h/f", fDir.Path("missing"), false); }, operation,
                 "Error getting file size");
  });
  fRecord.fRefusedOption = 10002;  // CURLOPT_URL
  WithStandIn(fRecord, [&] {
    ExpectReason([&] { TOSSpecific::CurlTransferFile("ftp://h/f", fFile, true); }, operation, "Error setting curl target");
    ExpectReason([&] { TOSSpecific::CheckProxySetting("p", "1", "u:p", 0); },
                 "TOSSpecific|CheckProxySetting: ", "Error setting URL");
  });
}

TEST_F(TransferTest, ALocalFileIsOverwrittenWhenTheAnswerIsY) {
  struct TRow {
    char const* fInput;
    int fQuestions;
    bool fIsOverwritten;
  };
  TRow const rows[] = {
      {"y\n", 1, true},       {"Y\n", 1, true},       {"y", 1, true},  // without an end of line
      {"n\n", 1, false},      {"N\n", 1, false},      {"\n\ny\n", 3, true},
      {"yes\ny\n", 2, true},  {"yes\nn\n", 2, false}, {"no\n y\ny \nYY\n1\nN\n", 6, false},
      {"y\r\nn\n", 2, false}, {"n\ny\n", 1, false},   {"", 1, false},  // the end of the input counts as "n"
      {"yes\n", 2, false},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(testing::PrintToString(row.fInput));
    WriteFile(fFile, "old and longer");
    std::string const output = DownloadOnto(fFile, row.fInput, fDir);
    std::string const questions = Repeated(kQuestion, row.fQuestions);
    if (row.fIsOverwritten) {
      EXPECT_THAT(output, StartsWith(questions + "\nglobal_init 3\n"));
      EXPECT_THAT(output, testing::HasSubstr("\nperform\n"));
      EXPECT_EQ(ReadFile(fFile), "new");
    } else {
      EXPECT_EQ(output, questions + kQuietEnd);
      EXPECT_EQ(ReadFile(fFile), "old and longer");
    }
  }
}

TEST_F(TransferTest, ALocalFileThatCannotBeDeletedEndsQuietly) {
  // A directory can be opened for reading, but not unlinked, not even by root.
  fs::create_directory(fFile);
  EXPECT_EQ(DownloadOnto(fFile, "y\n", fDir), kQuestion + "Permission denied.\n" + kQuietEnd);
  EXPECT_TRUE(fs::is_directory(fFile));
}

TEST_F(TransferTest, NoQuestionIsAskedAboutAnUnreadableLocalFile) {
  WriteFile(fFile, "old");
  fs::permissions(fFile, fs::perms::owner_write | fs::perms::others_write);
  fs::permissions(fDir.Path(), fs::perms::all);
  NEEDS(InChild([] { return BecomeUnprivileged() ? "yes" : "no"; }) == "yes", "a user without privileges");
  std::string const text = InChild([&] {
    TCurlRecord record;
    record.fChunks = {"new"};
    TStandIn const standIn(record);
    if (!BecomeUnprivileged()) return std::string("still privileged");
    if (::freopen("/dev/null", "r", stdin) == nullptr) return std::string("no input");
    TOSSpecific::CurlTransferFile("ftp://h/f", fFile, true);
    return std::string("no question");
  });
  EXPECT_EQ(text, "no question");
  EXPECT_EQ(ReadFile(fFile), "oldnew") << "the download is appended";
}

// ---- The operations that make the URL ----

TEST_F(TransferTest, UrlsAreMadeOfHostAndName) {
  WriteFile(fFile, "text");
  std::string const upload = "hostline/toqrv/vantor/fdr_upload/";
  struct TRow {
    char const* fIsBootable;
    std::string fPrefix;
  };
  TRow const rows[] = {{nullptr, ""}, {"no", ""}, {"", ""}, {"YES", ""}, {"Yes", ""}, {"yes ", ""}, {"yes", upload}};
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fIsBootable ? row.fIsBootable : "not set");
    TEnvironmentGuard const guard("ZEP_ISBOOTABLE", row.fIsBootable);
    std::string const absent = fDir.Path("absent");
    struct TOperation {
      std::function<void()> fCall;
      std::string fUrl, fUploaded;
    };
    TOperation const operations[] = {
        {[&] { TOSSpecific::FTPFile("h:21", fFile, "d/n"); }, "ftp://h:21/" + row.fPrefix + "d/n", "text"},
        {[&] { TOSSpecific::sFTPFile("h", fFile, "d/n"); }, "sftp://h/" + row.fPrefix + "d/n", "text"},
        {[&] { TOSSpecific::UserFTPFile("h", fFile, "n"); }, "ftp://h/n.xml.gz", "text"},
        {[&] { TOSSpecific::FTPFileFromQRV("h", absent, "d/n"); }, "ftp://h/d/n", ""},
        {[&] { TOSSpecific::sFTPFileFromQRV("u:p@h", absent, "n"); }, "sftp://u:p@h/n", ""},
    };
    for (TOperation const& operation : operations) {
      TCurlRecord record;
      WithStandIn(record, operation.fCall);
      EXPECT_THAT(record.fCalls, testing::Contains("setopt URL '" + operation.fUrl + "'"));
      EXPECT_EQ(record.fUploaded, operation.fUploaded) << operation.fUrl;
    }
  }
}

TEST_F(TransferTest, UserUploadNamesTheRemoteFileFirst) {
  TCurlRecord record;
  testing::internal::CaptureStdout();
  WithStandIn(record, [&] { EXPECT_STATUS(TOSSpecific::UserFTPFile("h", fFile, "nightly"), kZEPStatusLibCurlFailure); });
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "Remote file name = nightly.xml.gz\n");
}

TEST_F(TransferTest, ExceptionsOfATransferPassThrough) {
  WriteFile(fFile, "text");
  for (auto const& operation : std::vector<std::function<void()>>{
           [&] { TOSSpecific::FTPFile("h", fFile, "n"); }, [&] { TOSSpecific::sFTPFile("h", fFile, "n"); },
           [&] { TOSSpecific::FTPFileFromQRV("h", fDir.Path("a"), "n"); },
           [&] { TOSSpecific::sFTPFileFromQRV("h", fDir.Path("a"), "n"); }, [&] { TOSSpecific::UserFTPFile("h", fFile, "n"); }}) {
    TCurlRecord record;
    record.fResult = 7;
    WithStandIn(record, [&] { EXPECT_STATUS(operation(), kZEPStatusConnectionFailed); });
  }
}

// ---- The proxy check ----

class ProxyCheckTest : public TransferTest {
protected:
  TWorkingDirectory const fWork{fDir.Path()};
};

TEST_F(ProxyCheckTest, SetsItsOptionsInOrder) {
  fRecord.fChunks = {"<html>", "</html>"};
  fRecord.fFileToWatch = fDir.Path("content.html");
  TLines log;
  WithStandIn(fRecord, [&] {
    log = LogOf([&] { EXPECT_EQ(TOSSpecific::CheckProxySetting("10.0.0.1", "8080", "u:p", 5), kZEPStatusOK); });
  });
  EXPECT_THAT(
      fRecord.fCalls,
      ElementsAre("global_init 3", "easy_init", "setopt ERRORBUFFER buffer", "setopt PROXY '10.0.0.1'", "setopt PROXYPORT 8080",
                  "setopt URL '" ZEP_PROXY_CHECK_PAGE "'", "setopt WRITEFUNCTION function", "setopt WRITEDATA context",
                  "setopt PROXYUSERPWD 'u:p'", "perform", "write 6 file 6", "write 7 file 13", "easy_cleanup", "global_cleanup"));
  EXPECT_EQ(ReadFile(fDir.Path("content.html")), "<html></html>");
  EXPECT_THAT(log, IsEmpty());
}

TEST_F(ProxyCheckTest, ThePageIsAppendedToAnExistingFile) {
  WriteFile(fDir.Path("content.html"), "earlier ");
  fRecord.fChunks = {"page"};
  WithStandIn(fRecord, [] { EXPECT_EQ(TOSSpecific::CheckProxySetting("p", "1", "u:p", 0), kZEPStatusOK); });
  EXPECT_EQ(ReadFile(fDir.Path("content.html")), "earlier page");
}

TEST_F(ProxyCheckTest, ARefusedOptionEndsIt) {
  ExpectRefusals({{10010, "TOSSpecific|CheckProxySetting: Error configuring curl error buffer", "setopt ERRORBUFFER buffer"},
                  {10004, "TOSSpecific|CheckProxySetting: Error setting proxyIp", "setopt PROXY 'p'"},
                  {59, "TOSSpecific|CheckProxySetting: Error setting proxyPort", "setopt PROXYPORT 1"},
                  {10002, "TOSSpecific|CheckProxySetting: Error setting URL", "setopt URL '" ZEP_PROXY_CHECK_PAGE "'"},
                  {20011, "TOSSpecific|CurlTransferFile: Error setting curl write function", "setopt WRITEFUNCTION function"},
                  {10001, "TOSSpecific|CurlTransferFile: Error setting curl write function", "setopt WRITEDATA context"},
                  {10006, "TOSSpecific|CheckProxySetting: Error setting userId & passwd", "setopt PROXYUSERPWD 'u:p'"}},
                 [] { TOSSpecific::CheckProxySetting("p", "1", "u:p", 0); });
}

TEST_F(ProxyCheckTest, WithoutAHandleNothingIsSet) {
  fRecord.fGivesNoHandle = true;
  TLines log;
  WithStandIn(fRecord, [&] {
    log = LogOf([&] { EXPECT_STATUS(TOSSpecific::CheckProxySetting("p", "1", "u:p", 0), kZEPStatusLibCurlFailure); });
  });
  EXPECT_THAT(log, ElementsAre("[Error] TOSSpecific|CheckProxySetting: Error initalizing curl"));
}

TEST_F(ProxyCheckTest, AFailedPerformIsLoggedAndReturned) {
  struct TRow {
    int fResult;
    EZEPStatusCode fStatus;
  };
  for (TRow const& row : {TRow{5, kZEPStatusConnectionFailed}, TRow{7, kZEPStatusConnectionFailed},
                          TRow{56, kZEPStatusAccessDenied}, TRow{23, kZEPStatusAccessDenied}}) {
    SCOPED_TRACE(row.fResult);
    TCurlRecord record;
    record.fResult = row.fResult;
    record.fErrorText = "the reason";
    TLines log;
    WithStandIn(record,
                [&] { log = LogOf([&] { EXPECT_EQ(TOSSpecific::CheckProxySetting("p", "1", "u:p", 0), row.fStatus); }); });
    EXPECT_THAT(log, ElementsAre("[Error] TOSSpecific|CheckProxySetting: curl_easy_perform FAILed;the reason"));
    EXPECT_EQ(TLines(record.fCalls.end() - 3, record.fCalls.end()), Joined({"perform"}, kEnd, {}));
  }
}

TEST_F(ProxyCheckTest, LibcurlsTextTravelsWithTheStatus) {
  for (std::string const reason : {"Received HTTP code 403 from proxy after CONNECT", ""}) {
    TCurlRecord record;
    record.fResult = 56;
    record.fErrorText = reason;
    TProxyAnswer answer;
    WithStandIn(record, [&] { answer = CheckProxy("p", "1", "u:p"); });
    EXPECT_EQ(answer.fStatus, kZEPStatusAccessDenied);
    EXPECT_EQ(answer.fReason, reason);
  }
}

TEST_F(ProxyCheckTest, APortThatIsNotANumberIsZero) {
  WithStandIn(fRecord, [] { TOSSpecific::CheckProxySetting("p", "many", "", 0); });
  EXPECT_THAT(fRecord.fCalls, testing::IsSupersetOf({"setopt PROXYPORT 0", "setopt PROXYUSERPWD ''"}));
}

// ---- The host name ----

TEST(DetectHostnameTest, ZeroMeansAvailable) {
  int result = -1;
  EXPECT_THAT(LogOf([&] { result = TOSSpecific::DetectHostnameAvailable("localhost", "ignored"); }),
              ElementsAre("[Debug] TOSSpecific debug output: Network is ok."));
  EXPECT_EQ(result, 0);
  EXPECT_EQ(TOSSpecific::DetectHostnameAvailable("127.0.0.1", ""), 0);
}

TEST(DetectHostnameTest, OneMeansUnavailable) {
  int result = -1;
  EXPECT_THAT(LogOf([&] { result = TOSSpecific::DetectHostnameAvailable("no host has blanks", ""); }),
              ElementsAre("[Debug] TOSSpecific debug output: Network is unavailable."));
  EXPECT_EQ(result, 1);
  EXPECT_EQ(TOSSpecific::DetectHostnameAvailable("", ""), 1);
}

}  // namespace
}  // namespace NQRVZEP20
