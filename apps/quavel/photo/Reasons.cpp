#include "photo/Reasons.h"

#include <cerrno>
#include <new>
#include <system_error>

namespace app::reason {

namespace {

using quavel::QVJournal;
using quavel::QVReason;

char const* advice(int error) {
  switch (error) {
    case ENOENT:
    case ENOTDIR:
      return "; check the name";
    case EACCES:
    case EPERM:
      return "; check its permissions and those of its folders";
    case EMFILE:
    case ENFILE:
      return "; try fewer --jobs";
    case EIO:
      return "; check the disk";
    default:
      return "";
  }
}

/// What to put before the text of a refusal; empty when the text is clear by itself.
char const* leadOf(QVReason reason) {
  switch (reason) {
    case QVReason::ReadError:
      return "cannot be read: ";
    case QVReason::CutShort:
      return "cut short: ";
    case QVReason::OtherKind:
      return "another kind of file, or damaged: ";
    case QVReason::MalformedEntry:
    case QVReason::MalformedBox:
      return "damaged or badly written: ";
    case QVReason::MissingPart:
      return "a part is missing: ";
    case QVReason::WrongImage:
      return "of a layout that is not read: ";
    case QVReason::TooManyValues:
    case QVReason::TooMuchWork:
      return "beyond what is read of one file: ";
    default:
      return "";
  }
}

}  // namespace

std::string systemText(int error) { return std::generic_category().message(error); }

Problem cannotOpen(int error) {
  std::string const text = "the file cannot be opened: " + systemText(error) + advice(error);
  return {QVJournal::reasonName(QVReason::CannotOpen), text, /*position=*/-1, error};
}

Problem cannotRead(int error) {
  std::string const text = "cannot be read: " + systemText(error) + advice(error);
  return {QVJournal::reasonName(QVReason::ReadError), text, /*position=*/-1, error};
}

Problem failure(std::exception const& error) {
  if (dynamic_cast<std::bad_alloc const*>(&error) != nullptr) {
    return {kOutOfMemory, "not enough memory for it"};
  }
  return {kUnexpected, std::string("unexpected: ") + error.what()};
}

Problem refusal(QVJournal const& journal) {
  quavel::QVNote const& note = *journal.refusal();
  std::string lead = leadOf(note.reason);
  // The hint that the file looks like another format is among the notes with any `Detail`.
  for (auto const& other : journal.notes()) {
    if (other.reason == QVReason::OtherContent) {
      lead = other.text + ": ";
    }
  }
  char const* const tip =
      note.reason == QVReason::Empty ? "; copy it again from its source" : advice(note.systemError);
  return {QVJournal::reasonName(note.reason), lead + note.text + tip, note.position,
          note.systemError};
}

}  // namespace app::reason
