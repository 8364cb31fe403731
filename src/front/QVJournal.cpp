#include "quavel/QVJournal.h"

#include <algorithm>
#include <iterator>
#include <utility>

#include "front/Formats.h"
#include "journal/Journal.h"
#include "quavel/QVMStream.h"

namespace quavel {

namespace {

// In the order of the enumerators; the longest has 17 letters.
constexpr char kReasonNames[][18] = {
    "none",        "unknown-extension", "cannot-open",     "read-error",    "empty",
    "cut-short",   "other-kind",        "malformed-entry", "malformed-box", "missing-part",
    "wrong-image", "too-many-values",   "too-much-work",   "not-in-file",   "not-in-format",
    "no-value",    "other-content",     "not-baseline",    "picture-data",  "other-opening",
    "passed-over"};

}  // namespace

char const* QVJournal::reasonName(QVReason reason) {
  auto const index = static_cast<std::size_t>(reason);
  return index < std::size(kReasonNames) ? kReasonNames[index] : "";
}

QVJournal::QVJournal(Detail detail) : detail_(detail) {}

std::shared_ptr<QVMetadata> QVJournal::read(std::string const& path) {
  detail::Journal journal = begin();
  return keep(journal, detail::readPath(path, &journal));
}

std::shared_ptr<QVMetadata> QVJournal::read(unsigned char* buffer, std::size_t length,
                                            std::string const& extension) {
  detail::Journal journal = begin();
  journal.knownSize = static_cast<std::int64_t>(length);  // for notes; a path's file tells its own
  auto memory = std::make_shared<QVMStream>(buffer, static_cast<unsigned long>(length));
  memory->length = length;  // the constructor takes an `unsigned long`: 32 bits on Windows
  return keep(journal, detail::readStream(std::move(memory), extension, &journal));
}

std::shared_ptr<QVMetadata> QVJournal::read(std::shared_ptr<QVStream> stream,
                                            std::string const& extension) {
  detail::Journal journal = begin();
  return keep(journal, detail::readStream(std::move(stream), extension, &journal));
}

QVNote const* QVJournal::refusal() const {
  auto const found = std::find_if(notes_.begin(), notes_.end(), [](QVNote const& note) {
    return note.kind == QVNoteKind::Refusal || note.kind == QVNoteKind::Limit;
  });
  return found == notes_.end() ? nullptr : &*found;
}

detail::Journal QVJournal::begin() {
  notes_.clear();  // not left to `keep`, which is not reached if a host's stream throws
  furtherSteps_ = 0;
  format_ = "";
  return detail::Journal(detail_);
}

std::shared_ptr<QVMetadata> QVJournal::keep(detail::Journal& journal,
                                            std::shared_ptr<QVMetadata> record) {
  notes_ = std::move(journal.notes);
  furtherSteps_ = journal.furtherSteps;
  format_ = journal.format;
  return record;
}

}  // namespace quavel
