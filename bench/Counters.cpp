#include "Counters.h"

#include <sys/ptrace.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdint>
#include <cstdlib>
#include <new>

namespace quavel::bench {
namespace {

constexpr std::size_t kLargeBlock = 4096;
constexpr unsigned kLimitSeconds = 1;

bool isCounting = false;
HeapUses heapUses;

void countBlock(std::size_t size) {
  HeapUse& use = size < kLargeBlock ? heapUses.small : heapUses.large;
  ++use.blocks;
  use.bytes += static_cast<double>(size);
}

/// A call that no reader makes and that changes nothing: the parent counts between two of these.
void mark() { ::syscall(SYS_getppid); }

[[noreturn]] void runTraced(std::function<void()> const& work) {
  ::alarm(kLimitSeconds);
  work();
  ::alarm(0);
  if (::ptrace(PTRACE_TRACEME, 0, nullptr, nullptr) == 0) {
    ::raise(SIGSTOP);
    mark();
    work();
    mark();
  }
  ::_exit(0);
}

/// Lets the child go on to where its next system call begins or ends. False: it has ended.
bool toNextStop(pid_t child, __ptrace_syscall_info* stop) {
  constexpr int kSystemCallStop = SIGTRAP | 0x80;
  int status = 0;
  do {
    if (::ptrace(PTRACE_SYSCALL, child, nullptr, nullptr) != 0 ||
        ::waitpid(child, &status, 0) != child || !WIFSTOPPED(status)) {
      return false;
    }
  } while (WSTOPSIG(status) != kSystemCallStop);
  return ::ptrace(PTRACE_GET_SYSCALL_INFO, child, sizeof(*stop), stop) > 0;
}

bool isRead(std::uint64_t number) {
  return number == SYS_read || number == SYS_pread64 || number == SYS_readv || number == SYS_preadv;
}

std::optional<SystemUse> countUntilEnd(pid_t child) {
  SystemUse use;
  __ptrace_syscall_info stop = {};
  std::uint64_t number = 0;
  int marks = 0;
  while (toNextStop(child, &stop)) {
    if (stop.op == PTRACE_SYSCALL_INFO_ENTRY) {
      number = stop.entry.nr;
      marks += number == SYS_getppid ? 1 : 0;
      use.calls += marks == 1 && number != SYS_getppid ? 1 : 0;
    } else if (marks == 1 && isRead(number) && stop.exit.rval > 0) {
      use.bytesRead += static_cast<double>(stop.exit.rval);
    }
  }
  return marks == 2 ? std::optional(use) : std::nullopt;
}

}  // namespace

HeapUses countHeap(std::function<void()> const& work) {
  work();
  heapUses = {};
  isCounting = true;
  work();
  isCounting = false;
  return heapUses;
}

std::optional<SystemUse> countSystemCalls(std::function<void()> const& work) {
  pid_t const child = ::fork();
  if (child == 0) {
    runTraced(work);
  }
  int status = 0;
  if (child < 0 || ::waitpid(child, &status, 0) != child || !WIFSTOPPED(status)) {
    return std::nullopt;
  }
  ::ptrace(PTRACE_SETOPTIONS, child, nullptr, PTRACE_O_TRACESYSGOOD | PTRACE_O_EXITKILL);
  return countUntilEnd(child);
}

}  // namespace quavel::bench

// The array and nothrow forms of the standard library end here too.
void* operator new(std::size_t size) {
  if (quavel::bench::isCounting) {
    quavel::bench::countBlock(size);
  }
  if (void* const block = std::malloc(size)) {
    return block;
  }
  throw std::bad_alloc();
}

void operator delete(void* block) noexcept { std::free(block); }
void operator delete(void* block, std::size_t) noexcept { std::free(block); }
