#ifndef QUAVEL_APPS_RUN_H
#define QUAVEL_APPS_RUN_H

#include "Options.h"
#include "output/Output.h"
#include "terminal/Console.h"

namespace app {

/// Reads what the options ask for and writes it. Returns the exit status. Throws OutputClosed, or
/// std::system_error when the output cannot be written.
int run(Options const& options, Output& output, Console& console);

}  // namespace app

#endif  // QUAVEL_APPS_RUN_H
