#ifndef QUAVEL_SRC_JOURNAL_READING_H
#define QUAVEL_SRC_JOURNAL_READING_H

#include <array>
#include <cstddef>
#include <cstdint>

#include "quavel/QVStream.h"

namespace quavel::detail {

class Journal;

/// Work that a file can make a read do many times over.
enum class Work : std::uint8_t { Directories, Entries, Values, Steps };

/// The limits of each kind of work in one read. The formats do not limit how many directories,
/// segments or boxes come before the wanted one, and a file can refer to the same large directory
/// again and again. The bounds lie far above what cameras write.
inline constexpr std::array<std::uint64_t, 4> kMaxWork = {
    std::uint64_t{1} << 14U,  // directories: each takes up to a dozen separate reads of the file
    std::uint64_t{1} << 24U,  // entries walked over
    std::uint64_t{1} << 20U,  // values: less than 32 MB of memory, with their directories
    std::uint64_t{1} << 24U,  // segments or boxes: enough for 32 MB of zeros in a JPEG
};

/// One read of a file: the work done so far, and the journal.
class Reading {
 public:
  /// Counts work done. False: it exceeds the limit, and the journal has the refusal.
  bool spend(Work work, std::uint64_t amount) {
    std::uint64_t& done = done_[static_cast<std::size_t>(work)];
    done += amount;
    return done <= kMaxWork[static_cast<std::size_t>(work)] || refuseWork(work);
  }

  Journal* journal = nullptr;  ///< Null: no notes are wanted.

  /// The library made the record, so no override in a host's class sees the directories.
  bool isOwnRecord = false;

 private:
  bool refuseWork(Work work) const;

  std::array<std::uint64_t, 4> done_ = {};
};

/// Makes a stream serve a read as long as the scope lives. Public operations that readers or a
/// host's own code call meanwhile join that read instead of beginning another.
class ReadScope {
 public:
  explicit ReadScope(QVStream& stream) : stream_(stream), outer_(stream.reading_.current) {
    if (outer_ == nullptr) {
      stream_.reading_.current = &own_;
    }
  }
  /// For a record that the library made: begins a read of its own, even within another.
  ReadScope(QVStream& stream, Journal* journal) : stream_(stream), outer_(stream.reading_.current) {
    own_.journal = journal;
    own_.isOwnRecord = true;
    stream_.reading_.current = &own_;
  }
  ~ReadScope() { stream_.reading_.current = outer_; }
  ReadScope(ReadScope const&) = delete;
  ReadScope& operator=(ReadScope const&) = delete;

  Reading& reading() const { return *stream_.reading_.current; }
  static Reading* current(QVStream const& stream) { return stream.reading_.current; }

 private:
  QVStream& stream_;
  Reading* outer_;
  Reading own_;
};

/// The read that the stream serves. There must be one: public operations open a scope.
inline Reading& readingOf(QVStream const& stream) { return *ReadScope::current(stream); }

/// The journal of the read that the stream serves, or null.
inline Journal* journalOf(QVStream const& stream) {
  Reading const* const reading = ReadScope::current(stream);
  return reading == nullptr ? nullptr : reading->journal;
}

/// Tells the journal whether the last `readBuffer` failed, which a negative `delivered` means, and
/// the system's error, or 0 if that is not known. A refusal that follows states both.
void noteReadResult(QVStream const& stream, std::int64_t delivered, int error);

/// Where the stream stands in the file.
inline std::int64_t positionOf(QVStream& stream) { return stream.baseOffset + stream.getOffset(); }

/// The same if there is a journal to note it; else 0, without asking the stream.
inline std::int64_t notedPosition(Journal const* journal, QVStream& stream) {
  return journal == nullptr ? 0 : positionOf(stream);
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_JOURNAL_READING_H
