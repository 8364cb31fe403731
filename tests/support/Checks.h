#ifndef QUAVEL_TESTS_CHECKS_H
#define QUAVEL_TESTS_CHECKS_H

#include <gtest/gtest.h>

#include "support/Fields.h"
#include "support/Fixtures.h"

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

inline std::vector<std::string> fieldsIn(std::string const& record) {
  std::vector<std::string> fields;
  for (std::size_t start = 0; start < record.size(); start += fields.back().size() + 2) {
    fields.push_back(record.substr(start, record.find(", ", start) - start));
  }
  return fields;
}

/// The record with changes: "height=7, -width" replaces one field and leaves another out. After
/// "! ", a refused file is left with the fields that are named, as far as the record has them.
inline std::string changed(std::string const& record, std::string const& changes) {
  bool const isRefused = changes[0] == '!';
  auto const all = fieldsIn(changes.substr(isRefused ? 2 : 0));
  std::string result;
  for (std::string const& field : fieldsIn(record)) {
    std::string const name = field.substr(0, field.find('='));
    auto const isNamed = [&](std::string const& change) {
      return change.substr(0, change.find('=')) == name;
    };
    auto const change = std::find_if(all.begin(), all.end(), isNamed);
    bool const isLeftOut = std::find(all.begin(), all.end(), "-" + name) != all.end();
    if (isRefused ? change != all.end() : !isLeftOut) {
      result += ", " + (isRefused || change == all.end() ? field : *change);
    }
  }
  return (isRefused ? "! " : "") + result.substr(result.empty() ? 0 : 2);
}

/// How the fixture's record changes, and edits of its directory that each lead to that.
struct EditRow {
  std::string changes;
  std::vector<Edit> edits;
};

/// Reads each in both byte orders.
inline void check(Fixture const& fixture, std::vector<EditRow> const& rows) {
  for (EditRow const& row : rows) {
    for (Edit const& edit : row.edits) {
      for (ByteOrder const order : kOrders) {
        Directory directory = fixture.directory();
        edit(directory);
        EXPECT_EQ(resultOf(fixture.layOut(order, directory), fixture.extension),
                  changed(fixture.expected, row.changes))
            << fixture.extension << " edit " << &edit - row.edits.data();
      }
    }
  }
}

/// A record, or what is left of it, and files that each give it.
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

#endif  // QUAVEL_TESTS_CHECKS_H
