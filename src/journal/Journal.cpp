#include "journal/Journal.h"

#include <algorithm>
#include <system_error>
#include <utility>

#include "journal/Reading.h"
#include "stream/Bytes.h"
#include "system/File.h"

namespace quavel::detail {

namespace {

// So few that the notes of any file fit on a screen.
constexpr std::size_t kMaxNotedSteps = 8;
constexpr std::size_t kMaxNotedHints = 8;

bool isLimit(QVReason reason) {
  return reason == QVReason::TooManyValues || reason == QVReason::TooMuchWork;
}

}  // namespace

void Journal::add(QVNoteKind kind, QVReason reason, std::int64_t position, std::string text) {
  bool const isSystemFailure = reason == QVReason::CannotOpen || reason == QVReason::ReadError;
  notes.push_back(
      {kind, reason, position, /*field=*/"", std::move(text), isSystemFailure ? systemError : 0});
}

void Journal::refuse(QVReason reason, std::int64_t position, char const* pattern, Words words) {
  if (isRefused_) {
    return;
  }
  isRefused_ = true;
  QVNoteKind const kind = isLimit(reason) ? QVNoteKind::Limit : QVNoteKind::Refusal;
  add(kind, reason, position, composed(pattern, words));
}

void Journal::refuseCut(std::int64_t position, std::int64_t count, char const* pattern,
                        Words words) {
  // A size of 0 alone may be wrong. But here, the first bytes could not be read either.
  if (position == 0 && !hasReadFailed && dataSize() == 0) {
    refuse(QVReason::Empty, -1, "the file is empty", {});
    return;
  }
  refuse(cutReason(), position, "{}: {} {} wanted at {}, but {}",
         {composed(pattern, words), count, count == 1 ? "byte" : "bytes", Offset{position},
          cutText(wrappingSum(position, count))});
}

std::int64_t Journal::dataSize() {
  if (knownSize < 0 && fd != -1) {
    knownSize = file::size(fd);
  }
  return knownSize;
}

QVReason Journal::cutReason() const {
  return hasReadFailed ? QVReason::ReadError : QVReason::CutShort;
}

std::string Journal::cutText(std::int64_t end) {
  if (hasReadFailed) {
    return systemError == 0 ? "reading fails"
                            : "reading fails: " + std::generic_category().message(systemError);
  }
  if (dataSize() <= 0) {  // not known, or a 0 that may be wrong
    return "the data ends before that";
  }
  // Bytes within the size may be missing too, as when the file has grown since: then its end is not
  // the reason.
  bool const isWithinSize = end <= dataSize();
  return isWithinSize ? "reading there fails"
                      : composed("the file ends at {}", {Offset{dataSize()}});
}

void Journal::step(std::int64_t position, char const* pattern, Words words) {
  if (notedSteps_ == kMaxNotedSteps) {
    ++furtherSteps;
    return;
  }
  ++notedSteps_;
  add(QVNoteKind::Step, QVReason::None, position, composed(pattern, words));
}

void Journal::hint(QVReason reason, std::int64_t position, char const* pattern, Words words) {
  if (notedHints_ < kMaxNotedHints) {
    ++notedHints_;
    add(QVNoteKind::Hint, reason, position, composed(pattern, words));
  }
}

void Journal::absent(char const* field, QVReason reason, char const* pattern, Words words) {
  auto* note = absenceOf(field);
  if (note == nullptr) {
    note = &absences_.emplace_back();
  }
  *note = {QVNoteKind::Absence, reason, -1, field, composed(pattern, words), /*systemError=*/0};
}

QVNote* Journal::absenceOf(char const* field) {
  auto const found = std::find_if(absences_.begin(), absences_.end(),
                                  [field](QVNote const& note) { return note.field == field; });
  return found == absences_.end() ? nullptr : &*found;
}

// The next two functions are declared in Reading.h, where Journal is not complete.

void noteReadResult(QVStream const& stream, std::int64_t delivered, int error) {
  if (Journal* const journal = journalOf(stream)) {
    journal->hasReadFailed = delivered < 0;
    journal->systemError = delivered < 0 ? error : 0;
  }
}

bool Reading::refuseWork(Work work) const {
  // In the order of the enumerators of `Work`.
  static constexpr char const* kPatterns[] = {
      "the file makes the reader open more than {} directories",
      "the file makes the reader walk over more than {} directory entries",
      "the file makes the reader take more than {} values of directory entries",
      "the file makes the reader step over more than {} segments or boxes"};
  auto const index = static_cast<std::size_t>(work);
  return refuse(journal, QVReason::TooMuchWork, -1, kPatterns[index],
                static_cast<std::int64_t>(kMaxWork[index]));
}

}  // namespace quavel::detail
