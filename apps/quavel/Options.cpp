#include "Options.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <sstream>
#include <thread>

#include "photo/Photo.h"
#include "terminal/Text.h"

namespace app {

namespace {

constexpr unsigned kMostJobs = 256;
// For files that are not cached: there 32 are several times as fast as 2, and more gain little.
constexpr unsigned kUsualJobs = 32;

constexpr char kFooter[] =
    "Examples:\n"
    "  quavel IMG_0001.CR3                           one photo, as a card\n"
    "  quavel ~/Photos                               a folder and all in it, as a table\n"
    "  quavel --csv --sort captureDate ~/Photos > photos.csv\n"
    "  quavel --jsonl --fields path,iso,fNumber ~/Photos | jq .iso\n"
    "  find . -mtime -7 -name '*.nef' -print0 | quavel -0 --files-from -\n"
    "Fields are the record's names, such as model, or path, captureDate, reason: see quavel(1).\n"
    "Exit status: 0 every file gave a record, 1 some did not, 2 wrong usage.";

/// Shows an option's argument and no more: what excludes what is told when it matters.
class ShortFormatter : public CLI::Formatter {
 public:
  std::string make_option_opts(CLI::Option const* option) const override {
    std::string const type = option->get_type_name();
    return type.empty() ? "" : " " + type.substr(0, type.find(':'));
  }
  std::string make_usage(CLI::App const* /*app*/, std::string /*name*/) const override {
    return "Usage: quavel [OPTIONS] PATH...    photos, and folders with photos\n";
  }
  std::string make_positionals(CLI::App const* /*app*/) const override { return {}; }
};

Field const* wantedField(std::string const& option, std::string const& name) {
  Field const* const field = fieldNamed(name);
  if (field == nullptr) {
    auto const nameOf = [](Field const& known) { return std::string(known.name); };
    throw CLI::ValidationError(option + ": no field is called '" + name +
                               "'; choose from: " + CLI::detail::join(allFields(), nameOf, " "));
  }
  return field;
}

/// The parser's own lists pass over empty names.
void addFields(std::string const& list, Fields& fields) {
  std::istringstream names(list + ',');  // each name is then ended, an empty last one too
  for (std::string name; std::getline(names, name, ',');) {
    auto const* const field = wantedField("--fields", name);
    if (std::count(fields.begin(), fields.end(), field) > 0) {
      throw CLI::ValidationError("--fields: '" + name + "' is named twice");
    }
    fields.push_back(field);
  }
}

std::string refuseEmpty(std::string const& argument) {
  return argument.empty() ? "is empty: name a file" : "";
}

void addInputs(CLI::App& command, Options& options) {
  command.add_option("PATH", options.inputs.paths, "Photos and folders of photos")->type_name("");
  auto* const list = command.add_option("--files-from", options.inputs.list,
                                        "Read the photos' paths from a file; -: standard input");
  list->type_name("FILE")->check(refuseEmpty);
  command.add_flag("-0,--null", options.inputs.isNulSeparated, "Paths in that file end with a NUL")
      ->needs(list);
  auto* const standardInput =
      command.add_flag("--stdin", options.fromStdin, "Read one image from standard input");
  auto* const extension =
      command.add_option("--extension", options.extension, "The kind of that image, such as nef");
  extension->type_name("EXT")->needs(standardInput);
  standardInput->needs(extension)->excludes(list);
}

void addForms(CLI::App& command, Form& form) {
  auto* const why =
      command.add_flag("--why", form.hasNotes, "Tell why files give no record, or lack fields");
  std::vector<CLI::Option*> forms;
  auto const add = [&](char const* name, FormKind kind, char const* text) {
    auto* const flag = command.add_flag_callback(
        name, [&form, kind] { form.kind = kind; }, text);
    flag->group("Forms (otherwise a table, or a card when there is one photo)");
    for (auto* const other : forms) {
      flag->excludes(other);
    }
    forms.push_back(flag);
    return flag;
  };
  add("--card", FormKind::Card, "A labelled card for every photo")->excludes(why);
  add("--json", FormKind::Json, "One JSON array, exact values");
  add("--jsonl", FormKind::Jsonl, "One JSON object a line, as they come");
  add("--csv", FormKind::Csv, "CSV (RFC 4180) with a header row")->excludes(why);
}

void addChoices(CLI::App& command, Options& options) {
  Form& form = options.form;
  auto const setFields = [&form](std::vector<std::string> const& lists) {
    for (auto const& list : lists) {
      addFields(list, form.fields);
    }
  };
  auto const setSort = [&form](std::string const& name) {
    form.sort = wantedField("--sort", name);
  };
  auto const setAbsent = [&form](std::string const& choice) {
    if (choice != "skip" && choice != "show") {
      throw CLI::ValidationError("--absent: give skip or show");
    }
    form.showAbsent = choice == "show";
  };
  command
      .add_option_function<std::vector<std::string>>("--fields", setFields,
                                                     "Show these fields, in this order")
      ->expected(1, CLI::detail::expected_max_vector_size)
      ->allow_extra_args(false)
      ->type_name("A,B,..");
  command
      .add_option_function<std::string>("--sort", setSort,
                                        "Sort by a field; all records are kept until the end")
      ->type_name("FIELD");
  command
      .add_option_function<std::string>("--absent", setAbsent,
                                        "Absent values: skip or show (CSV always shows)")
      ->type_name("skip|show");
  command
      .add_option_function<unsigned>(
          "--jobs", [&options](unsigned jobs) { options.jobs = options.cachedJobs = jobs; },
          "Files read at a time [the processors; 32 if cold]")
      ->type_name("N")
      ->check(CLI::Range(1U, kMostJobs));
  command.add_flag("-q,--quiet", options.isQuiet, "No progress and summary; see quavel(1)");
}

void check(Options& options) {
  if (options.fromStdin) {
    options.extension = extensionOf("." + options.extension);
    std::string const unknown = whyUnknown(options.extension);
    if (!unknown.empty()) {
      throw CLI::ValidationError("--extension: " + unknown);
    }
  }
  Form const& form = options.form;
  if (form.isExplanation() && (!form.fields.empty() || form.showAbsent)) {
    throw CLI::ValidationError("--fields and --absent: with --why, add --json or --jsonl");
  }
  bool const hasPaths = !options.inputs.paths.empty() || !options.inputs.list.empty();
  if (hasPaths == options.fromStdin) {
    throw CLI::ValidationError(hasPaths ? "--stdin reads one image: give no paths with it"
                                        : "no photos given: name files or folders");
  }
}

/// The parser parts some groups by two blank lines.
std::string helpOf(CLI::App const& command) {
  std::string help = command.help();
  for (auto at = help.find("\n\n\n"); at != std::string::npos; at = help.find("\n\n\n")) {
    help.erase(at, 1);
  }
  return help;
}

}  // namespace

ParsedOptions parseOptions(int argc, char const* const* argv) {
  ParsedOptions parsed;
  Options& options = parsed.options;
  CLI::App command("Shows what cameras stored in their photos.", "quavel");
  command.set_version_flag("--version", "quavel " QUAVEL_COMMAND_VERSION, "Show the version");
  command.set_help_flag("-h,--help", "Show this help");
  command.footer(kFooter);
  command.formatter(std::make_shared<ShortFormatter>());
  command.get_formatter()->column_width(26);
  options.cachedJobs = std::clamp(std::thread::hardware_concurrency(), 1U, kMostJobs);
  options.jobs = std::max(options.cachedJobs, kUsualJobs);
  addInputs(command, options);
  addForms(command, options.form);
  addChoices(command, options);
  try {
    command.parse(argc, argv);
    check(options);
  } catch (CLI::CallForHelp const&) {
    parsed.status = kSuccess;
    parsed.output = helpOf(command);
  } catch (CLI::CallForVersion const& version) {
    parsed.status = kSuccess;
    parsed.output = std::string(version.what()) + "\n";
  } catch (CLI::Error const& error) {
    parsed.status = kWrongUsage;
    parsed.error = escaped(error.what()) + "\nTry 'quavel --help'.";
  }
  return parsed;
}

}  // namespace app
