// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/TSecretCollector.h"

#include "tests/collect/redaction/ReportDocument.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(TSecretCollectorTest, EachKindOfPropertyHasItsPseudonym) {
  struct TRow {
    char const *fProperty, *fValue, *fPseudonym;
  };
  TRow const rows[] = {
      {"UUID", "3F2A9C54-11D0-4B8E-9A7E-52540011AA01", "serial-"},
      {"AssetTag", "RACK5-C", "serial-"},
      {"SystemName", "build7.example.net", "host-"},
      {"SearchDomains", "lab.example.net", "host-"},
      {"PermanentAddress", "525400112202", "address-"},
      {"IPv4Address", "192.0.2.77", "address-"},
      {"IPv6Address", "2001:db8::77", "address-"},
      {"AccessInfo", "192.0.2.78", ""},
      {"UserID", "mallory", "user-"},
      {"SerialNumbers", "ZX81-78", "serial-"},
      {"ServiceTag", "7HQXK22", "serial-"},
      {"NodeName", "eui.00253885a1b2c3d4", "serial-"},
      {"RequestedHostname", "q78.example.net", "host-"},
      {"DNSSuffixesToAppend", "qlab.example.net", "host-"},
      {"IPDestinationAddress", "192.0.2.81", "address-"},
      {"NextHop", "192.0.2.82", "address-"},
      {"Address", "192.0.2.83", "address-"},
      {"AliasAddresses", "525400112203", "address-"},
      {"GroupAddresses", "3333ff112204", "address-"},
      {"ClientIdentifier", "01:52:54:00:11:22:05", "address-"},
      {"Surname", "Quillfeather", "user-"},
      {"GivenName", "Quentin", "user-"},
      {"Mail", "quentin@example.net", "user-"},
      {"TelephoneNumber", "+44 1632 960077", "user-"},
      {"SystemName", "192.0.2.79", "address-"},
      {"Colour", "ZX81-77", ""},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fProperty);
    std::string const text = Redacted(DocumentWith(row.fProperty, row.fValue));
    bool const isSecret = *row.fPseudonym != '\0';
    EXPECT_EQ(text.find(row.fValue) == text.npos, isSecret);
    if (isSecret) {
      EXPECT_THAT(text, testing::HasSubstr(std::string("\"value\":\"") + row.fPseudonym));
    }
  }
}

TEST(TSecretCollectorTest, AClassInheritsThePropertiesOfItsSuperclasses) {
  TJson document = DocumentWith(InstanceOf("X_Rack", {{"Name", PropertyOf("string", "rack-row-9")}}));
  EXPECT_THAT(Redacted(document), testing::HasSubstr("rack-row-9"));
  document["classes"] = TJson::array({{{"class", "X_Rack"}, {"superclasses", {"X_Base", "CIM_System"}}}});
  EXPECT_THAT(Redacted(document), testing::Not(testing::HasSubstr("rack-row-9")));
}

TEST(TSecretCollectorTest, APersonIsASecret) {
  TJson const document = DocumentWith(InstanceOf("CIM_UserContact", {{"Name", PropertyOf("string", "Quentin Quill")}}));
  EXPECT_THAT(Redacted(document), testing::Not(testing::HasSubstr("Quill")));
}

TEST(TSecretCollectorTest, NamesAreTheSameInUpperAndLowerCase) {
  TJson document = DocumentWith(
      InstanceOf("x_rack", {{"serialnumber", PropertyOf("string", "ZX81-77")}, {"NAME", PropertyOf("string", "rack-row-9")}}));
  document["classes"] = TJson::array({{{"class", "x_rack"}, {"superclasses", {"cim_system"}}}});
  EXPECT_THAT(Redacted(document), testing::Not(testing::AnyOf(testing::HasSubstr("ZX81"), testing::HasSubstr("rack-row"))));
}

TEST(TSecretCollectorTest, APlugInMarksSecretsOfItsOwn) {
  TJson document = DocumentWith(InstanceOf("X_Rack", {{"Contact", PropertyOf("string", "mallory")},
                                                      {"Door", PropertyOf("string", "K-4711")},
                                                      {"Switch", PropertyOf("string", "sw7.lab.example.net")},
                                                      {"Colour", PropertyOf("string", "green")}}));
  document["head"][0] = "sw7 of mallory";
  document["classes"] = TJson::array({{{"class", "X_Rack"},
                                       {"superclasses", TJson::array()},
                                       {"secrets", {{"contact", "users"}, {"Door", "keys"}, {"Switch", "Hosts"}}}}});
  std::string const text = Redacted(document);
  EXPECT_THAT(text, testing::ContainsRegex("\"host-[0-9]+ of user-[0-9]+\""));
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("4711")));
  EXPECT_THAT(text, testing::HasSubstr("green"));
  document["classes"][0]["secrets"] = 3;
  EXPECT_THROW(Redacted(document), TRedactionError);
}

TEST(TSecretCollectorTest, ADescriptionMakesIdentifyingInfoASerialNumber) {
  std::string const text = Redacted(
      DocumentWith(InstanceOf("X_Disk", {{"OtherIdentifyingInfo", PropertyOf("string[]", {"QM-0001", "QEMU DISK"})},
                                         {"IdentifyingDescriptions", PropertyOf("string[]", {"Serial number", "Product"})}})));
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("QM-0001")));
  EXPECT_THAT(text, testing::HasSubstr("QEMU DISK"));
}

TEST(TSecretCollectorTest, PlaceholdersRemain) {
  for (char const* value : {"Not Specified", "To Be Filled By O.E.M.", "0", "00000000", "XXXXXXX", "x", "0000:00:1f.2", ""}) {
    std::string const text = Redacted(DocumentWith("SerialNumber", value));
    EXPECT_THAT(text, testing::HasSubstr("\"value\":\"" + std::string(value) + "\"")) << value;
  }
  for (char const* value : {"127.0.0.1", "::1", "0.0.0.0", "255.255.255.0", "::"})
    EXPECT_THAT(Redacted(DocumentWith("IPAddress", value)), testing::HasSubstr("\"value\":\"" + std::string(value) + "\""))
        << value;
  EXPECT_THAT(Redacted(DocumentWith("UserID", "root")), testing::HasSubstr("\"value\":\"root\""));
}

TEST(TSecretCollectorTest, AddressesInFreeTextAreFoundByTheirShape) {
  TJson const document = DocumentWith(InstanceOf(
      "X_Log",
      {{"Message", PropertyOf("string", "eth0: martian source 198.51.100.7 from 52:54:00:ab:cd:ef, fe80::9, at 10:20:30")},
       {"Version", PropertyOf("string", "198.51.100.8")}}));
  std::string const text = Redacted(document);
  EXPECT_THAT(text, testing::ContainsRegex("source address-[0-9]+ from address-[0-9]+, address-[0-9]+, at 10:20:30"));
  EXPECT_THAT(text, testing::HasSubstr("198.51.100.8")) << "may be a version";
}

TEST(TSecretCollectorTest, AMountNamesServersAndAccounts) {
  TJson document =
      DocumentWith(InstanceOf("ZEP_Mount", {{"Source", PropertyOf("string", "//nas7.lab.example.net/projects")},
                                            {"FileSystemOptions", PropertyOf("string", "rw,username=mallory,domain=QCORP")}}));
  document["instances"].push_back(InstanceOf("CIM_RemoteFileSystem", {{"Name", PropertyOf("string", "vault9:/export/home")}}));
  document["head"][0] = "nas7 of lab.example.net and ns.example.net; mallory of QCORP; vault9";
  std::string const text = Redacted(document);
  for (char const* secret : {"nas7", "example.net", "mallory", "QCORP", "vault9"})
    EXPECT_THAT(text, testing::Not(testing::HasSubstr(secret))) << secret;
  EXPECT_THAT(text, testing::ContainsRegex("host-[0-9]+:/export/home"));
}

TEST(TSecretCollectorTest, TheCommandLineOfTheKernelNamesServersAndPasswords) {
  TJson document = DocumentWith("KernelCommandLine", "quiet nfsroot=vault9:/export hostname=q77 rd.iscsi.password=admin");
  document["head"][0] = "vault9 of q77";
  std::string const text = Redacted(document);
  EXPECT_THAT(text,
              testing::ContainsRegex("quiet nfsroot=host-[0-9]+:/export hostname=host-[0-9]+ rd.iscsi.password=user-[0-9]+\""));
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("vault9")));
}

TEST(TSecretCollectorTest, TheDomainOfAHostIsASecretOfItsOwn) {
  TJson document = DocumentWith("SystemName", "node7.lab.example.net");
  document["head"] = {"search lab.example.net", "ns1.example.net", "net"};
  EXPECT_THAT(Redacted(document), testing::ContainsRegex("search host-[0-9]+\",\"ns1.host-[0-9]+\",\"net\""));
  EXPECT_THAT(Redacted(DocumentWith("SystemName", "node7.local")), testing::HasSubstr("/usr/lib/zepcore"));
}

TEST(TSecretCollectorTest, AnAccountMayHaveADomain) {
  TJson document = DocumentWith("UserName", TJson::array({"QCORP\\mallory", "trudy@lab.example.net"}));
  document["head"] = {"mallory, QCORP, trudy, lab.example.net"};
  for (char const* secret : {"QCORP", "mallory", "trudy", "example.net"})
    EXPECT_THAT(Redacted(document), testing::Not(testing::HasSubstr(secret))) << secret;
}

TEST(TSecretCollectorTest, TheNameOfAnIscsiTargetIsFoundByItsShape) {
  TJson const document =
      DocumentWith("Links", TJson::array({"/dev/disk/by-path/ip-192.0.2.9:3260-iscsi-iqn.2026-01.net.example:store7-lun-1"}));
  std::string const text = Redacted(document);
  EXPECT_THAT(text, testing::ContainsRegex("iscsi-serial-[0-9]+-lun-1"));
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("192.0.2.9")));
}

TEST(TSecretCollectorTest, EveryMessageMayHaveAnAddress) {
  TJson document = TJson::parse(StoredDocument());
  document["findings"]["problems"][0]["remedy"] = "ping 192.0.2.71";
  document["sections"][0]["whyEmpty"] = "192.0.2.72 does not answer";
  document["plugIns"][0]["exception"] = "no route to 192.0.2.73";
  EXPECT_THAT(Redacted(document), testing::Not(testing::HasSubstr("192.0.2.7")));
}

TEST(TSecretCollectorTest, AUserIsFoundByTheHomeDirectory) {
  TJson document = TJson::parse(StoredDocument());
  document["plugInDirectory"] = "/home/mallory/zep/lib";
  EXPECT_THAT(Redacted(document), testing::HasSubstr("/home/user-1/zep/lib"));
  document["plugInDirectory"] = "/run/media/mallory/STICK";
  EXPECT_THAT(Redacted(document), testing::HasSubstr("/run/media/user-1/STICK"));
  document["plugInDirectory"] = "/media/cdrom/lib";
  EXPECT_THAT(Redacted(document), testing::HasSubstr("/media/cdrom/lib"));
}

TEST(TSecretCollectorTest, CountsTheSecretsOfEachKind) {
  TJson const before = TJson::parse(StoredDocument());
  TSecretCounts counts = CountSecrets(before);
  ++counts[0];
  ++counts[3];
  TJson const document = DocumentWith(
      InstanceOf("X_Thing", {{"SerialNumber", PropertyOf("string", "ZX81-77")}, {"UserID", PropertyOf("string", "mallory")}}));
  EXPECT_EQ(CountSecrets(document), counts);
}

TEST(TSecretCollectorTest, AddressesAreFoundInEveryNotationOfAMessage) {
  TJson document = DocumentWith("Message",
                                "ip=192.0.2.5:192.0.2.1 to 192.0.2.77:8080, 192.0.2.80-192.0.2.90, eth0:192.0.2.91, "
                                "MAC=52:54:00:aa:bb:01:52:54:00:aa:bb:02:08:00, "
                                "root=UUID=0a1b2c3d-1111-2222-3333-444455556666");
  std::string const text = Redacted(document);
  for (char const* secret : {"192.0.2.", "aa:bb:01", "aa:bb:02", "0a1b2c3d"})
    EXPECT_THAT(text, testing::Not(testing::HasSubstr(secret))) << secret;
}

TEST(TSecretCollectorTest, OfAUrlTheHostIsASecretAndOfAnAddressNotThePort) {
  TJson const service = {{"AccessInfo", PropertyOf("string", "https://bmc77.example:8443/redfish")}};
  TJson document = DocumentWith(InstanceOf("CIM_RemoteServiceAccessPoint", service));
  document["head"][0] = "bmc77.example answers, bmc77 does not";
  std::string const text = Redacted(document);
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("bmc77")));
  EXPECT_THAT(text, testing::ContainsRegex("https://host-[0-9]+:8443/redfish"));
}

TEST(TSecretCollectorTest, TheAddressOfAServiceHasNoPort) {
  for (char const* address : {"192.0.2.84:443", "[2001:db8::84]:443", "https://192.0.2.84/redfish"}) {
    TJson const service = {{"AccessInfo", PropertyOf("string", address)}};
    std::string const text = Redacted(DocumentWith(InstanceOf("CIM_RemoteServiceAccessPoint", service)));
    EXPECT_THAT(text, testing::Not(testing::AnyOf(testing::HasSubstr("192.0.2.84"), testing::HasSubstr("db8::84")))) << address;
    EXPECT_THAT(text, testing::HasSubstr("address-")) << address;
  }
}

TEST(TSecretCollectorTest, TheFirstLabelOfADomainIsAWord) {
  TJson document = DocumentWith("SearchDomains", TJson::array({"dev.example.com"}));
  document["head"][0] = "/dev/sda of dev.example.com";
  EXPECT_THAT(Redacted(document), testing::ContainsRegex("/dev/sda of host-[0-9]+\""));
}

TEST(TSecretCollectorTest, TheIdentifierOfAVolumeGroupIsASerial) {
  std::string const id = "jY6etWf0aBcDeFgHiJkLmNoPqRsTuVwX";
  TJson document = DocumentWith("InstanceID", "ZEP:pool:" + id);
  document["head"][0] = "LVM-" + id + "0123456789abcdefghijklmnopqrstuv";
  EXPECT_THAT(Redacted(document), testing::Not(testing::HasSubstr(id)));
}

TEST(TSecretCollectorTest, DescriptionsMayHaveAnotherForm) {
  TJson document =
      DocumentWith(InstanceOf("X_Thing", {{"OtherIdentifyingInfo", PropertyOf("string[]", TJson::array({"ZX81-77"}))},
                                          {"IdentifyingDescriptions", PropertyOf("string", "Serial")}}));
  EXPECT_THAT(Redacted(document), testing::HasSubstr("ZX81-77"));
}

}  // namespace
}  // namespace NQRVZEP20
