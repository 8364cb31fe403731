#ifndef QUAVEL_QVJOURNAL_H
#define QUAVEL_QVJOURNAL_H

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "quavel/QVMetadata.h"
#include "quavel/QVStream.h"
#include "quavel/export.h"

namespace quavel {

namespace detail {
class Journal;
}  // namespace detail

/// What a note is about.
enum class QVNoteKind : std::uint8_t {
  Refusal,  ///< Why there is no record.
  Limit,    ///< Why there is no record: reading the file would exceed a limit of the library.
  Step,     ///< A part of the file that was read without trouble.
  Absence,  ///< Why a field of the record is absent.
  Hint,     ///< Something else that may explain the outcome.
};

/// The reason for a note. Later versions may add reasons at the end.
enum class QVReason : std::uint8_t {
  None,              ///< Of a step, which needs no reason.
  UnknownExtension,  ///< The extension names no format.
  CannotOpen,        ///< The system cannot open the file.
  ReadError,         ///< The system or the stream fails to read.
  Empty,             ///< The file or the buffer has no bytes.
  CutShort,          ///< The data ends before a part that is needed.
  OtherKind,         ///< The data does not begin as a file or structure of the expected kind does.
  MalformedEntry,    ///< A directory entry has a wrong type or a wrong number of values.
  MalformedBox,      ///< A box has an impossible size.
  MissingPart,       ///< An entry, a box or a directory that the format needs is not there.
  WrongImage,        ///< A directory describes an image of the wrong size or purpose.
  TooManyValues,     ///< One entry declares more than 65536 values.
  TooMuchWork,       ///< The whole read exceeds one of the other limits.
  NotInFile,         ///< A field is absent: the file does not give it.
  NotInFormat,       ///< A field is absent: the library never takes it from this format.
  NoValue,           ///< A field is absent: what the file gives is not a value, such as 0/0.
  OtherContent,      ///< The content looks like a format other than the extension's.
  NotBaseline,       ///< The size in a JPEG frame header is not read: the frame is not baseline.
  PictureData,       ///< The search for a JPEG's segments went on through its picture data.
  OtherOpening,      ///< An embedded image does not begin as the format requires.
  PassedOver,        ///< A directory was examined and is not the one looked for.
};

/// One thing that happened while a file was read.
struct QVNote {
  QVNoteKind kind = QVNoteKind::Step;  ///< What the note is about.
  QVReason reason = QVReason::None;    ///< Why, for programs to switch on.
  /// In bytes from the start of the file; -1: the note concerns no particular place.
  std::int64_t position = -1;
  /// Of an absence: the name of the record's member, such as "fNumber"; else empty.
  std::string field;
  /// In English: what the file holds and where, then the rule it breaks. At most 500 bytes, without
  /// a full stop at the end, of printable ASCII except for the system's own messages.
  std::string text;
  int systemError = 0;  ///< The `errno` of CannotOpen and ReadError; else 0.
};

/// Reads files like a `QVReader`, giving the same records, and keeps notes of what happened. Only
/// one thread at a time may use a journal; each thread may use its own.
class QUAVEL_EXPORT QVJournal {
 public:
  /// How much is noted. `Refusals`: only why there is no record, with a hint when the file looks
  /// like another format; costs nothing while files can be read. `All`: every kind of note.
  enum class Detail : std::uint8_t { Refusals, All };

  explicit QVJournal(Detail detail = Detail::All);  ///< Holds no notes yet.

  /// Reads the file at a path as `QVReader` does, replacing all notes. Null: there is no record,
  /// and the notes hold one refusal or limit.
  std::shared_ptr<QVMetadata> read(std::string const& path);
  /// The same from memory, for an extension in lower case and without a ".".
  std::shared_ptr<QVMetadata> read(unsigned char* buffer, std::size_t length,
                                   std::string const& extension);
  /// The same from a stream, not null, which must stand at the file's first byte.
  std::shared_ptr<QVMetadata> read(std::shared_ptr<QVStream> stream, std::string const& extension);

  /// The notes of the last read, in the order of what happened: steps, a refusal or limit, hints,
  /// and, after a success, one absence for each absent field, in the order of the record's members.
  std::vector<QVNote> const& notes() const { return notes_; }
  /// How many further steps there were: only the first few have notes.
  std::uint64_t furtherSteps() const { return furtherSteps_; }
  /// The note that says why there is no record; null after a success and before any read.
  QVNote const* refusal() const;

  /// The format that the last read's extension names, such as "JPEG"; empty when it names none.
  char const* format() const { return format_; }

  /// A reason's name, in lower case with hyphens ("cut-short"); empty for an unknown value.
  static char const* reasonName(QVReason reason);

 private:
  QUAVEL_NO_EXPORT detail::Journal begin();
  QUAVEL_NO_EXPORT std::shared_ptr<QVMetadata> keep(detail::Journal& journal,
                                                    std::shared_ptr<QVMetadata> record);

  Detail detail_;
  std::vector<QVNote> notes_;
  std::uint64_t furtherSteps_ = 0;
  char const* format_ = "";
};

}  // namespace quavel

#endif  // QUAVEL_QVJOURNAL_H
