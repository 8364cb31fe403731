#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

namespace fs = std::filesystem;

/// The path in the form that the C++ library accepts at any length.
fs::path marked(fs::path const& path) {
#ifdef _WIN32
  return LR"(\\?\)" + path.native();
#else
  return path;
#endif
}

// Paths are UTF-8 on every system.
TEST(Path, LeadsToNamesOfAnyScriptAndLength) {
  Fixture const& fixture = fixtures().front();
  TemporaryFile const named("", "photo");
  fs::path const folder = named.path + ".d";
  fs::path deep = folder;
  for (int i = 0; i < 4; ++i) {
    deep /= std::string(100, 'd');
  }
  fs::create_directories(marked(deep));
  for (fs::path const& place : {folder, deep}) {
    for (char const* const name : {"plain", "\xc3\xa9t\xc3\xa9 \xd1\x84\xd0\xbe\xd1\x82\xd0\xbe",
                                   "\xe5\x86\x99\xe7\x9c\x9f \xf0\x9f\x93\xb7"}) {
      fs::path const path = place / fs::u8path(name + ("." + fixture.extension));
      std::ofstream(marked(path), std::ios::binary) << fixture.bytes(kII);
      EXPECT_EQ(describe(QVReader(path.u8string()).metadata), fixture.expected) << path;
      fs::remove(marked(path));
    }
  }
  for (; deep != folder.parent_path(); deep = deep.parent_path()) {
    fs::remove(marked(deep));
  }
}

}  // namespace
}  // namespace quavel::test
