#ifndef QUAVEL_APPS_OPTIONVALUES_H
#define QUAVEL_APPS_OPTIONVALUES_H

#include <string>
#include <vector>

#include "output/Form.h"

/// What options' arguments mean. A wrong one is refused with a CLI::ValidationError that names it.
namespace app::values {

constexpr unsigned kMaxJobs = 256;

void addFields(std::string const& list, Fields& fields);
void setSort(Form& form, std::string const& name);
void addConditions(std::vector<std::string> const& texts, Form& form);
/// A glob with a slash in it (not only at its end) matches whole paths, and the ends of paths.
void addExcluded(std::vector<std::string> const& globs, std::vector<std::string>& excluded);
/// Whether the choice is `yes`.
bool choose(std::string const& option, std::string const& choice, char const* no, char const* yes);
unsigned jobsOf(std::string const& text);
/// For the parser: why the argument is wrong; empty if it is not.
std::string refuseEmpty(std::string const& argument);

}  // namespace app::values

#endif  // QUAVEL_APPS_OPTIONVALUES_H
