// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/bundle/CheckBundle.h"

#include "tests/tools/zep/bundle/Certificates.h"
#include "tools/zep/bundle/TBundle.h"
#include "tools/zep/packing/Archive.h"

#include <gmock/gmock.h>

#include <cstdlib>
#include <functional>
#include <optional>

namespace NQRVZEP20::zep {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::StartsWith;

struct TPart {
  TMember fMember;
  std::string fContent;
};
using TParts = std::vector<TPart>;

std::string Packed(TParts const& parts) {
  auto const archive = NewArchiveWriter();
  for (TPart const& part : parts) archive->Add(part.fMember, part.fContent);
  return archive->Finish();
}

TPart File(std::string const& name, std::string const& content) { return {{EMemberKind::kFile, name, {}, 0600}, content}; }

class CheckBundleTest : public testing::Test {
protected:
  std::string Good(TSigner const* signer = nullptr) {
    TBundle bundle({});
    bundle.Add(kReportPiece, "report\n", "made");
    bundle.Add(kLogPiece, "", "made");
    bundle.AddMissing(kRecordingPiece, "for a test");
    return bundle.Pack(signer);
  }

  std::string Write(std::string const& bytes) {
    WriteFile(fDir.Path("bundle"), bytes);
    return fDir.Path("bundle");
  }

  // The members: manifest.json, of a signed bundle manifest.p7s, report.json, log/zep.log.
  TParts PartsOf(std::string const& bytes) {
    auto const archive = NewArchiveReader(Write(bytes));
    TParts parts;
    while (auto const member = archive->Next()) parts.push_back({*member, archive->Content(1 << 20)});
    return parts;
  }

  TBundleCheck Check(std::string const& bytes, TTrust const& trust = {}) { return CheckBundle(Write(bytes), trust); }

  // Each difference as "member: reason".
  std::vector<std::string> Differences(std::string const& bytes, TTrust const& trust = {}) {
    std::vector<std::string> lines;
    for (TBundleDifference const& row : Check(bytes, trust).fDifferences) lines.push_back(row.fMember + ": " + row.fReason);
    return lines;
  }

  std::string WhyRefused(std::string const& bytes) {
    try {
      Check(bytes);
      return "";
    } catch (TArchiveError const& failure) {
      return failure.what();
    }
  }

  TTempDir fDir;
  TIdentity fAlice{fDir, "alice"}, fMallory{fDir, "mallory"};
  std::unique_ptr<TSigner> const fSigner = SignerFrom(fAlice.fKeyFile, fAlice.fCertificateFile);
  TTrust const fTrust{fAlice.fCertificateFile, ""};
};

TEST_F(CheckBundleTest, AGoodBundleIsRight) {
  TBundleCheck const check = Check(Good());
  EXPECT_TRUE(check.IsRight());
  EXPECT_EQ(check.fSigner, "");
  ASSERT_EQ(check.fManifest.fPieces.size(), 2u);
  EXPECT_EQ(check.fManifest.fPieces[0].fBytes, 7u);
  EXPECT_EQ(check.fManifest.fMissing[0].fReason, "for a test");
  TBundleCheck const trusted = Check(Good(fSigner.get()), fTrust);
  EXPECT_TRUE(trusted.IsRight());
  EXPECT_EQ(trusted.fSigner, "CN=alice");
}

TEST_F(CheckBundleTest, EachDifferenceIsNamed) {
  struct TRow {
    std::string fLine;
    std::function<void(TParts&)> fChange;
  } const rows[] = {
      {"report.json: its content was altered: its SHA-256 differs", [](TParts& p) { p[1].fContent = "Report\n"; }},
      {"report.json: it has 6 bytes instead of 7", [](TParts& p) { p[1].fContent = "report"; }},
      {"log/zep.log: it has 1 bytes instead of 0", [](TParts& p) { p[2].fContent = "x"; }},
      {"log/zep.log: it is missing", [](TParts& p) { p.pop_back(); }},
      {"report.html: the manifest does not name it", [](TParts& p) { p.push_back(File("report.html", "x")); }},
      {"../report.json: the manifest does not name it", [](TParts& p) { p.push_back(File("../report.json", "x")); }},
      {"/etc/passwd: the manifest does not name it", [](TParts& p) { p.push_back(File("/etc/passwd", "x")); }},
      {"manifest.p7s: the manifest does not name it", [](TParts& p) { p.push_back(File("manifest.p7s", "x")); }},
      {"report.json: it is contained twice", [](TParts& p) { p.push_back(p[1]); }},
      {"manifest.json: it is contained twice", [](TParts& p) { p.push_back(p[0]); }},
      {"log/zep.log: it is a symbolic link",
       [](TParts& p) {
         p[2] = {{EMemberKind::kLink, "log/zep.log", "/etc/passwd", 0777}, ""};
       }},
      {"log/zep.log: it is a directory",
       [](TParts& p) {
         p[2] = {{EMemberKind::kDirectory, "log/zep.log", {}, 0700}, ""};
       }},
      {"log: it is a directory",
       [](TParts& p) {
         p.push_back({{EMemberKind::kDirectory, "log", {}, 0700}, ""});
       }},
  };
  TParts const good = PartsOf(Good());
  for (TRow const& row : rows) {
    TParts parts = good;
    row.fChange(parts);
    EXPECT_THAT(Differences(Packed(parts)), ElementsAre(row.fLine));
  }
  TParts exchanged = good;
  std::swap(exchanged[1].fMember.fName, exchanged[2].fMember.fName);
  EXPECT_EQ(Differences(Packed(exchanged)).size(), 2u);
}

TEST_F(CheckBundleTest, ASignatureThatDoesNotHoldIsNamed) {
  TParts const good = PartsOf(Good(fSigner.get()));
  TParts parts = good;
  parts[0].fContent.replace(parts[0].fContent.find("for a test"), 3, "FOR");
  EXPECT_THAT(Differences(Packed(parts)), ElementsAre(StartsWith("manifest.p7s: it is not a signature of this manifest (")));
  parts = good;
  parts[1].fContent = "x";
  EXPECT_THAT(Differences(Packed(parts)), ElementsAre(StartsWith("manifest.p7s: it is not a signature of this manifest (")));
  parts = good;
  parts[1].fContent = SignerFrom(fMallory.fKeyFile, fMallory.fCertificateFile)->Sign(parts[0].fContent);
  EXPECT_THAT(Differences(Packed(parts)), IsEmpty());
  EXPECT_THAT(Differences(Packed(parts), fTrust),
              ElementsAre("manifest.p7s: it is of another signer than the one that is trusted"));
  parts.erase(parts.begin() + 1);
  EXPECT_THAT(Differences(Packed(parts)), ElementsAre("manifest.p7s: it is missing, and the manifest says that there is one"));
}

TEST_F(CheckBundleTest, ABundleWithoutSignatureIsNotRightIfASignerIsTrusted) {
  EXPECT_THAT(Differences(Good(), fTrust),
              ElementsAre("manifest.p7s: the bundle is not signed, so its signer cannot be checked"));
}

TEST_F(CheckBundleTest, AManifestThatIsNotSoundIsRefused) {
  struct TRow {
    char const* fFrom;
    char const* fTo;
    char const* fWhy;
  } const rows[] = {
      {"report.json", "../report.json", "manifest.json is not sound: no bundle has a piece ../report.json"},
      {"report.json", "log/zep.log", "manifest.json is not sound: log/zep.log is named twice"},
      {"\"bytes\": 7", "\"bytes\": 7000000000", "manifest.json is not sound: report.json has more than 268435456 bytes"},
      {"\"sha256\": \"", "\"sha256\": \"x",
       "manifest.json is not sound: the SHA-256 of report.json has not 64 hexadecimal digits"},
      {"\"signed\"", "\"x\"", "manifest.json is not sound: [json.exception.out_of_range.403] key 'signed' not found"},
      {"\"bundleVersion\": 1", "\"bundleVersion\": 2",
       "it is a bundle of the version 2, written by zep " ZEP_VERSION "; this zep reads only the version 1"},
      {"\"bundleVersion\": 1", "\"bundleVersion\": 4294967297",
       "it is a bundle of the version 4294967297, written by zep " ZEP_VERSION "; this zep reads only the version 1"},
      {"\"bundleVersion\": 1", "\"bundleVersion\": 1.9",
       "it is a bundle of the version 1.9, written by zep " ZEP_VERSION "; this zep reads only the version 1"},
      {"\"bundleVersion\": 1", "\"bundleVersion\": true",
       "it is a bundle of the version true, written by zep " ZEP_VERSION "; this zep reads only the version 1"},
      {"\"time\": \"2", "\"time\": \"x", "manifest.json is not sound: its time is invalid"},
  };
  for (TRow const& row : rows) {
    TParts parts = PartsOf(Good());
    std::string& manifest = parts[0].fContent;
    manifest.replace(manifest.find(row.fFrom), std::string(row.fFrom).size(), row.fTo);
    EXPECT_EQ(WhyRefused(Packed(parts)), row.fWhy);
  }
}

TEST_F(CheckBundleTest, AForeignOrCutFileIsRefused) {
  std::string const good = Good();
  for (std::string const& bytes : {std::string(), std::string("hello"), good.substr(0, good.size() / 2), good.substr(0, 20)})
    EXPECT_THAT(WhyRefused(bytes), testing::AnyOf(StartsWith("it is cut, damaged or not a zstd-compressed tar archive"),
                                                  StartsWith("it is not a bundle: its first member is not manifest.json")));
  EXPECT_THAT(WhyRefused(Packed({File("recording.json", "{}")})), StartsWith("it is not a bundle"));
}

TEST_F(CheckBundleTest, AHardLinkAndAFifoAreNamed) {
  std::string const repack = "cd '" + fDir.Path() +
                             "' && tar --zstd -xf bundle && ln -f manifest.json report.json && rm log/zep.log && "
                             "mkfifo log/zep.log && tar --zstd -cf bundle manifest.json report.json log/zep.log";
  Write(Good());
  ASSERT_EQ(std::system(repack.c_str()), 0);
  EXPECT_THAT(Differences(ReadFile(fDir.Path("bundle"))), ElementsAre("report.json: it is a hard link or a special file",
                                                                      "log/zep.log: it is a hard link or a special file"));
}

// The checksum would be that of an empty file; tar would unpack zeros.
TEST_F(CheckBundleTest, AMemberWithAHoleIsRefused) {
  std::string const repack = "cd '" + fDir.Path() +
                             "' && tar --zstd -xf bundle && truncate -s 0 report.json && truncate -s 1M report.json && " +
                             "tar --sparse --zstd -cf bundle manifest.json report.json log/zep.log";
  Write(Good());
  ASSERT_EQ(std::system(repack.c_str()), 0);
  EXPECT_EQ(WhyRefused(ReadFile(fDir.Path("bundle"))), "its member report.json has a hole at its end");
}

TEST_F(CheckBundleTest, NoMoreThanTheLimitsIsUnpacked) {
  TParts parts = PartsOf(Good());
  std::string const long17MiB(17 << 20, '\0');
  parts.push_back(File("bomb", long17MiB));
  EXPECT_EQ(WhyRefused(Packed(parts)), "its member bomb is longer than 16777216 bytes");
  EXPECT_EQ(WhyRefused(Packed({File(kManifestName, long17MiB)})), "its member manifest.json is longer than 1048576 bytes");
  parts.resize(3);
  for (int at = 0; at < 100; ++at) parts.push_back(File("x" + std::to_string(at), ""));
  EXPECT_EQ(WhyRefused(Packed(parts)), "it has more than 100 members");
}

TEST_F(CheckBundleTest, APieceThatIsTooLongIsMissing) {
  TBundle bundle({"serials"});
  bundle.Add(kLogPiece, std::string((64 << 20) + 1, 'x'), "made");
  TBundleCheck const check = Check(bundle.Pack(nullptr));
  EXPECT_TRUE(check.IsRight());
  EXPECT_THAT(check.fManifest.fPieces, IsEmpty());
  EXPECT_EQ(check.fManifest.fMissing.at(0).fReason, "it would have 67108865 bytes; the limit is 67108864");
  EXPECT_THAT(check.fManifest.fRedacted, ElementsAre("serials"));
}

}  // namespace
}  // namespace NQRVZEP20::zep
