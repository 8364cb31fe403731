// A program of its own: it replaces the system's calls on files.

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <functional>
#include <iterator>
#include <thread>
#include <utility>

#include "support/Fixtures.h"

namespace {

/// What the system does from now on.
struct System {
  std::size_t mostAtOnce = SIZE_MAX;  // bytes that a read delivers
  off_t brokenByte = -1;              // a read that touches it fails
  std::function<void(int)> beforeRead = [](int) {};
  bool takesAdvice = true;

  int reads = 0;
  std::vector<int> advice;
  off_t advisedFrom = 0;
} theSystem;

}  // namespace

extern "C" ssize_t pread(int fd, void* bytes, std::size_t count, off_t position) {
  theSystem.beforeRead(++theSystem.reads);
  if (position <= theSystem.brokenByte &&
      theSystem.brokenByte < position + static_cast<off_t>(count)) {
    errno = EIO;
    return -1;
  }
  // By other calls, which a pipe refuses likewise.
  return ::lseek(fd, position, SEEK_SET) == -1
             ? -1
             : ::read(fd, bytes, std::min(count, theSystem.mostAtOnce));
}

extern "C" int posix_fadvise(int /*fd*/, off_t from, off_t /*length*/, int advice) {
  theSystem.advisedFrom = from;
  theSystem.advice.push_back(advice);
  return theSystem.takesAdvice ? 0 : EINVAL;
}

namespace quavel::test {
namespace {

namespace fs = std::filesystem;

std::string describePath(TemporaryFile const& file) {
  return describe(QVReader(file.path).metadata);
}

/// Has the library take the files that follow for files that are not cached.
void readFromSlowDisk() {
  theSystem = {};
  theSystem.beforeRead = [](int) { std::this_thread::sleep_for(std::chrono::milliseconds(1)); };
  describePath(TemporaryFile("II*", "tif"));
  theSystem = {};
}

class FileTest : public testing::Test {
 protected:
  void SetUp() override { readFromSlowDisk(); }
  void TearDown() override { theSystem = {}; }
};

std::ptrdiff_t openDescriptors() {
  return std::distance(fs::directory_iterator("/proc/self/fd"), fs::directory_iterator());
}

TEST_F(FileTest, IsOpenedReadOnlyAndClosedAgain) {
  auto const before = openDescriptors();
  Fixture const& fixture = fixtures().front();
  TemporaryFile const good(fixture.bytes(kII), fixture.extension);
  TemporaryFile const bad("II*", "tif");
  for (TemporaryFile const* const file : {&good, &bad}) {
    QVReader const reader(file->path);
    EXPECT_EQ(describe(reader.metadata), file == &good ? fixture.expected : "none");
    EXPECT_EQ(::fcntl(QVFStream(file->path).fd, F_GETFL) & O_ACCMODE, O_RDONLY);
  }
  EXPECT_EQ(openDescriptors(), before);
}

TEST_F(FileTest, IsReadInOneReadWithOneAdvice) {
  for (Fixture const& fixture : fixtures()) {
    SCOPED_TRACE(fixture.name);
    TemporaryFile const file(fixture.bytes(kII), fixture.extension);
    for (bool const takesAdvice : {true, false}) {
      theSystem = {};
      theSystem.takesAdvice = takesAdvice;
      EXPECT_EQ(describePath(file), fixture.expected);
      EXPECT_EQ(theSystem.reads, 1);
      EXPECT_EQ(theSystem.advice, std::vector<int>{POSIX_FADV_RANDOM});
    }
  }
  theSystem = {};
  TemporaryFile const unknown("anything", "txt");
  EXPECT_FALSE(QVReader(unknown.path).metadata);
  EXPECT_FALSE(QVReader("/nonexistent/photo.jpg").metadata);
  EXPECT_EQ(theSystem.reads, 0);
  EXPECT_TRUE(theSystem.advice.empty());
}

TEST_F(FileTest, IsReadWithoutAdviceOnceFilesAreCached) {
  TemporaryFile const file("II*", "tif");
  auto const isAdvised = [&] {
    theSystem.advice.clear();
    describePath(file);
    return !theSystem.advice.empty();
  };
  int advised = 0;
  while (advised < 100000 && isAdvised()) {  // a busy machine makes some reads slow
    ++advised;
  }
  EXPECT_GE(advised, 64);
  EXPECT_LT(advised, 100000);
  readFromSlowDisk();
  EXPECT_TRUE(isAdvised());
}

TEST_F(FileTest, TakesAnotherReadForWhatLiesBeyond16KB) {
  for (auto const& [size, reads] : {std::pair<std::size_t, int>{16000, 1}, {20000, 2}}) {
    Bytes const bytes = "\xff\xd8" + segment(0xffe1, Bytes(size, 'x')) + sof0();
    TemporaryFile const file(bytes, "jpg");
    theSystem = {};
    EXPECT_EQ(describePath(file), "width=4000 height=3000");
    EXPECT_EQ(theSystem.reads, reads);
  }
}

/// Read without any buffer; fails as the system does.
struct PlainFile : QVFStream {
  using QVFStream::QVFStream;
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    std::int64_t const position = getOffset() + baseOffset;
    bool const isBroken = position <= theSystem.brokenByte &&
                          theSystem.brokenByte < position + static_cast<std::int64_t>(count);
    return isBroken ? -1 : QVFStream::readBuffer(destination, count);
  }
};

TEST_F(FileTest, GivesWhatAPlainReadGivesWhateverByteIsBroken) {
  for (Fixture const& fixture : fixtures()) {
    SCOPED_TRACE(fixture.name);
    Bytes const bytes = fixture.bytes(kMM);
    TemporaryFile const file(bytes, fixture.extension);
    for (off_t broken = 0; broken <= static_cast<off_t>(bytes.size()); ++broken) {
      theSystem.brokenByte = broken;
      auto const plain = readStream(std::make_shared<PlainFile>(file.path), fixture.extension);
      for (std::size_t const mostAtOnce : {std::size_t{SIZE_MAX}, std::size_t{50}}) {
        theSystem.mostAtOnce = mostAtOnce;
        ASSERT_EQ(describePath(file), plain[0] == '!' ? "none" : plain) << broken;
      }
    }
  }
}

TEST_F(FileTest, ThatShrinksGivesItsRecordOrNone) {
  for (Fixture const& fixture : fixtures()) {
    SCOPED_TRACE(fixture.name);
    Bytes const bytes = fixture.bytes(kII);
    bool const isJpeg = fixture.extension[0] == 'j';  // may end between two segments
    for (int read = 1; read <= theSystem.reads + 1; ++read) {
      TemporaryFile const file(bytes, fixture.extension);
      theSystem = {};
      theSystem.mostAtOnce = 40;
      theSystem.beforeRead = [&](int number) {
        if (number == read) {
          fs::resize_file(file.path, 0);
        }
      };
      std::string const found = describePath(file);
      EXPECT_TRUE(found == fixture.expected || found == "none" || isJpeg) << read << found;
      EXPECT_TRUE(found == fixture.expected || theSystem.reads >= read) << read;
    }
  }
}

TEST_F(FileTest, ThatIsWalkedToItsEndIsForeseen) {
  Bytes bytes = "\xff\xd8";
  for (int i = 0; i < 170; ++i) {
    bytes += segment(0xffe2, Bytes(30000, '\0'));
  }
  bytes += sof0() + segment(0xffe1, "none");
  TemporaryFile const file(bytes, "jpg");
  EXPECT_EQ(describePath(file), "width=4000 height=3000");
  EXPECT_EQ(theSystem.advice,
            (std::vector<int>{POSIX_FADV_RANDOM, POSIX_FADV_WILLNEED, POSIX_FADV_WILLNEED}));
  EXPECT_EQ(theSystem.advisedFrom, 2 + 155 * 30004);  // 4 MB after the first time, its 16th read
}

/// What a journal says of a pipe that others fill.
std::string readPipe(Bytes const& bytes, std::string const& extension) {
  std::string const path = testing::TempDir() + "quavel_pipe." + extension;
  fs::remove(path);
  EXPECT_EQ(::mkfifo(path.c_str(), 0600), 0);
  std::thread writer([&] {
    std::ofstream pipe(path, std::ios::binary);
    pipe << bytes.substr(0, 10) << std::flush;
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    pipe << bytes.substr(std::min<std::size_t>(10, bytes.size()));
  });
  QVJournal journal;
  auto const record = journal.read(path);
  writer.join();
  fs::remove(path);
  return record ? describe(record) : journal.refusal()->text;
}

TEST_F(FileTest, ThatIsAPipeIsReadFrontToBack) {
  theSystem.takesAdvice = false;  // for a pipe, none is
  Fixture const& fixture = fixtures().front();
  EXPECT_EQ(readPipe(fixture.bytes(kII), fixture.extension), fixture.expected);
  EXPECT_EQ(readPipe("II*", "tif"),
            "the TIFF header at 0: 2 bytes wanted at 2, but the data ends before that");
  // A pipe cannot seek. Were the seek ignored, the next bytes would give a frame of 13 x 13.
  Bytes const payload = Bytes(16378, 'x') + sof0(13, 13) + Bytes(9000, 'x');
  EXPECT_EQ(readPipe("\xff\xd8" + segment(0xffe2, payload) + sof0(), "jpg"), "");
}

TEST_F(FileTest, ThatIsAFolderCannotBeRead) {
  TemporaryFile const folder("", "jpg");
  fs::remove(folder.path);
  fs::create_directory(folder.path);
  QVJournal journal;
  EXPECT_FALSE(journal.read(folder.path));
  EXPECT_EQ(journal.refusal()->reason, QVReason::ReadError);
  EXPECT_EQ(journal.refusal()->systemError, EISDIR);
  EXPECT_NE(journal.refusal()->text.find("Is a directory"), std::string::npos);
}

TEST_F(FileTest, GivesNoRecordWhileThereAreNoDescriptors) {
  Fixture const& fixture = fixtures().front();
  TemporaryFile const file(fixture.bytes(kII), fixture.extension);
  // Read once first: a sanitizer wants descriptors when it meets a type for the first time.
  EXPECT_EQ(describePath(file), fixture.expected);
  rlimit before = {};
  ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &before), 0);
  rlimit const none = {0, before.rlim_max};
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &none), 0);
  auto const record = QVReader(file.path).metadata;
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &before), 0);
  EXPECT_FALSE(record);
  EXPECT_EQ(describePath(file), fixture.expected);
}

}  // namespace
}  // namespace quavel::test
