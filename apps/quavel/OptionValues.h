#ifndef QUAVEL_APPS_OPTIONVALUES_H
#define QUAVEL_APPS_OPTIONVALUES_H

#include <string>
#include <vector>

#include "output/Form.h"

/// Turning options' arguments into values. For a wrong one, a CLI::ValidationError is thrown.
namespace app::values {

constexpr unsigned kMaxJobs = 256;

void addFields(std::string const& list, Fields& fields);
void setSort(Form& form, std::string const& name);
void addConditions(std::vector<std::string> const& texts, Form& form);
/// Appends the globs, without slashes at their ends. One with a slash in it, such as a/b, is
/// matched with whole paths, so */a/b is appended too, which matches it in any folder.
void addExcluded(std::vector<std::string> const& globs, std::vector<std::string>& excluded);
/// Whether the choice is `trueWord`, such as "show". The only other is `falseWord`, such as "skip".
bool choose(std::string const& option, std::string const& choice, char const* falseWord,
            char const* trueWord);
unsigned jobsOf(std::string const& text);
/// For the parser's `check`: returns what is wrong if the argument is empty, else an empty text.
std::string refuseEmptyFileName(std::string const& argument);

}  // namespace app::values

#endif  // QUAVEL_APPS_OPTIONVALUES_H
