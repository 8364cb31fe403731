// Any bytes as a file of any format: what a record may hold, and that reading leaves no trace.

#include "Fuzzing.h"
#include "support/Fields.h"

namespace quavel::fuzz {
namespace {

void checkTexts(QVMetadata const& record, std::size_t fileSize) {
  for (auto const* text : {&record.dateTimeOriginal, &record.dateTimeDigitized, &record.dateTime,
                           &record.model, &record.lensModel}) {
    require(text->size() <= fileSize, "a text is no longer than the file");
    require(text->find('\0') == std::string::npos, "a text ends at its first NUL");
  }
  std::string const date = record.captureDate();
  require(date == record.dateTimeOriginal || date == record.dateTimeDigitized ||
              date == record.dateTime,
          "the capture date is one of the three dates");
}

/// A format fills its own fields alone.
void checkFields(Input const& input, QVMetadata const& record) {
  bool const isCr3 = input.extension == "cr3";
  bool const isRendered = input.isOneOf({"tiff", "tif", "jpeg", "jpg"});
  bool const isPlainTiff = input.isOneOf({"tiff", "tif", "dng", "cr2", "nrw", "3fr"});
  require(record.isRaw == !isRendered, "raw formats alone are raw");
  require(isPlainTiff || record.dateTimeDigitized.empty(), "the digitized date is TIFF's");
  require(isPlainTiff || isCr3 || record.dateTime.empty(), "the file's date is TIFF's or CR3's");
  require(!isCr3 || record.dateTimeOriginal.empty(), "CR3 gives no original date");

  QVMetadata const& absent = QVTiffImage();
  require(isCr3 || record.model.empty(), "the model is CR3's");
  require(record.hasShootingInfo || (record.lensModel.empty() && record.iso == absent.iso &&
                                     record.fNumber != record.fNumber),
          "exposure needs a shooting record");
  require(isCr3 || !record.hasShootingInfo, "the shooting record is CR3's");
}

}  // namespace
}  // namespace quavel::fuzz

int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  using namespace quavel;
  fuzz::Input input(data, size);
  auto const before = input.bytes;

  auto const length = static_cast<unsigned long>(input.bytes.size());
  QVReader const reader(input.bytes.data(), length, input.extension);
  fuzz::require(input.bytes == before, "the file is only read");
  if (reader.metadata) {
    fuzz::checkTexts(*reader.metadata, input.bytes.size());
    fuzz::checkFields(input, *reader.metadata);
  }

  QVJournal journal;
  auto record = journal.read(input.bytes.data(), input.bytes.size(), input.extension);
  fuzz::require(fuzz::isSame(record, reader.metadata), "a journal changes no record");
  fuzz::require(test::brokenInvariant(journal, record.get()).empty(),
                "the journal's invariants hold");

  record = reader.createMetadata(input.extension);
  fuzz::require((record == nullptr) == (input.extension == "txt"),
                "every extension but txt names a format");
  if (!record) {
    fuzz::require(!reader.metadata, "an unknown extension gives no record");
    return 0;
  }
  auto const memory = std::make_shared<QVMStream>(input.bytes.data(), input.bytes.size());
  std::shared_ptr<QVStream> stream = memory;
  if (!record->read(stream)) {
    record = nullptr;
  }
  fuzz::require(fuzz::isSame(record, reader.metadata), "the same bytes give the same record");
  fuzz::require(memory->offset <= memory->length, "a memory stream stays inside its bytes");
  return 0;
}
