#include <fcntl.h>
#include <signal.h>
#include <unistd.h>

#include <exception>
#include <new>
#include <string>
#include <system_error>

#include "Options.h"
#include "Run.h"
#include "output/Output.h"
#include "terminal/Console.h"
#include "terminal/Interrupt.h"

#ifdef __GLIBC__
#include <malloc.h>
#endif
#ifndef O_PATH  // which needs no permission to read; not every system has it
#define O_PATH O_RDONLY
#endif

namespace {

/// Opens a folder in place of each closed standard stream, so that no photo gets the stream's
/// descriptor. Not /dev/null: a list of paths on standard input would then seem to be empty, while
/// reading a folder fails.
void holdStandardStreams() {
  int fd = -1;
  do {  // each `open` takes the lowest free descriptor
    fd = ::open("/", O_PATH | O_CLOEXEC);
  } while (0 <= fd && fd <= STDERR_FILENO);
  if (fd > STDERR_FILENO) {
    ::close(fd);
  }
}

int runOptions(app::ParsedOptions const& parsed, app::Output& output, app::Console& console) {
  if (!parsed.status.has_value()) {
    return app::run(parsed.options, output, console);
  }
  // There is only a text to print, such as that of --help.
  if (*parsed.status == app::kSuccess) {
    output.add(parsed.text);
    output.flush();
  } else {
    console.printMessage(parsed.text);
  }
  return *parsed.status;
}

}  // namespace

int main(int argc, char** argv) {
  holdStandardStreams();
  ::signal(SIGPIPE, SIG_IGN);  // writing to a closed pipe then fails instead of ending the command
#ifdef __GLIBC__
  // Each arena takes 64 MB of address space; one for each thread could exceed `ulimit -v`.
  ::mallopt(M_ARENA_MAX, 4);
#endif
  app::interrupt::install();
  app::Console console;
  app::Output output(console);
  try {
    return runOptions(app::parseOptions(argc, argv), output, console);
  } catch (app::OutputClosed const&) {
    return app::kSuccess;                     // whoever read the output has seen enough
  } catch (std::system_error const& error) {  // only from the output: see `run`
    console.printMessage("the output cannot be written: " + error.code().message() +
                         "; it ends early. Check the disk or where the output goes");
  } catch (std::bad_alloc const&) {
    output.giveUp();  // writes what is held, and ends a JSON array
    console.printMessage("not enough memory; leave out --sort, or name fewer files at a time");
  } catch (std::exception const& error) {
    output.giveUp();
    console.printMessage(std::string("unexpected: ") + error.what());
  }
  return app::kSomeFailed;
}
