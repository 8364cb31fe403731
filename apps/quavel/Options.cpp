#include "Options.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <thread>

#include "OptionValues.h"
#include "Pipeline.h"
#include "photo/Photo.h"
#include "terminal/Text.h"

namespace app {

namespace {

constexpr char kFooter[] =
    "Examples:\n"
    "  quavel IMG_0001.CR3                           one photo, as a card\n"
    "  quavel ~/Photos                               a folder and all in it, a table\n"
    "  quavel --csv --sort captureDate ~/Photos > photos.csv\n"
    "  quavel --jsonl --fields path,iso,fNumber ~/Photos | jq .iso\n"
    "  find . -mtime -7 -name '*.nef' -print0 | quavel -0 --files-from -\n"
    "Fields, such as model, path, captureDate or reason, are listed in quavel(1).\n"
    "Exit status: 0 every file gave a record, 1 some did not, 2 wrong usage.";

/// Help that does not say which options an option excludes or needs: an error message does.
class ShortFormatter : public CLI::Formatter {
 public:
  std::string make_option_opts(CLI::Option const* option) const override {
    std::string const type = option->get_type_name();
    return type.empty() ? "" : " " + type;
  }
  std::string make_usage(CLI::App const* /*app*/, std::string /*name*/) const override {
    return "Usage: quavel [OPTIONS] PATH...    photos, and folders with photos\n";
  }
  std::string make_positionals(CLI::App const* /*app*/) const override { return {}; }
};

/// An option that takes one value each time it is given, and any number in all.
template <class Set>
void addRepeatable(CLI::App& command, char const* name, char const* type, char const* text,
                   Set set) {
  command.add_option_function<std::vector<std::string>>(name, set, text)
      ->expected(1, CLI::detail::expected_max_vector_size)
      ->allow_extra_args(false)
      ->type_name(type);
}

void addInputs(CLI::App& command, Options& options) {
  command.add_option("PATH", options.inputs.paths, "Photos and folders of photos")->type_name("");
  auto* const list = command.add_option("--files-from", options.inputs.list,
                                        "Read the photos' paths from a file; -: standard input");
  list->type_name("FILE")->check(values::refuseEmptyFileName);
  command.add_flag("--hidden", options.inputs.filter.showsHidden,
                   "Walk hidden folders, and try files named ._*");
  addRepeatable(command, "--exclude", "GLOB",
                "Leave these names or paths out of folders; repeatable",
                [&options](std::vector<std::string> const& globs) {
                  values::addExcluded(globs, options.inputs.filter.excluded);
                });
  command.add_flag("-0,--null", options.inputs.isNulSeparated, "NUL ends the --files-from paths")
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
  auto const addForm = [&](char const* name, FormKind kind, char const* text) {
    auto* const flag = command.add_flag_callback(
        name, [&form, kind] { form.kind = kind; }, text);
    flag->group("Forms (otherwise a table, or a card when there is one photo)");
    for (auto* const other : forms) {
      flag->excludes(other);
    }
    forms.push_back(flag);
    return flag;
  };
  addForm("--table", FormKind::Table, "A table, for one photo too")->excludes(why);
  addForm("--card", FormKind::Card, "A labelled card for every photo")->excludes(why);
  addForm("--json", FormKind::Json, "One JSON array, exact values");
  addForm("--jsonl", FormKind::Jsonl, "One JSON object a line, as they come");
  auto* const csv = addForm("--csv", FormKind::Csv, "CSV (RFC 4180) with a header row");
  csv->excludes(why);
  addForm("--print0", FormKind::Paths, "The paths of the photos, NUL-ended")->excludes(why);
  command.add_flag("--lf", form.endsWithLf, "End the lines of CSV with LF, not CRLF")->needs(csv);
}

void addChoices(CLI::App& command, Options& options) {
  Form& form = options.form;
  auto const setFields = [&form](std::vector<std::string> const& lists) {
    for (auto const& list : lists) {
      values::addFields(list, form.fields);
    }
  };
  auto const add = [&command](char const* name, char const* type, char const* text, auto set) {
    command.add_option_function<std::string>(name, set, text)->take_last()->type_name(type);
  };
  addRepeatable(command, "--fields", "A,B,..", "Show these fields, in this order", setFields);
  addRepeatable(
      command, "--where", "EXPR", "Only photos like this, such as 'iso>=3200'; repeatable",
      [&form](std::vector<std::string> const& texts) { values::addConditions(texts, form); });
  add("--sort", "[-]FIELD", "Sort by a field (-: descending), once all are read",
      [&form](std::string const& name) { values::setSort(form, name); });
  add("--absent", "skip|show", "Absent values: skip or show (CSV always shows)",
      [&form](std::string const& choice) {
        form.showAbsent =
            values::choose("--absent", choice, /*falseWord=*/"skip", /*trueWord=*/"show");
      });
  add("--dates", "exif|iso", "Dates in machine forms: as stored, or ISO 8601",
      [&form](std::string const& choice) {
        form.hasIsoDates =
            values::choose("--dates", choice, /*falseWord=*/"exif", /*trueWord=*/"iso");
      });
  add("-j,--jobs", "N", "Files read at a time [one a processor; 32 if uncached]",
      [&options](std::string const& jobs) {
        options.diskJobs = options.processorJobs = values::jobsOf(jobs);
      });
  command.add_flag("-q,--quiet", options.isQuiet, "No progress and summary; see quavel(1)");
}

/// Refuses what the parser cannot judge, and normalizes the extension.
void finish(Options& options) {
  if (options.fromStdin) {
    options.extension = extensionOf("." + options.extension);  // "nef" and ".nef" both give "nef"
    std::string const unknown = whyUnknown(options.extension);
    if (!unknown.empty()) {
      throw CLI::ValidationError("--extension: " + unknown);
    }
  }
  Form const& form = options.form;
  if (form.isExplanation() && (!form.fields.empty() || form.showAbsent.has_value())) {
    throw CLI::ValidationError("--fields and --absent: with --why, add --json or --jsonl");
  }
  bool const hasPaths = !options.inputs.paths.empty() || !options.inputs.list.empty();
  if (hasPaths == options.fromStdin) {  // both, or neither
    throw CLI::ValidationError(hasPaths ? "--stdin reads one image: give no paths with it"
                                        : "no photos given: name files or folders");
  }
}

/// The parser would take "--quiet=0" for "not quiet", and "-q=0" for several short options. After
/// "--exclude=", it would take the next word, such as a folder, as the value.
void refuseOddValues(CLI::App const& command, int argc, char const* const* argv) {
  for (int i = 1; i < argc && argv[i] != std::string_view("--"); ++i) {
    std::string const word = argv[i];
    auto const equals = word.find('=');
    auto const* const option = command.get_option_no_throw(word.substr(0, equals));
    // A word without a dash is a file, even "PATH=x", though the parser knows an option "PATH".
    bool const isAssignment = word[0] == '-' && equals != std::string::npos && option != nullptr;
    if (isAssignment && option->get_items_expected_max() == 0) {
      throw CLI::ValidationError("'" + word + "': this option takes no value");
    }
    if (isAssignment && equals + 1 == word.size()) {
      throw CLI::ValidationError("'" + word + "': give a value after the =");
    }
  }
}

/// The help with one blank line between groups; the parser puts two between some.
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
  options.processorJobs = std::clamp(std::thread::hardware_concurrency(), 1U, values::kMaxJobs);
  options.diskJobs = std::max(options.processorJobs, kDiskJobs);
  addInputs(command, options);
  addForms(command, options.form);
  addChoices(command, options);
  try {
    refuseOddValues(command, argc, argv);
    command.parse(argc, argv);
    finish(options);
  } catch (CLI::CallForHelp const&) {
    parsed.status = kSuccess;
    parsed.text = helpOf(command);
  } catch (CLI::CallForVersion const& version) {
    parsed.status = kSuccess;
    parsed.text = std::string(version.what()) + "\n";
  } catch (CLI::Error const& error) {
    parsed.status = kWrongUsage;
    parsed.text = escaped(error.what()) + "\nTry 'quavel --help'.";
  }
  return parsed;
}

}  // namespace app
