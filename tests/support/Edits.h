#ifndef QUAVEL_TESTS_EDITS_H
#define QUAVEL_TESTS_EDITS_H

#include <gtest/gtest.h>

#include "support/JournalInvariants.h"
#include "support/Streams.h"

namespace quavel::test {

/// What a file gives its reader, as `readStream` describes it. A `QVReader` and a journal must give
/// the same record, and the journal's invariants must hold.
inline std::string resultOf(Bytes bytes, std::string const& extension) {
  std::string const result = readStream(streamOf(bytes), extension);
  QVJournal journal;
  auto const record = journal.read(dataOf(bytes), bytes.size(), extension);
  EXPECT_EQ(describe(record), result[0] == '!' ? "none" : result);
  EXPECT_EQ(readBuffer(bytes, extension), describe(record));
  EXPECT_EQ(brokenInvariant(journal, record.get()), "");
  return result;
}

/// A result, and edits of a well-made file, each of which leads to it.
struct EditRow {
  std::string result;
  std::vector<Edit> edits;
};

/// Reads each in both byte orders.
inline void check(std::string const& extension, Directory (*wellMade)(),
                  std::vector<EditRow> const& rows,
                  std::function<Bytes(ByteOrder, Directory const&)> const& layOut = tiff) {
  for (EditRow const& row : rows) {
    for (Edit const& edit : row.edits) {
      for (ByteOrder const order : kOrders) {
        Directory directory = wellMade();
        edit(directory);
        EXPECT_EQ(resultOf(layOut(order, directory), extension), row.result)
            << "edit " << &edit - row.edits.data();
      }
    }
  }
}

/// The same for files.
struct FileRow {
  std::string result;
  std::vector<Bytes> files;
};
inline void check(std::string const& extension, std::vector<FileRow> const& rows,
                  Bytes const& opening = "") {
  for (FileRow const& row : rows) {
    for (Bytes const& file : row.files) {
      EXPECT_EQ(resultOf(opening + file, extension), row.result)
          << "file " << &file - row.files.data();
    }
  }
}

}  // namespace quavel::test

#endif  // QUAVEL_TESTS_EDITS_H
