// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/Redaction.h"

#include "tests/collect/redaction/ReportDocument.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(RedactionTest, ThePropertyDecidesAndItsValueIsReplacedEverywhere) {
  TJson document = DocumentWith("SerialNumber", "ZX81-77");
  document["head"][0] = "the machine with the number zx81-77, also /dev/disk/by-id/x_ZX81-77-part1";
  std::string const text = Redacted(document);
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("ZX81")));
  EXPECT_THAT(text, testing::HasSubstr("the machine with the number serial-"));
  EXPECT_THAT(text, testing::ContainsRegex("by-id/x_serial-[0-9]+-part1"));
}

TEST(RedactionTest, OnlyTheKindsThatAreWantedAreReplaced) {
  TJson const document = DocumentWith(
      InstanceOf("X_Thing", {{"SerialNumber", PropertyOf("string", "ZX81-77")}, {"UserID", PropertyOf("string", "mallory")}}));
  std::string const text = Redacted(document, {ESecretKind::kUsers});
  EXPECT_THAT(text, testing::HasSubstr("ZX81-77"));
  EXPECT_THAT(text, testing::Not(testing::HasSubstr("mallory")));
  EXPECT_THAT(text, testing::HasSubstr(R"("redaction":{"kinds":["users"],"map":"1"})"));
}

// Of a MAC address or a GUID, for example.
TEST(RedactionTest, BytesAreFoundAsHexadecimalDigits) {
  TJson document = DocumentWith(InstanceOf("X_Port", {{"MACAddress", PropertyOf("uint8[]", {82, 84, 0, 171, 205, 239})}}));
  document["head"] = {"525400abcdef and enx525400abcdef"};
  TJson redacted = document;
  TPseudonyms pseudonyms("1");
  Redact(redacted, AllKinds(), pseudonyms);
  EXPECT_THAT(redacted.dump(), testing::Not(testing::HasSubstr("525400abcdef")));
  Unredact(redacted, pseudonyms);
  EXPECT_EQ(redacted, document);
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

TEST(RedactionTest, ACodeAndAUnitOfAPlugInAreTexts) {
  TJson document = DocumentWith("SerialNumber", "ZX81-77");
  TJson property = PropertyOf("uint32", nullptr);
  property["code"] = "no-ZX81-77";
  property["unit"] = "per ZX81-77";
  document["instances"].push_back(InstanceOf("X_Other", {{"Size", property}}));
  TJson redacted = document;
  TPseudonyms pseudonyms("1");
  Redact(redacted, AllKinds(), pseudonyms);
  EXPECT_THAT(redacted.dump(), testing::Not(testing::HasSubstr("ZX81")));
  Unredact(redacted, pseudonyms);
  EXPECT_EQ(redacted, document);
  EXPECT_THAT(Redacted(DocumentWith("SystemName", "needs-root")), testing::HasSubstr("\"code\":\"needs-root\""));
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

TEST(RedactionTest, SpellingsOfTheSameValueHaveTheSamePseudonym) {
  TJson document = DocumentWith(InstanceOf(
      "X_Port",
      {{"MACAddress", PropertyOf("string", "525400ABCDEF")},
       {"PermanentAddress", PropertyOf("uint8[]", {82, 84, 0, 171, 205, 239})},
       {"IPv6Address", PropertyOf("string[]", {"2001:db8::7", "2001:DB8:0:0::7"})},
       {"UUID", PropertyOf("string[]", {"3F2A9C54-11D0-4B8E-9A7E-52540011AA01", "3f2a9c5411d04b8e9a7e52540011aa01"})},
       {"a/b~c", PropertyOf("string", "52:54:00:ab:cd:ef, 52-54-00-AB-CD-EF and enx525400abcdef, then 525400ABCDEF")}}));
  TJson redacted = document;
  TPseudonyms pseudonyms("1");
  Redact(redacted, AllKinds(), pseudonyms);
  TJson const& properties = redacted["instances"].back()["properties"];
  std::string const mac = properties["MACAddress"]["value"];
  EXPECT_EQ(properties["PermanentAddress"]["reason"], mac);
  EXPECT_EQ(properties["IPv6Address"]["value"][0], properties["IPv6Address"]["value"][1]);
  EXPECT_EQ(properties["UUID"]["value"][0], properties["UUID"]["value"][1]);
  std::string const text = properties["a/b~c"]["value"];
  EXPECT_THAT(text, testing::MatchesRegex(mac + ", " + mac + " and " + mac + "[a-z], then " + mac)) << "enx... is another value";
  Unredact(redacted, TPseudonyms::From(pseudonyms.AsJson()));
  EXPECT_EQ(redacted.dump(), document.dump());
}

TEST(RedactionTest, APlugInMayUseTheCodeOfARedactedNumber) {
  TJson const number = PropertyOf("uint32", nullptr);
  for (TJson const& reason : {TJson(), TJson("secret"), TJson(3), TJson("text-7")}) {
    TJson document = DocumentWith("SerialNumber", "ZX81-77");
    TJson property = number;
    property["code"] = "redacted";
    if (!reason.is_null()) property["reason"] = reason;
    document["instances"].push_back(InstanceOf("X_Other", {{"Size", property}}));
    TJson redacted = document;
    TPseudonyms pseudonyms("1");
    Redact(redacted, AllKinds(), pseudonyms);
    Unredact(redacted, pseudonyms);
    EXPECT_EQ(redacted, document) << reason;
  }
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
  std::vector<TJson> wrong = {TJson(3), TJson({{"map", 3}}), TJson({{"kinds", "x"}, {"map", "1"}})};
  for (char const* spellings : {"3", "[3]", R"([{"place": "/head/0"}])", R"([{"place": "/head/0", "letters": "b"}])"})
    wrong.push_back({{"kinds", {"users"}}, {"map", "1"}, {"spellings", TJson::parse(spellings)}});
  for (TJson const& redaction : wrong) {
    TJson document = DocumentWith("SerialNumber", "ZX81-77");
    document["redaction"] = redaction;
    EXPECT_THROW(Unredact(document, pseudonyms), TRedactionError) << redaction;
  }
  TJson document = DocumentWith("SerialNumber", "ZX81-77");
  document["classes"] = {{"a", 1}};
  EXPECT_THROW(Redact(document, AllKinds(), pseudonyms), TRedactionError);
}

}  // namespace
}  // namespace NQRVZEP20
