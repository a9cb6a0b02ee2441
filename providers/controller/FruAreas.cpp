// SPDX-License-Identifier: Apache-2.0
#include "FruAreas.h"

#include "IpmiText.h"
#include "TBytes.h"

#include <algorithm>
#include <numeric>

namespace NQRVZEP20 {

namespace {

using EKind = TFruArea::EKind;
using TText = TFruArea::TText;

constexpr std::size_t kUnit = 8;            // of offsets and lengths, in bytes
constexpr std::uint8_t kNoMore = 0xC1;      // instead of the length of a further field
constexpr std::uint64_t k1996 = 820454400;  // the first minute of board areas, in seconds since 1970

bool SumsToZero(std::string_view bytes) {
  return std::accumulate(bytes.begin(), bytes.end(), 0U,
                         [](unsigned sum, char byte) { return sum + static_cast<std::uint8_t>(byte); }) %
             256 ==
         0;
}

// Fields of English areas are Latin-1; other languages use UTF-16, of which only the ASCII part is decoded here.
bool IsEnglish(std::uint8_t language) { return language == 0 || language == 25; }

std::string WithoutHighBytes(std::string_view bytes) {
  std::string text;
  for (std::size_t i = 0; i + 1 < bytes.size(); i += 2) text += bytes[i + 1] == 0 ? bytes[i] : '?';
  return text;
}

// Reads the fields of an area, one after the other.
class TFields {
public:
  TFields(std::string_view area, std::size_t begin, bool isEnglish) : fArea(area), fAt(begin), fIsEnglish(isEnglish) {}

  bool HasMore() const { return fAt + 1 < fArea.Size() && fArea.At(fAt) != kNoMore; }  // the last byte is the checksum

  TText Next() {
    if (!HasMore()) return TMissing{kMissingNotGiven, "the area ends before this field"};
    std::uint8_t const head = fArea.At(fAt);
    std::string_view const bytes = fArea.Part(fAt + 1, TextLengthOf(head));
    fAt += 1 + TextLengthOf(head);
    bool const isWide = TextFormOf(head) == ETextForm::kEightBit && !fIsEnglish;
    return isWide ? IpmiText(ETextForm::kEightBit, WithoutHighBytes(bytes)) : IpmiText(TextFormOf(head), bytes);
  }

private:
  TBytes fArea;
  std::size_t fAt;
  bool fIsEnglish;
};

void ReadCustom(TFruArea& area, TFields& fields) {
  while (fields.HasMore())
    if (auto const text = fields.Next()) area.fCustom.push_back(*text);
}

TFinding<std::uint64_t> TimeFrom(TBytes const& area) {
  std::uint64_t const minutes = area.Long(3) & 0xFFFFFF;
  if (minutes == 0) return TMissing{kMissingNotGiven, "the board area has no time of manufacture"};
  return k1996 + 60 * minutes;
}

void ReadChassis(TFruArea& area, std::string_view bytes) {
  TFields fields(bytes, 3, true);
  for (TText* field : {&area.fPartNumber, &area.fSerialNumber}) *field = fields.Next();
  ReadCustom(area, fields);
}

void ReadBoard(TFruArea& area, std::string_view bytes) {
  area.fManufactureTime = TimeFrom(TBytes(bytes));
  TFields fields(bytes, 6, IsEnglish(TBytes(bytes).At(2)));
  for (TText* field : {&area.fManufacturer, &area.fName, &area.fSerialNumber, &area.fPartNumber, &area.fFileId})
    *field = fields.Next();
  ReadCustom(area, fields);
}

void ReadProduct(TFruArea& area, std::string_view bytes) {
  TFields fields(bytes, 3, IsEnglish(TBytes(bytes).At(2)));
  for (TText* field :
       {&area.fManufacturer, &area.fName, &area.fPartNumber, &area.fVersion, &area.fSerialNumber, &area.fAssetTag, &area.fFileId})
    *field = fields.Next();
  ReadCustom(area, fields);
}

TFruArea AreaWith(EKind kind, TMissing const& why) {
  TFruArea area;
  area.fKind = kind;
  for (TText* field :
       {&area.fManufacturer, &area.fName, &area.fPartNumber, &area.fVersion, &area.fSerialNumber, &area.fAssetTag, &area.fFileId})
    *field = why;
  area.fManufactureTime = why;
  return area;
}

TFruArea AreaAt(EKind kind, std::string_view content, std::size_t offset) {
  std::size_t const length = TBytes(content).At(offset + 1) * kUnit;
  std::string_view const bytes = TBytes(content).Part(offset, length);
  if (length == 0 || bytes.size() < length) return AreaWith(kind, {kMissingUnexpected, "the FRU area is cut short"});
  if (!SumsToZero(bytes)) return AreaWith(kind, {kMissingUnexpected, "the FRU area has a wrong checksum"});
  TFruArea area = AreaWith(kind, {kMissingNotApplicable, "FRU areas of this kind have no such field"});
  if (kind == EKind::kChassis) ReadChassis(area, bytes);
  if (kind == EKind::kBoard) ReadBoard(area, bytes);
  if (kind == EKind::kProduct) ReadProduct(area, bytes);
  return area;
}

}  // namespace

TFruArea UnreadArea(TMissing const& why) { return AreaWith(EKind::kUnread, why); }

TFinding<std::vector<TFruArea>> FruAreasFrom(std::string_view content) {
  TBytes const bytes(content);
  bool const isHeader = (bytes.At(0) & 0x0F) == 1 && content.size() >= kUnit && SumsToZero(content.substr(0, kUnit));
  if (!isHeader) return TMissing{kMissingUnexpected, "the FRU device does not begin with a valid header"};
  std::vector<TFruArea> areas;
  std::size_t place = 2;  // of the offset in the header
  for (EKind const kind : {EKind::kChassis, EKind::kBoard, EKind::kProduct}) {
    std::size_t const offset = bytes.At(place++) * kUnit;
    if (offset != 0) areas.push_back(AreaAt(kind, content, offset));
  }
  return areas;
}

std::size_t LengthOfAreas(std::string_view beginning) {
  constexpr std::size_t areaHeader = 2;
  TBytes const bytes(beginning);
  std::size_t needed = kUnit;
  for (std::size_t place = 2; place < 5; ++place) {
    std::size_t const offset = bytes.At(place) * kUnit;
    if (offset != 0) needed = std::max(needed, offset + std::max(areaHeader, bytes.At(offset + 1) * kUnit));
  }
  return needed;
}

}  // namespace NQRVZEP20
