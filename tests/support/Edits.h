#ifndef QUAVEL_TESTS_EDITS_H
#define QUAVEL_TESTS_EDITS_H

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "support/Fixtures.h"

namespace quavel::test {

/// A well-made file with one edit, and what the reader makes of it.
struct Edit {
  char const* name;
  std::function<void(Directory&)> edit;
  bool isRead;
  std::string fields;
};

/// Reads each row in both byte orders with a reader of its own, and looks at the reader itself: a
/// failed read keeps what it had stored.
template <class Format>
void check(Directory (*wellMade)(), std::vector<Edit> const& rows,
           std::function<Bytes(ByteOrder, Directory const&)> const& layOut = tiff) {
  for (ByteOrder const order : kOrders) {
    for (Edit const& row : rows) {
      SCOPED_TRACE(row.name);
      Directory directory = wellMade();
      row.edit(directory);
      Bytes bytes = layOut(order, directory);
      std::shared_ptr<QVStream> stream =
          std::make_shared<QVMStream>(reinterpret_cast<unsigned char*>(bytes.data()), bytes.size());
      Format format;
      EXPECT_EQ(format.read(stream), row.isRead);
      EXPECT_EQ(describe(format), row.fields);
    }
  }
}

inline void noEdit(Directory& /*file*/) {}

}  // namespace quavel::test

#endif  // QUAVEL_TESTS_EDITS_H
