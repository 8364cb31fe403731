#include "OptionValues.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <charconv>
#include <sstream>
#include <stdexcept>

namespace app::values {

namespace {

Field const* requireField(std::string const& option, std::string const& name) {
  Field const* const field = fieldNamed(name);
  if (field == nullptr) {
    auto const nameOf = [](Field const& known) { return std::string(known.name); };
    throw CLI::ValidationError(option + ": no field is called '" + name +
                               "'; choose from: " + CLI::detail::join(allFields(), nameOf, " "));
  }
  return field;
}

}  // namespace

/// Splits the list here, because the parser would skip empty names instead of refusing them.
void addFields(std::string const& list, Fields& fields) {
  std::istringstream names(list + ',');  // without the comma, an empty last name would be lost
  for (std::string name; std::getline(names, name, ',');) {
    auto const* const field = requireField("--fields", name);
    if (std::count(fields.begin(), fields.end(), field) > 0) {
      throw CLI::ValidationError("--fields: '" + name + "' is named twice");
    }
    fields.push_back(field);
  }
}

std::string refuseEmptyFileName(std::string const& argument) {
  return argument.empty() ? "is empty: name a file" : "";
}

void setSort(Form& form, std::string const& name) {
  form.isDescending = name.substr(0, 1) == "-";
  form.sort = requireField("--sort", name.substr(form.isDescending ? 1 : 0));
}

void addConditions(std::vector<std::string> const& texts, Form& form) {
  for (auto const& text : texts) {
    std::string name = text.substr(0, text.find_first_of(Condition::kSignCharacters));
    auto const comparison = std::string_view(text).substr(name.size());
    name.erase(name.find_last_not_of(' ') + 1);  // drops the blanks before the sign
    auto const* const field = requireField("--where", name);
    try {
      form.conditions.emplace_back(*field, comparison);
    } catch (std::invalid_argument const& error) {
      throw CLI::ValidationError(std::string("--where: ") + error.what());
    }
  }
}

void addExcluded(std::vector<std::string> const& globs, std::vector<std::string>& excluded) {
  for (std::string glob : globs) {
    while (glob.size() > 1 && glob.back() == '/') {
      glob.pop_back();  // the shell's completion puts a slash after a folder's name
    }
    excluded.push_back(glob);
    if (glob.find('/') != std::string::npos) {
      excluded.push_back("*/" + glob);
    }
  }
}

bool choose(std::string const& option, std::string const& choice, char const* falseWord,
            char const* trueWord) {
  if (choice != falseWord && choice != trueWord) {
    throw CLI::ValidationError(option + ": '" + choice + "': give " + falseWord + " or " +
                               trueWord);
  }
  return choice == trueWord;
}

/// The parser's own conversion would also accept other notations, such as 0x10.
unsigned jobsOf(std::string const& text) {
  unsigned jobs = 0;
  auto const* const end = text.data() + text.size();
  auto const result = std::from_chars(text.data(), end, jobs);
  if (result.ec != std::errc() || result.ptr != end || jobs < 1 || jobs > kMaxJobs) {
    throw CLI::ValidationError("--jobs: '" + text + "' is not a number from 1 to " +
                               std::to_string(kMaxJobs));
  }
  return jobs;
}

}  // namespace app::values
