#include <array>
#include <cmath>
#include <variant>

#include "front/Formats.h"
#include "journal/Journal.h"
#include "quavel/QVMetadata.h"
#include "stream/Bytes.h"

namespace quavel::detail {

namespace {

constexpr unsigned kAllFamilies = kTiff | kNef | kArw | kJpeg | kRaf | kCr3;

/// A field of the record that can be absent.
struct FieldRow {
  char name[22];              ///< An array: pointers would be relocated at each loading.
  std::uint8_t rowsToOrigin;  ///< Rows down to the field that it is computed from; 0: not computed.
  std::uint8_t families;      ///< Whose readers fill it.
  std::variant<std::int32_t QVMetadata::*, float QVMetadata::*, std::string QVMetadata::*> member;
};

using M = QVMetadata;
constexpr FieldRow kFields[] = {
    {"width", 0, kAllFamilies, &M::width},
    {"height", 0, kAllFamilies, &M::height},
    {"orientation", 0, kAllFamilies, &M::orientation},
    {"dateTimeOriginal", 0, kAllFamilies & ~kCr3, &M::dateTimeOriginal},
    {"dateTimeDigitized", 0, kTiff, &M::dateTimeDigitized},
    {"dateTime", 0, kTiff | kCr3, &M::dateTime},
    {"model", 0, kCr3, &M::model},
    {"lensModel", 0, kCr3, &M::lensModel},
    {"iso", 0, kCr3, &M::iso},
    {"apexFNumber", 2, kCr3, &M::apexFNumber},
    {"apexExposureTime", 2, kCr3, &M::apexExposureTime},
    {"apertureValue", 0, kCr3, &M::apertureValue},
    {"shutterSpeedValue", 0, kCr3, &M::shutterSpeedValue},
    {"focalLength", 0, kCr3, &M::focalLength},
    {"whiteBalance", 0, kCr3, &M::whiteBalance},
    {"meteringMode", 0, kCr3, &M::meteringMode},
    {"exposureBiasValue", 0, kCr3, &M::exposureBiasValue},
    {"focalLengthIn35mmFilm", 0, kCr3, &M::focalLengthIn35mmFilm},
    {"exposureTime", 0, kCr3, &M::exposureTime},
    {"fNumber", 0, kCr3, &M::fNumber},
};

bool isAbsent(FieldRow const& row, QVMetadata const& record) {
  if (auto const* const number = std::get_if<std::int32_t QVMetadata::*>(&row.member)) {
    return record.*(*number) == -1;
  }
  if (auto const* const number = std::get_if<float QVMetadata::*>(&row.member)) {
    return std::isnan(record.*(*number));
  }
  return (record.*std::get<std::string QVMetadata::*>(row.member)).empty();
}

QVNote absence(FieldRow const& row, Format const& format, Journal& journal) {
  if ((row.families & format.family) == 0) {
    bool const isCr3Only = row.families == kCr3;
    std::string const text = isCr3Only ? "given by CR3 files only"
                                       : composed("never taken from {} files", {format.name});
    return {QVNoteKind::Absence, QVReason::NotInFormat, -1, row.name, text, /*systemError=*/0};
  }
  FieldRow const& origin = *(&row + row.rowsToOrigin);  // the row itself, unless it is computed
  // Null would be a fault of ours: each reader says why. The note then only names the field.
  auto const* const noted = journal.absenceOf(origin.name);
  QVNote note = {QVNoteKind::Absence, QVReason::None, -1, "", "", /*systemError=*/0};
  if (noted != nullptr) {
    note = *noted;
  }
  note.field = row.name;
  return note;
}

// Enough bytes for any of the signatures below, and for the brand of an ISO base media file.
constexpr std::size_t kOpeningSize = 16;
constexpr std::size_t kBrandPosition = 8;
constexpr std::size_t kBrandSize = 4;

struct Signature {
  std::uint8_t position;
  std::uint8_t size;
  char bytes[9];
  char kind[36];          ///< As it stands after "looks like".
  std::uint8_t families;  ///< Whose files may begin so; the others get a hint.
};

// No hint is needed at a BigTIFF structure in these: the TIFF header's own refusal names it.
constexpr std::uint8_t kTiffFamilies = kTiff | kNef | kArw;

constexpr Signature kSignatures[] = {
    {0, 4, "II*\0", "a TIFF structure", kTiffFamilies},
    {0, 4, "MM\0*", "a TIFF structure", kTiffFamilies},
    {0, 4, "II+\0", "a BigTIFF structure", kTiffFamilies},
    {0, 4, "MM\0+", "a BigTIFF structure", kTiffFamilies},
    {0, 3, "\xff\xd8\xff", "a JPEG file", kJpeg},
    {0, 8, "FUJIFILM", "a RAF file", kRaf},
    {4, 8, "ftypcrx ", "an ISO base media file", kCr3},
    {4, 4, "ftyp", "an ISO base media file", 0},
    {0, 4, "\x89PNG", "a PNG file", 0},
    {0, 4, "GIF8", "a GIF file", 0},
    {0, 4, "RIFF", "a RIFF file (WebP, for example)", 0},
    {0, 2, "BM", "a BMP file", 0},
    {0, 4, "%PDF", "a PDF file", 0},
    {0, 4, "8BPS", "a PSD file", 0},
    {0, 4, "PK\3\4", "a ZIP archive", 0},
    {0, 1, "<", "markup text (HTML or XML)", 0},
    {0, 8, "\0\0\0\0\0\0\0\0", "a file that was emptied with zeros", 0},
};

}  // namespace

void noteOtherContent(Format const& format, QVStream& stream, std::int64_t start,
                      Journal& journal) {
  if (!seek(stream, start - stream.baseOffset)) {  // offsets count from `baseOffset`
    return;
  }
  std::array<std::uint8_t, kOpeningSize> opening;
  std::size_t const received = readUpTo(stream, opening.data(), opening.size());
  for (auto const& row : kSignatures) {
    if (received < std::size_t{row.position} + row.size ||
        std::memcmp(opening.data() + row.position, row.bytes, row.size) != 0) {
      continue;
    }
    if ((row.families & format.family) == 0) {
      bool const isIsoMedia = row.position != 0;  // all other signatures are at 0
      bool const hasBrand = isIsoMedia && received >= kBrandPosition + kBrandSize;
      QuotedBytes const brand = {opening.data() + kBrandPosition, kBrandSize};
      char const* const kind = row.kind;
      std::string const text = hasBrand ? composed("{} of brand \"{}\"", {kind, brand}) : kind;
      // The wrong kind of file explains a refusal, unless reading failed. A refusal for a limit has
      // a kind of its own and keeps its reason too.
      for (QVNote& note : journal.notes) {
        if (note.kind == QVNoteKind::Refusal && note.reason != QVReason::ReadError) {
          note.reason = QVReason::OtherKind;
        }
      }
      journal.hint(QVReason::OtherContent, start,
                   "The file looks like {}, but its extension says {}", {text, format.name});
    }
    return;  // the first signature that is there decides
  }
}

void noteAbsences(Format const& format, QVMetadata const& record, Journal& journal) {
  if (!journal.wantsAllNotes()) {
    return;
  }
  // The reasons that readers gave are kept apart from `notes`. Those of the fields that stayed
  // absent are put there now, in the record's order.
  for (auto const& row : kFields) {
    if (isAbsent(row, record)) {
      journal.notes.push_back(absence(row, format, journal));
    }
  }
}

}  // namespace quavel::detail
