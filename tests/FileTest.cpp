// A program of its own: it replaces the system's calls on files.

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <thread>

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
  std::pair<off_t, off_t> advised;  // offset and length

  bool isBroken(off_t position, std::size_t count) const {
    return position <= brokenByte && brokenByte < position + static_cast<off_t>(count);
  }
} theSystem;

}  // namespace

extern "C" ssize_t pread(int fd, void* bytes, std::size_t count, off_t position) {
  theSystem.beforeRead(++theSystem.reads);
  if (theSystem.isBroken(position, count)) {
    errno = EIO;
    return -1;
  }
  // By other calls, which a pipe refuses likewise.
  return ::lseek(fd, position, SEEK_SET) == -1
             ? -1
             : ::read(fd, bytes, std::min(count, theSystem.mostAtOnce));
}

extern "C" int posix_fadvise(int /*fd*/, off_t offset, off_t length, int advice) {
  theSystem.advised = {offset, length};
  theSystem.advice.push_back(advice);
  return theSystem.takesAdvice ? 0 : EINVAL;
}

namespace quavel::test {
namespace {

namespace fs = std::filesystem;

std::string describePath(std::string const& path) {
  theSystem.reads = 0;
  theSystem.advice = {};
  return describe(QVReader(path).metadata);
}

struct FileTest : testing::Test {
  FileTest() { readFromSlowDisk(); }
  ~FileTest() override { theSystem = {}; }

  /// After this, files count as not cached.
  void readFromSlowDisk() const {
    theSystem.beforeRead = [](int) { std::this_thread::sleep_for(std::chrono::milliseconds(1)); };
    describePath(photoFile.path);
    theSystem = {};
  }

  Fixture const& photo = fixtures().front();
  TemporaryFile const photoFile{photo.bytes(kII), photo.extension};
};

std::ptrdiff_t openDescriptors() {
  return std::distance(fs::directory_iterator("/proc/self/fd"), fs::directory_iterator());
}

TEST_F(FileTest, IsOpenedReadOnlyAndClosedAgain) {
  auto const before = openDescriptors();
  TemporaryFile const bad("II*", "tif");
  EXPECT_EQ(describePath(photoFile.path), photo.expected);
  EXPECT_EQ(describePath(bad.path), "none");
  EXPECT_EQ(::fcntl(QVFStream(bad.path).fd, F_GETFL) & O_ACCMODE, O_RDONLY);
  EXPECT_EQ(openDescriptors(), before);

  rlimit limits = {};
  ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &limits), 0);
  rlimit const none = {0, limits.rlim_max};
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &none), 0);
  auto const record = QVReader(photoFile.path).metadata;
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &limits), 0);
  EXPECT_FALSE(record);
}

TEST_F(FileTest, IsReadInOneReadWithOneAdvice) {
  for (Fixture const& fixture : fixtures()) {
    TemporaryFile const file(fixture.bytes(kII), fixture.extension);
    for (bool const takesAdvice : {true, false}) {
      theSystem.takesAdvice = takesAdvice;
      EXPECT_EQ(describePath(file.path), fixture.expected);
      EXPECT_EQ(theSystem.reads, 1) << fixture.extension;
      EXPECT_EQ(theSystem.advice, std::vector<int>{POSIX_FADV_RANDOM}) << fixture.extension;
    }
  }
  TemporaryFile const unknown("anything", "txt");
  EXPECT_EQ(describePath(unknown.path), "none");
  EXPECT_EQ(describePath("/nonexistent/photo.jpg"), "none");
  EXPECT_TRUE(theSystem.reads == 0 && theSystem.advice.empty());
  for (auto const& [size, reads] : {std::pair<std::size_t, int>{16000, 1}, {20000, 2}}) {
    TemporaryFile const file("\xff\xd8" + segment(0xffe1, Bytes(size, 'x')) + sof0(), "jpg");
    EXPECT_EQ(describePath(file.path), "width=4000, height=3000");
    EXPECT_EQ(theSystem.reads, reads);
  }
}

TEST_F(FileTest, IsReadWithoutAdviceOnceFilesAreCached) {
  auto const isAdvised = [&] {
    describePath(photoFile.path);
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

TEST_F(FileTest, ThatShrinksGivesItsRecordOrNone) {
  for (Fixture const& fixture : fixtures()) {
    bool const isJpeg = fixture.extension[0] == 'j';  // may end between two segments
    for (int read = 1; read == 1 || theSystem.reads >= read - 1; ++read) {
      TemporaryFile const file(fixture.bytes(kII), fixture.extension);
      theSystem.mostAtOnce = 40;
      theSystem.beforeRead = [&](int number) {
        if (number == read) {
          fs::resize_file(file.path, 0);
        }
      };
      std::string const found = describePath(file.path);
      EXPECT_TRUE(found == fixture.expected || found == "none" || isJpeg) << read << found;
    }
  }
}

TEST_F(FileTest, GivesWhatAPlainReadGivesWhateverByteIsBroken) {
  for (Fixture const& fixture : fixtures()) {
    Bytes const bytes = fixture.bytes(kMM);
    TemporaryFile const file(bytes, fixture.extension);
    for (off_t broken = 0; broken <= static_cast<off_t>(bytes.size()); ++broken) {
      theSystem.brokenByte = broken;
      auto const unbuffered = std::make_shared<TestStream>(bytes);
      unbuffered->onRead = [&](auto* destination, std::size_t count) {
        bool const isBroken = theSystem.isBroken(static_cast<off_t>(unbuffered->offset), count);
        return isBroken ? -1 : unbuffered->deliver(destination, count);
      };
      std::string const plain = readStream(unbuffered, fixture.extension);
      for (std::size_t const mostAtOnce : {std::size_t{SIZE_MAX}, std::size_t{50}}) {
        theSystem.mostAtOnce = mostAtOnce;
        ASSERT_EQ(describePath(file.path), plain[0] == '!' ? "none" : plain) << file.path << broken;
      }
    }
  }
}

TEST_F(FileTest, ThatIsWalkedToItsEndIsForeseen) {
  Bytes bytes = "\xff\xd8";
  for (int i = 0; i < 170; ++i) {
    bytes += segment(0xffe2, Bytes(30000, '\0'));
  }
  TemporaryFile const file(bytes + sof0() + segment(0xffe1, "none"), "jpg");
  EXPECT_EQ(describePath(file.path), "width=4000, height=3000");
  EXPECT_EQ(theSystem.advice,
            (std::vector<int>{POSIX_FADV_RANDOM, POSIX_FADV_WILLNEED, POSIX_FADV_WILLNEED}));
  // 4 MB after the first time, its 16th read.
  EXPECT_EQ(theSystem.advised, std::make_pair(off_t{2 + 155 * 30004}, off_t{4 << 20}));
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
  EXPECT_EQ(readPipe(photo.bytes(kII), photo.extension), photo.expected);
  EXPECT_EQ(readPipe("II*", "tif"),
            "the TIFF header at 0: 2 bytes wanted at 2, but the data ends before that");
  // A pipe cannot seek. Were the seek ignored, the next bytes would give a frame of 13 x 13.
  Bytes const payload = Bytes(16378, 'x') + sof0(13, 13) + Bytes(9000, 'x');
  EXPECT_EQ(readPipe("\xff\xd8" + segment(0xffe2, payload) + sof0(), "jpg"), "");
}

TEST_F(FileTest, ThatIsAFolderCannotBeRead) {
  fs::remove(photoFile.path);
  fs::create_directory(photoFile.path);
  QVJournal journal;
  EXPECT_FALSE(journal.read(photoFile.path));
  EXPECT_EQ(journal.refusal()->reason, QVReason::ReadError);
  EXPECT_EQ(journal.refusal()->systemError, EISDIR);
  EXPECT_NE(journal.refusal()->text.find("Is a directory"), std::string::npos);
}

}  // namespace
}  // namespace quavel::test
