#include "formats/Steps.h"

#include "tiff/Tags.h"

namespace quavel::detail {

namespace {

constexpr unsigned short kTiffMagic = 42;

constexpr std::int32_t kAbsentNumber = -1;  // in the record; a -1 in the file counts as absent too

}  // namespace

bool findNumber(DirectoryPointer const& directory, unsigned short tag, ValuePointer& value) {
  auto const entry = findEntry(directory, tag);
  value = entry.size() == 1 ? entry[0] : nullptr;
  if (!entry) {
    noteNoEntry(directory, tag);
    return true;
  }
  return value != nullptr || refuseContent(directory, tag, "exactly one wanted");
}

bool storeOptionalNumber(DirectoryPointer const& directory, unsigned short tag,
                         std::int32_t& field) {
  ValuePointer value = nullptr;
  if (!findNumber(directory, tag, value)) {
    return false;
  }
  if (value != nullptr) {
    field = static_cast<std::int32_t>(value->longValue());
    if (field == kAbsentNumber) {
      noteNoValue(directory, tag, "{} is -1, which counts as absent");
    }
  }
  return true;
}

bool storeRequiredNumber(DirectoryPointer const& directory, unsigned short tag, char const* rule,
                         std::int32_t& field) {
  if (!findEntry(directory, tag)) {
    return refuse(journalOf(directory), QVReason::MissingPart, positionOf(directory),
                  "no {} in {}; {}", TagName{tag}, placed(directory), rule);
  }
  return storeOptionalNumber(directory, tag, field);
}

bool storeOptionalText(DirectoryPointer const& directory, unsigned short tag, std::string& field) {
  auto const entry = findEntry(directory, tag);
  if (!entry) {
    noteNoEntry(directory, tag);
    return true;
  }
  if (!entry.convertToString(field)) {
    return refuseContent(directory, tag, "ASCII text wanted");
  }
  if (field.empty()) {
    noteNoValue(directory, tag, "{} holds no text ({})");
  }
  return true;
}

DirectoryPointer readDirectoryAt(std::shared_ptr<QVStream>& stream, PartName const& name,
                                 std::uint32_t offset, TagList tags) {
  auto directory = std::make_shared<ReaderDirectory>(name, stream->baseOffset + offset);
  if (!directory->table.readWithNext(*stream, offset, tags, &directory->nextIFDOffset)) {
    return nullptr;
  }
  return directory;
}

DirectoryPointer readFirstDirectory(std::shared_ptr<QVStream>& stream, TagList tags,
                                    char const* structure) {
  QVTiffHeader header;
  if (!readTiffHeader(*stream, kTiffMagic, header, structure)) {
    return nullptr;
  }
  return readDirectoryAt(stream, {"IFD0", structure}, header.firstIFDOffset, tags);
}

bool followPointer(std::shared_ptr<QVStream>& stream, DirectoryPointer const& directory,
                   unsigned short pointer, char const* name, TagList tags,
                   DirectoryPointer& result) {
  ValuePointer offset = nullptr;
  if (!findNumber(directory, pointer, offset)) {
    return false;
  }
  bool const isAbsent = offset == nullptr;
  result = isAbsent ? nullptr : readDirectoryAt(stream, {name}, offset->longValue(), tags);
  return isAbsent || result != nullptr;
}

bool readAndStoreExifIFD(QVMetadata& record, std::shared_ptr<QVStream>& stream,
                         DirectoryPointer const& mainIFD, TagList tags, DirectoryPointer& exifIFD) {
  if (!followPointer(stream, mainIFD, tag::ExifIFDPointer, "the Exif IFD", tags, exifIFD)) {
    return false;
  }
  if (!exifIFD) {
    noteAbsent(journalOf(mainIFD), {"dateTimeOriginal", "dateTimeDigitized"}, QVReason::NotInFile,
               "no {} in {}", TagName{tag::ExifIFDPointer}, placed(mainIFD));
    return true;
  }
  // An override of `storeInfoFromExifIFD` in a host's class needs the directory's public `entries`.
  if (!readingOf(*stream).isLibraryRecord) {
    exifIFD = static_cast<ReaderDirectory&>(*exifIFD).forHost();
  }
  return record.storeInfoFromExifIFD(exifIFD);
}

bool readSubIFD(std::shared_ptr<QVStream>& stream, DirectoryPointer const& mainIFD,
                std::uint32_t index, TagList tags, DirectoryPointer& rawIFD) {
  auto const subIFDs = findEntry(mainIFD, tag::SubIFDs);
  auto const count = static_cast<std::uint32_t>(subIFDs.size());
  if (count <= index) {
    noteAbsent(journalOf(*stream), {"width", "height"}, QVReason::NotInFile,
               "{} names {} {} (0x014a); the raw image is in number {}", placed(mainIFD), count,
               count == 1 ? "SubIFD" : "SubIFDs", index + 1);
    return true;
  }
  rawIFD = readDirectoryAt(stream, subIFDName(index, count), subIFDs[index]->longValue(), tags);
  return rawIFD != nullptr;
}

void noteNoEntry(DirectoryPointer const& directory, unsigned short tag) {
  Journal* const journal = journalOf(directory);
  if (wantsAllNotes(journal) && fieldOf(tag) != nullptr) {
    noteAbsent(journal, {fieldOf(tag)}, QVReason::NotInFile, "no {} in {}", TagName{tag},
               placed(directory));
  }
}

// In the next two functions, `row` is null only for a host's directory, of which notes say nothing.

void noteNoValue(DirectoryPointer const& directory, unsigned short tag, char const* pattern) {
  auto const* const ours = ReaderDirectory::of(*directory);
  auto const* const row = ours == nullptr ? nullptr : ours->table.find(tag);
  if (row != nullptr && fieldOf(tag) != nullptr) {
    noteAbsent(ours->table.journal(), {fieldOf(tag)}, QVReason::NoValue, pattern,
               PlacedEntry{ours->table, tag, row->position}, TypedCount{row->count, row->typeCode});
  }
}

bool refuseContent(DirectoryPointer const& directory, unsigned short tag, char const* wanted) {
  auto const* const ours = ReaderDirectory::of(*directory);
  auto const* const row = ours == nullptr ? nullptr : ours->table.find(tag);
  if (row == nullptr) {
    return false;
  }
  // An UNDEFINED entry has no values, so `storeOptionalText` accepts it as an empty text: if one is
  // refused, a number was wanted.
  bool const isUndefined = row->typeCode == kUndefinedCode;
  return refuse(ours->table.journal(), QVReason::MalformedEntry, row->position,
                isUndefined ? "{} is of type UNDEFINED; one number wanted" : "{} holds {}; {}",
                PlacedEntry{ours->table, tag, row->position}, TypedCount{row->count, row->typeCode},
                wanted);
}

bool storeFullImageSize(DirectoryPointer const& directory, std::int32_t& width,
                        std::int32_t& height) {
  std::int32_t newSubfileType = 0;
  if (!storeRequiredNumber(directory, tag::NewSubfileType,
                           "the raw image must say that it is of full size", newSubfileType)) {
    return false;
  }
  auto const bits = static_cast<std::uint32_t>(newSubfileType);
  if (isReducedImage(bits)) {
    return refuse(journalOf(directory), QVReason::WrongImage, positionOf(directory),
                  "{} declares a reduced image (NewSubfileType {}); the raw image of full size is "
                  "wanted there",
                  placed(directory), bits);
  }
  char const* const rule = "the raw image's size is wanted there";
  return storeRequiredNumber(directory, tag::ImageWidth, rule, width) &&
         storeRequiredNumber(directory, tag::ImageLength, rule, height);
}

}  // namespace quavel::detail
