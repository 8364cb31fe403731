#ifndef QUAVEL_APPS_WHY_H
#define QUAVEL_APPS_WHY_H

#include <ostream>
#include <string>

namespace app {

/// Writes why the file gives no record, or which fields its record leaves absent and why; one
/// verdict, then some lines of detail. Returns whether the file gave a record.
bool explainFile(std::string const& path, std::ostream& out);

}  // namespace app

#endif  // QUAVEL_APPS_WHY_H
