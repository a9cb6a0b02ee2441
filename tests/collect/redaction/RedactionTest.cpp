// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/Redaction.h"

#include "collect/stored/StoredDocument.h"
#include "tests/collect/stored/StoredDocument.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

using TJson = nlohmann::ordered_json;

std::vector<ESecretKind> AllKinds() { return {kSecretKinds.begin(), kSecretKinds.end()}; }

TJson PropertyOf(std::string const& type, TJson const& value) { return {{"type", type}, {"value", value}, {"source", "test"}}; }

TJson InstanceOf(std::string const& className, TJson const& properties) {
  return {{"path", "root/x:" + className + ".Tag=\"1\""},
          {"provider", "X"},
          {"namespace", "root/x"},
          {"class", className},
          {"properties", properties}};
}

// A document with one instance more.
TJson DocumentWith(TJson const& instance) {
  TJson document = TJson::parse(StoredDocument());
  document["instances"].push_back(instance);
  return document;
}

TJson DocumentWith(std::string const& property, TJson const& value) {
  return DocumentWith(InstanceOf("X_Thing", {{property, PropertyOf(value.is_array() ? "string[]" : "string", value)}}));
}

std::string Redacted(TJson document, std::vector<ESecretKind> const& kinds = AllKinds()) {
  TPseudonyms pseudonyms("1");
  Redact(document, kinds, pseudonyms);
  return document.dump();
}

TEST(RedactionTest, ThePropertyDecidesAndItsValueIsReplacedEverywhere) {
  TJson document = DocumentWith("SerialNumber", "ZX81-77");
  document["head"][0] = "the machine with the number zx81-77, also /dev/disk/by-id/x_ZX81-77-part1";
  std::string const text = Redacted(document);
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("ZX81")));
  EXPECT_THAT(text, testing::HasSubstr("the machine with the number serial-"));
  EXPECT_THAT(text, testing::ContainsRegex("by-id/x_serial-[0-9]+-part1"));
}

TEST(RedactionTest, EachKindOfPropertyHasItsPseudonym) {
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

TEST(RedactionTest, AClassInheritsThePropertiesOfItsSuperclasses) {
  TJson document = DocumentWith(InstanceOf("X_Rack", {{"Name", PropertyOf("string", "rack-row-9")}}));
  EXPECT_THAT(Redacted(document), testing::HasSubstr("rack-row-9"));
  document["classes"] = TJson::array({{{"class", "X_Rack"}, {"superclasses", {"X_Base", "CIM_System"}}}});
  EXPECT_THAT(Redacted(document), testing::Not(testing::HasSubstr("rack-row-9")));
}

TEST(RedactionTest, ADescriptionMakesIdentifyingInfoASerialNumber) {
  std::string const text = Redacted(
      DocumentWith(InstanceOf("X_Disk", {{"OtherIdentifyingInfo", PropertyOf("string[]", {"QM-0001", "QEMU DISK"})},
                                         {"IdentifyingDescriptions", PropertyOf("string[]", {"Serial number", "Product"})}})));
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("QM-0001")));
  EXPECT_THAT(text, testing::HasSubstr("QEMU DISK"));
}

TEST(RedactionTest, PlaceholdersRemain) {
  for (char const* value : {"Not Specified", "To Be Filled By O.E.M.", "0", "00000000", "XXXXXXX", "x", "0000:00:1f.2", ""}) {
    std::string const text = Redacted(DocumentWith("SerialNumber", value));
    EXPECT_THAT(text, testing::HasSubstr("\"value\":\"" + std::string(value) + "\"")) << value;
  }
  for (char const* value : {"127.0.0.1", "::1", "0.0.0.0", "255.255.255.0", "::"})
    EXPECT_THAT(Redacted(DocumentWith("IPAddress", value)), testing::HasSubstr("\"value\":\"" + std::string(value) + "\""))
        << value;
  EXPECT_THAT(Redacted(DocumentWith("UserID", "root")), testing::HasSubstr("\"value\":\"root\""));
}

TEST(RedactionTest, OnlyTheKindsThatAreWantedAreReplaced) {
  TJson const document = DocumentWith(
      InstanceOf("X_Thing", {{"SerialNumber", PropertyOf("string", "ZX81-77")}, {"UserID", PropertyOf("string", "mallory")}}));
  std::string const text = Redacted(document, {ESecretKind::kUsers});
  EXPECT_THAT(text, testing::HasSubstr("ZX81-77"));
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("mallory")));
  EXPECT_THAT(text, testing::HasSubstr(R"("redaction":{"kinds":["users"],"map":"1"})"));
}

TEST(RedactionTest, AddressesInFreeTextAreFoundByTheirShape) {
  TJson const document = DocumentWith(InstanceOf(
      "X_Log",
      {{"Message", PropertyOf("string", "eth0: martian source 198.51.100.7 from 52:54:00:ab:cd:ef, fe80::9, at 10:20:30")},
       {"Version", PropertyOf("string", "198.51.100.8")}}));
  std::string const text = Redacted(document);
  EXPECT_THAT(text, testing::ContainsRegex("source address-[0-9]+ from address-[0-9]+, address-[0-9]+, at 10:20:30"));
  EXPECT_THAT(text, testing::HasSubstr("198.51.100.8")) << "may be a version";
}

TEST(RedactionTest, AUserIsFoundByTheHomeDirectory) {
  TJson document = TJson::parse(StoredDocument());
  document["plugInDirectory"] = "/home/mallory/zep/lib";
  EXPECT_THAT(Redacted(document), testing::HasSubstr("/home/user-1/zep/lib"));
}

TEST(RedactionTest, ASecretBesideSpacesAndQuotesOfUnicodeIsFound) {
  TJson document = DocumentWith("SerialNumber", "ZX81-77");
  document["head"] = {"\xe2\x80\x9cZX81-77\xe2\x80\x9d",
                      "a\xc2\xa0ZX81-77\xc2\xa0"
                      "b",
                      "\xc2\xabZX81-77\xc2\xbb",
                      "\xe3\x80\x8cZX81-77\xe3\x80\x8d",
                      "ZX81-77\xe2\x80\x93ZX81-77",
                      "\xe2\x80\x9c/home/carol\xe2\x80\x9d"};
  TJson redacted = document;
  TPseudonyms pseudonyms("1");
  Redact(redacted, AllKinds(), pseudonyms);
  for (char const* secret : {"ZX81", "carol"}) EXPECT_THAT(redacted.dump(), testing::Not(testing::HasSubstr(secret)));
  EXPECT_EQ(redacted["head"][0], "\xe2\x80\x9cserial-1\xe2\x80\x9d");
  Unredact(redacted, pseudonyms);
  EXPECT_EQ(redacted, document);
}

TEST(RedactionTest, NamesOfClassesAndNamespacesRemain) {
  std::string const text = Redacted(DocumentWith("SystemName", "root"));
  EXPECT_THAT(text, testing::HasSubstr("\"namespace\":\"root/x\""));
  EXPECT_THAT(text, testing::HasSubstr("root/x:X_Thing.Tag"));
}

TEST(RedactionTest, NumbersAndTimesRemain) {
  TJson const document = DocumentWith(
      InstanceOf("X_Thing", {{"SerialNumber", PropertyOf("string", "123987")}, {"Size", PropertyOf("uint64", "123987")}}));
  EXPECT_THAT(Redacted(document), testing::HasSubstr(R"("type":"uint64","value":"123987")"));
}

// So that the type of the value remains true.
TEST(RedactionTest, ANumberThatIsASecretBecomesNullWithItsPseudonymAsTheReason) {
  TJson document = DocumentWith(InstanceOf("X_Thing", {{"SerialNumber", PropertyOf("uint64", "12398765")},
                                                       {"AssetTag", PropertyOf("uint32", 4711081)},
                                                       {"GUID", PropertyOf("uint8[]", {17, 3, 250})},
                                                       {"UUID", PropertyOf("uint32", 0)}}));
  document["head"][0] = "the disk 12398765 in rack 4711081";
  TJson redacted = document;
  TPseudonyms pseudonyms("1");
  Redact(redacted, AllKinds(), pseudonyms);
  TJson const& properties = redacted["instances"].back()["properties"];
  for (char const* name : {"SerialNumber", "AssetTag", "GUID"}) {
    EXPECT_TRUE(properties[name]["value"].is_null()) << name;
    EXPECT_EQ(properties[name]["code"], "redacted") << name;
    EXPECT_THAT(properties[name]["reason"].get<std::string>(), testing::StartsWith("serial-")) << name;
  }
  EXPECT_EQ(properties["UUID"]["value"], 0);
  for (char const* secret : {"12398765", "4711081", "250"})
    EXPECT_THAT(redacted.dump(), testing::Not(testing::HasSubstr(secret)));
  TJson twice = redacted;
  twice.erase("redaction");
  EXPECT_THROW(Redact(twice, AllKinds(), pseudonyms), TRedactionError);
  Unredact(redacted, pseudonyms);
  EXPECT_EQ(redacted.dump(), document.dump());
}

TEST(RedactionTest, TheOriginalIsGivenBackByteForByte) {
  TJson document = DocumentWith("SerialNumber", "ZX81-77");
  document["head"] = {"zx81-77 and ZX81_77 and xxZX81-77, text-1 and serial-1, host-2b", "5a583831 5a5838312d3737 enxZX8177"};
  std::string const original = document.dump();
  TPseudonyms pseudonyms("1");
  Redact(document, AllKinds(), pseudonyms);
  EXPECT_NE(document.dump(), original);
  Unredact(document, TPseudonyms::From(pseudonyms.AsJson()));
  EXPECT_EQ(document.dump(), original);
}

TEST(RedactionTest, TheSameMapGivesTheSamePseudonyms) {
  TPseudonyms pseudonyms("1");
  TJson first = DocumentWith("SerialNumber", "ZX81-77"), second = first;
  Redact(first, AllKinds(), pseudonyms);
  TJson other = DocumentWith("SerialNumber", "ZX81-78");
  Redact(other, AllKinds(), pseudonyms);
  TPseudonyms again = TPseudonyms::From(pseudonyms.AsJson());
  Redact(second, AllKinds(), again);
  EXPECT_EQ(first.dump(), second.dump());
  EXPECT_EQ(pseudonyms.AsJson().dump(), again.AsJson().dump());
}

TEST(RedactionTest, AnotherMapAndAnUnknownPseudonymAreRefusedByPlace) {
  auto const whyRefused = [](TJson document, TPseudonyms const& pseudonyms) -> std::string {
    try {
      Unredact(document, pseudonyms);
    } catch (TRedactionError const& failure) {
      return failure.what();
    }
    return "";
  };
  TPseudonyms pseudonyms("1");
  TJson document = DocumentWith("SerialNumber", "ZX81-77");
  EXPECT_EQ(whyRefused(document, pseudonyms), "it is not redacted");
  Redact(document, AllKinds(), pseudonyms);
  EXPECT_EQ(whyRefused(document, TPseudonyms("2")), "it was redacted with another map");
  document["head"][1] = "see serial-99";
  EXPECT_EQ(whyRefused(document, pseudonyms), "/head/1: serial-99 is not in the map");
}

TEST(RedactionTest, CountsTheSecretsOfEachKind) {
  TJson const before = TJson::parse(StoredDocument());
  TSecretCounts counts = CountSecrets(before);
  ++counts[0];
  ++counts[3];
  TJson const document = DocumentWith(
      InstanceOf("X_Thing", {{"SerialNumber", PropertyOf("string", "ZX81-77")}, {"UserID", PropertyOf("string", "mallory")}}));
  EXPECT_EQ(CountSecrets(document), counts);
}

TEST(RedactionTest, AddressesAreFoundInEveryNotationOfAMessage) {
  TJson document = DocumentWith("Message",
                                "ip=192.0.2.5:192.0.2.1 to 192.0.2.77:8080, 192.0.2.80-192.0.2.90, eth0:192.0.2.91, "
                                "MAC=52:54:00:aa:bb:01:52:54:00:aa:bb:02:08:00, "
                                "root=UUID=0a1b2c3d-1111-2222-3333-444455556666");
  std::string const text = Redacted(document);
  for (char const* secret : {"192.0.2.", "aa:bb:01", "aa:bb:02", "0a1b2c3d"})
    EXPECT_THAT(text, testing::Not(testing::HasSubstr(secret))) << secret;
}

TEST(RedactionTest, OfAUrlTheHostIsASecretAndOfAnAddressNotThePort) {
  TJson const service = {{"AccessInfo", PropertyOf("string", "https://bmc77.example:8443/redfish")}};
  TJson document = DocumentWith(InstanceOf("CIM_RemoteServiceAccessPoint", service));
  document["head"][0] = "bmc77.example answers";
  std::string const text = Redacted(document);
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("bmc77")));
  EXPECT_THAT(text, testing::ContainsRegex("https://address-[0-9]+:8443/redfish"));
}

TEST(RedactionTest, TheFirstLabelOfADomainIsAWord) {
  TJson document = DocumentWith("SearchDomains", TJson::array({"dev.example.com"}));
  document["head"][0] = "/dev/sda of dev.example.com";
  EXPECT_THAT(Redacted(document), testing::ContainsRegex("/dev/sda of host-[0-9]+\""));
}

TEST(RedactionTest, TheIdentifierOfAVolumeGroupIsASerial) {
  std::string const id = "jY6etWf0aBcDeFgHiJkLmNoPqRsTuVwX";
  TJson document = DocumentWith("InstanceID", "ZEP:pool:" + id);
  document["head"][0] = "LVM-" + id + "0123456789abcdefghijklmnopqrstuv";
  EXPECT_THAT(Redacted(document), testing::Not(testing::HasSubstr(id)));
}

TEST(RedactionTest, OnlyAnObjectPathHidesItsClass) {
  TJson document = DocumentWith("SerialNumber", "ZX81-77");
  document["head"][0] = "root/x:ZX81-77 failed";
  EXPECT_THAT(Redacted(document), testing::Not(testing::HasSubstr("ZX81")));
}

TEST(RedactionTest, APropertyMayHaveTheNameOfAMember) {
  TJson document = DocumentWith(InstanceOf(
      "X_Thing", {{"SerialNumber", PropertyOf("string", "ZX81-77")}, {"thresholds", PropertyOf("string", "of ZX81-77")}}));
  EXPECT_THAT(Redacted(document), testing::Not(testing::HasSubstr("ZX81")));
}

TEST(RedactionTest, DescriptionsMayHaveAnotherForm) {
  TJson document =
      DocumentWith(InstanceOf("X_Thing", {{"OtherIdentifyingInfo", PropertyOf("string[]", TJson::array({"ZX81-77"}))},
                                          {"IdentifyingDescriptions", PropertyOf("string", "Serial")}}));
  EXPECT_THAT(Redacted(document), testing::HasSubstr("ZX81-77"));
}

TEST(RedactionTest, TheResultOfSendingIsNotOfTheRedaction) {
  TJson const original = DocumentWith("SerialNumber", "ZX81-77");
  TPseudonyms pseudonyms("1");
  TJson document = original;
  Redact(document, AllKinds(), pseudonyms);
  document["sent"] = {{"url", "ftp://127.0.0.1/serial-77/"}, {"bytes", 5}};
  Unredact(document, pseudonyms);
  EXPECT_EQ(document["sent"]["url"], "ftp://127.0.0.1/serial-77/");
  document.erase("sent");
  EXPECT_EQ(document, original);
}

TEST(RedactionTest, OtherMembersThanThoseOfARedactionAreRefused) {
  TPseudonyms pseudonyms("1");
  for (TJson const& redaction : {TJson(3), TJson({{"map", 3}}), TJson({{"kinds", "x"}, {"map", "1"}})}) {
    TJson document = DocumentWith("SerialNumber", "ZX81-77");
    document["redaction"] = redaction;
    EXPECT_THROW(RedactedWith(document), TRedactionError) << redaction;
    EXPECT_THROW(Unredact(document, pseudonyms), TRedactionError) << redaction;
  }
  TJson document = DocumentWith("SerialNumber", "ZX81-77");
  document["classes"] = {{"a", 1}};
  EXPECT_THROW(Redact(document, AllKinds(), pseudonyms), TRedactionError);
}

}  // namespace
}  // namespace NQRVZEP20
