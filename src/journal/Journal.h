#ifndef QUAVEL_SRC_JOURNAL_JOURNAL_H
#define QUAVEL_SRC_JOURNAL_JOURNAL_H

#include <cstdint>
#include <initializer_list>
#include <string>
#include <vector>

#include "journal/Words.h"
#include "quavel/QVJournal.h"

namespace quavel::detail {

/// Collects the notes of one read; `QVNote` explains their parts. Readers add notes through the
/// functions after this class, which compose no text when the journal is null.
class Journal {
 public:
  explicit Journal(QVJournal::Detail detail) : wantsAll_(detail == QVJournal::Detail::All) {}

  /// Whether all notes are wanted. If not, the `note...` functions below do nothing.
  bool wantsAllNotes() const { return wantsAll_; }

  using Words = std::initializer_list<Word>;

  /// Notes why there is no record. Only the first refusal counts: later ones follow from it.
  void refuse(QVReason reason, std::int64_t position, char const* pattern, Words words);
  /// Refuses because the `count` bytes at `position` are missing; the pattern says what they are.
  void refuseCut(std::int64_t position, std::int64_t count, char const* pattern, Words words);
  /// Notes a part that was read without trouble; after the first few, only counts it.
  void step(std::int64_t position, char const* pattern, Words words);
  /// Notes what else may explain the outcome; after the first few, drops it.
  void hint(QVReason reason, std::int64_t position, char const* pattern, Words words);
  /// Keeps the reason why a field may stay absent; replaces an earlier one for the same field.
  void absent(char const* field, QVReason reason, char const* pattern, Words words);

  /// The reason given so far for a field's absence, or null.
  QVNote* absenceOf(char const* field);

  /// The size of the data in bytes. -1: not known. 0: may be wrong, as for files in /proc.
  std::int64_t dataSize();
  /// Why the bytes asked for last were not all delivered.
  QVReason cutReason() const;
  /// The same in words, for bytes that end at `end`.
  std::string cutText(std::int64_t end);

  std::vector<QVNote> notes;
  std::uint64_t furtherSteps = 0;  ///< Parts that `step` only counted.
  char const* format = "";         ///< See `QVJournal::format`.
  int fd = -1;                     ///< Of the file being read; -1: the data is not a file.
  std::int64_t knownSize = -1;     ///< What `dataSize` gives, once it is known.
  bool hasReadFailed = false;      ///< The last `readBuffer` failed, not only met the data's end.
  int systemError = 0;             ///< The `errno` of that failure, or of opening; 0: not known.

 private:
  void add(QVNoteKind kind, QVReason reason, std::int64_t position, std::string text);

  bool wantsAll_;
  bool isRefused_ = false;
  std::size_t notedSteps_ = 0;
  std::size_t notedHints_ = 0;
  std::vector<QVNote> absences_;  // at most one for each field
};

/// Whether there is a journal that wants all notes.
inline bool wantsAllNotes(Journal const* journal) {
  return journal != nullptr && journal->wantsAllNotes();
}

/// States why the read ends. Always false, so that a step can `return refuse(...)`.
template <class... Values>
[[gnu::cold, gnu::noinline]] bool refuse(Journal* journal, QVReason reason, std::int64_t position,
                                         char const* pattern, Values... words) {
  if (journal != nullptr) {
    journal->refuse(reason, position, pattern, {words...});
  }
  return false;
}

/// Refuses because `count` bytes are missing at `position`; the pattern says what they are.
template <class... Values>
[[gnu::cold, gnu::noinline]] bool refuseCut(Journal* journal, std::int64_t position,
                                            std::int64_t count, char const* pattern,
                                            Values... words) {
  if (journal != nullptr) {
    journal->refuseCut(position, count, pattern, {words...});
  }
  return false;
}

template <class... Values>
void noteStep(Journal* journal, std::int64_t position, char const* pattern, Values... words) {
  if (wantsAllNotes(journal)) {
    journal->step(position, pattern, {words...});
  }
}

template <class... Values>
void noteHint(Journal* journal, QVReason reason, std::int64_t position, char const* pattern,
              Values... words) {
  if (wantsAllNotes(journal)) {
    journal->hint(reason, position, pattern, {words...});
  }
}

template <class... Values>
void noteAbsent(Journal* journal, std::initializer_list<char const*> fields, QVReason reason,
                char const* pattern, Values... words) {
  if (wantsAllNotes(journal)) {
    for (char const* const field : fields) {
      journal->absent(field, reason, pattern, {words...});
    }
  }
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_JOURNAL_JOURNAL_H
