#ifndef QUAVEL_SRC_JOURNAL_READING_H
#define QUAVEL_SRC_JOURNAL_READING_H

#include <array>
#include <cstddef>
#include <cstdint>

#include "quavel/QVStream.h"

namespace quavel::detail {

class Journal;

/// Work that a file can make a read do many times over. `kMaxWork` and `refuseWork` have this
/// order.
enum class Work : std::uint8_t { Directories, Entries, Values, SegmentsAndBoxes };

/// The most work of each kind in one read, far above what cameras' files need. The formats
/// themselves set no limit: a file can refer to the same large directory again and again.
inline constexpr std::array<std::uint64_t, 4> kMaxWork = {
    std::uint64_t{1} << 14U,  // directories: each takes up to a dozen reads from the file
    std::uint64_t{1} << 24U,  // entries walked over
    std::uint64_t{1} << 20U,  // values: with all directories, they take less than 32 MB of memory
    std::uint64_t{1} << 24U,  // segments and boxes: in a JPEG, every 2 zeros count as a segment
};

/// One read of a file: the work done so far, and the journal.
class Reading {
 public:
  /// Adds to the work done. False: the total exceeds the limit, and the journal has the refusal.
  bool spend(Work work, std::uint64_t amount) {
    std::uint64_t& done = done_[static_cast<std::size_t>(work)];
    done += amount;
    return done <= kMaxWork[static_cast<std::size_t>(work)] || refuseWork(work);
  }

  Journal* journal = nullptr;  ///< Null: no notes are wanted.

  /// False: the record's class may be derived by a host, and so need directories' public `entries`.
  bool isLibraryRecord = false;

 private:
  bool refuseWork(Work work) const;  // always false

  std::array<std::uint64_t, 4> done_ = {};
};

/// Makes a stream serve a read as long as the scope lives.
class ReadScope {
 public:
  /// For a public operation: begins a read, or joins the one during which it was called.
  static ReadScope beginOrJoin(QVStream& stream) { return ReadScope(stream); }
  /// For `readStream` (Formats.h): always begins a read, as it has a journal of its own. The
  /// record's class is one of the library's.
  static ReadScope begin(QVStream& stream, Journal* journal) { return {stream, journal}; }

  ~ReadScope() { stream_.reading_.current = outer_; }
  ReadScope(ReadScope const&) = delete;
  ReadScope& operator=(ReadScope const&) = delete;

  Reading& reading() const { return *stream_.reading_.current; }
  /// The read that a stream serves, or null. (A stream shows it to this class only.)
  static Reading* current(QVStream const& stream) { return stream.reading_.current; }

 private:
  explicit ReadScope(QVStream& stream) : stream_(stream), outer_(stream.reading_.current) {
    if (outer_ == nullptr) {
      stream_.reading_.current = &begun_;
    }
  }
  ReadScope(QVStream& stream, Journal* journal) : stream_(stream), outer_(stream.reading_.current) {
    begun_.journal = journal;
    begun_.isLibraryRecord = true;
    stream_.reading_.current = &begun_;
  }

  QVStream& stream_;
  Reading* outer_;  // null: none was under way
  Reading begun_;   // not used after joining `outer_`
};

/// The read that the stream serves. Only to be called while a `ReadScope` lives.
inline Reading& readingOf(QVStream const& stream) { return *ReadScope::current(stream); }

/// The journal of the read that the stream serves; null without a read or a journal.
inline Journal* journalOf(QVStream const& stream) {
  Reading const* const reading = ReadScope::current(stream);
  return reading == nullptr ? nullptr : reading->journal;
}

/// Tells the journal how `readBuffer` went. If `delivered` < 0, it failed; `error` is then its
/// `errno`, or 0 if that is not known. Otherwise, an earlier failure no longer counts.
void noteReadResult(QVStream const& stream, std::int64_t delivered, int error);

/// Where the stream stands in the file.
inline std::int64_t positionOf(QVStream& stream) { return stream.baseOffset + stream.getOffset(); }

/// `positionOf` for a note; without a journal 0, as asking the stream may cost a system call.
inline std::int64_t positionForNotes(Journal const* journal, QVStream& stream) {
  return journal == nullptr ? 0 : positionOf(stream);
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_JOURNAL_READING_H
