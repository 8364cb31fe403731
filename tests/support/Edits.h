#ifndef QUAVEL_TESTS_EDITS_H
#define QUAVEL_TESTS_EDITS_H

#include <gtest/gtest.h>

#include "support/JournalLaw.h"
#include "support/Streams.h"

namespace quavel::test {

/// What a file gives its reader, as `readStream` describes it. Without a reader of one's own, and
/// with a journal, the record is the same, and the journal keeps its law.
inline std::string resultOf(Bytes bytes, std::string const& extension) {
  std::string const result = readStream(streamOf(bytes), extension);
  QVJournal journal;
  auto const record = journal.read(dataOf(bytes), bytes.size(), extension);
  EXPECT_EQ(describe(record), result[0] == '!' ? "none" : result);
  EXPECT_EQ(readBuffer(bytes, extension), describe(record));
  EXPECT_EQ(brokenLaw(journal, record.get()), "");
  return result;
}

/// A well-made file with one edit, and its result.
struct EditRow {
  Edit edit;
  std::string result;
};

/// Reads each row in both byte orders.
inline void check(std::string const& extension, Directory (*wellMade)(),
                  std::vector<EditRow> const& rows,
                  std::function<Bytes(ByteOrder, Directory const&)> const& layOut = tiff) {
  for (ByteOrder const order : kOrders) {
    for (EditRow const& row : rows) {
      Directory directory = wellMade();
      row.edit(directory);
      EXPECT_EQ(resultOf(layOut(order, directory), extension), row.result)
          << "row " << &row - rows.data();
    }
  }
}

}  // namespace quavel::test

#endif  // QUAVEL_TESTS_EDITS_H
