#include "Cold.h"

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <system_error>

namespace quavel::bench {
namespace {

constexpr double kBlockOfUsage = 512;
constexpr int kCannotRun = 126;  // and above: what a shell gives for a command that it cannot run

void require(bool isDone, char const* what) {
  if (!isDone) {
    throw std::system_error(errno, std::generic_category(), what);
  }
}

void emptyCaches() {
  ::sync();  // what is not written yet would stay
  int const fd = ::open("/proc/sys/vm/drop_caches", O_WRONLY);
  bool const isDone = fd != -1 && ::write(fd, "3", 1) == 1;
  int const problem = errno;
  ::close(fd);
  errno = problem;
  require(isDone, "the caches cannot be emptied");
}

ColdUse readInChild(Contender const& contender, Paths const& files) {
  auto const start = std::chrono::steady_clock::now();
  pid_t const child = ::fork();
  require(child != -1, "no process is to be had");
  if (child == 0) {
    contender.read(files);
    ::_exit(0);
  }
  int status = 0;
  rusage usage = {};
  require(::wait4(child, &status, 0, &usage) == child, "the process is lost");
  require(WIFEXITED(status) && WEXITSTATUS(status) < kCannotRun, "a reader cannot be run");
  std::chrono::duration<double> const time = std::chrono::steady_clock::now() - start;
  return {time.count(), static_cast<double>(usage.ru_inblock) * kBlockOfUsage};
}

}  // namespace

ColdUse readCold(Contender const& contender, Paths const& warmUp) {
  emptyCaches();
  readInChild(contender, warmUp);
  return readInChild(contender, contender.files);
}

}  // namespace quavel::bench
