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

/// What a note tells.
enum class QVNoteKind : std::uint8_t {
  Refusal,  ///< Why there is no record.
  Limit,    ///< The same: the file asks for more work or memory than the library spends.
  Step,     ///< A part of the file that was read without trouble.
  Absence,  ///< Why a field of the record is absent.
  Hint,     ///< Something else that may explain the outcome.
};

/// The reason for a note, for programs to switch on. Later versions may add reasons at the end.
enum class QVReason : std::uint8_t {
  None,              ///< A step needs none.
  UnknownExtension,  ///< The extension names no format.
  CannotOpen,        ///< The system cannot open the file.
  ReadError,         ///< The system or the stream fails to read.
  Empty,             ///< There is not a single byte at the path or in the buffer.
  CutShort,          ///< The data ends before a part that is needed.
  OtherKind,         ///< The data does not begin like a file or structure of this kind.
  MalformedEntry,    ///< A directory entry has a wrong type or a wrong number of values.
  MalformedBox,      ///< A box has an impossible size.
  MissingPart,       ///< An entry, a box or a directory that the format needs is not there.
  WrongImage,        ///< A directory describes an image of another size or purpose than it must.
  TooManyValues,     ///< One entry declares more than 65536 values.
  TooMuchWork,       ///< The whole read exceeds one of the other limits.
  NotInFile,         ///< A field is absent: the file does not give it.
  NotInFormat,       ///< A field is absent: the library never takes it from this format.
  NoValue,           ///< A field is absent: what the file gives is not a value, such as 0/0.
  OtherContent,      ///< The content looks like another format than the extension names.
  NotBaseline,       ///< A JPEG frame that is not baseline, so its size is not read.
  PictureData,       ///< A JPEG was walked through its picture data.
  OtherOpening,      ///< An embedded image does not begin as the format demands.
  PassedOver,        ///< A directory was examined and is not the one looked for.
};

/// One thing that happened while a file was read.
struct QVNote {
  QVNoteKind kind = QVNoteKind::Step;  ///< What the note tells.
  QVReason reason = QVReason::None;    ///< For programs.
  /// In bytes from the start of the file; -1: it concerns no particular place.
  std::int64_t position = -1;
  /// Of an absence: the name of the record's member, such as "fNumber"; else empty.
  std::string field;
  /// What the file holds and where, then the rule, in English: at most 500 bytes, without a full
  /// stop, printable ASCII except for the system's own messages.
  std::string text;
  int systemError = 0;  ///< The `errno` of CannotOpen and ReadError; else 0.
};

/// Reads files like a `QVReader`, giving the same records, and keeps notes of what happened. One
/// read at a time; distinct journals may be used on distinct threads.
class QUAVEL_EXPORT QVJournal {
 public:
  /// How much is noted. `Refusals` takes no time unless there is one; a hint about what else the
  /// file may be comes with it.
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

  /// What the last read left, in the order in which it happened: steps, a refusal or limit, hints,
  /// and, after a success, one absence for each absent field, in the order of the record's members.
  std::vector<QVNote> const& notes() const { return notes_; }
  /// How many steps beyond the first few were counted instead of noted.
  std::uint64_t furtherSteps() const { return furtherSteps_; }
  /// The note that says why there is no record; null after a success and before any read.
  QVNote const* refusal() const;

  /// The format that the last read's extension names: "JPEG"; empty when it names none.
  char const* format() const { return format_; }

  /// A reason's name, in lower case with hyphens ("cut-short"); empty for what is not a reason.
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
