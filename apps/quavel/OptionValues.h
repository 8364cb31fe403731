#ifndef QUAVEL_APPS_OPTIONVALUES_H
#define QUAVEL_APPS_OPTIONVALUES_H

#include <string>
#include <vector>

#include "output/Form.h"

/// What the options' arguments mean. Each function refuses a wrong argument with a
/// CLI::ValidationError that names it.
namespace app::values {

constexpr unsigned kMaxJobs = 256;

void addFields(std::string const& list, Fields& fields);
void setSort(Form& form, std::string const& name);
void addConditions(std::vector<std::string> const& texts, Form& form);
/// A glob with a slash in it, apart from its end, is also compared with the later parts of a path.
void addExcluded(std::vector<std::string> const& globs, std::vector<std::string>& excluded);
/// Whether the choice is `yes`.
bool choose(std::string const& option, std::string const& choice, char const* no, char const* yes);
unsigned jobsOf(std::string const& text);
/// For the parser: why the argument is wrong, or nothing.
std::string refuseEmpty(std::string const& argument);

}  // namespace app::values

#endif  // QUAVEL_APPS_OPTIONVALUES_H
