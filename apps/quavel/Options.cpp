#include "Options.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <thread>

#include "Escape.h"
#include "Photo.h"

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
    "Fields are the record's names, such as model, or path, captureDate, error: see quavel(1).\n"
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

/// The texts of the arguments before they are checked.
struct Texts {
  std::vector<std::string> fields;  // each a list
  std::optional<std::string> sort;
  std::optional<std::string> absent;
};

std::string fieldNames() {
  std::string names;
  for (auto const& field : allFields()) {
    names.append(names.empty() ? "" : " ").append(field.name);
  }
  return names;
}

Field const* wantedField(std::string const& option, std::string const& name) {
  Field const* const field = fieldNamed(name);
  if (field == nullptr) {
    throw CLI::ValidationError(option + ": no field is called '" + name +
                               "'; choose from: " + fieldNames());
  }
  return field;
}

/// Splits by hand: the parser's own lists pass over empty names.
void addFields(std::string_view list, Fields& fields) {
  for (bool isLast = false; !isLast;) {
    auto const comma = list.find(',');
    isLast = comma == std::string_view::npos;
    std::string const name(list.substr(0, comma));
    auto const* const field = wantedField("--fields", name);
    if (std::count(fields.begin(), fields.end(), field) > 0) {
      throw CLI::ValidationError("--fields: '" + name + "' is named twice");
    }
    fields.push_back(field);
    list.remove_prefix(isLast ? list.size() : comma + 1);
  }
}

std::string refuseEmpty(std::string const& argument) {
  return argument.empty() ? "is empty: name a file" : "";
}

void addInputs(CLI::App& command, Options& options) {
  command.add_option("PATH", options.paths, "Photos and folders of photos")->type_name("");
  auto* const list = command.add_option("--files-from", options.filesFrom,
                                        "Read the photos' paths from a file; -: standard input");
  list->type_name("FILE")->check(refuseEmpty);
  command.add_flag("-0,--null", options.isNulSeparated, "Paths in that file end with a NUL")
      ->needs(list);
  auto* const standardInput =
      command.add_flag("--stdin", options.fromStdin, "Read one image from standard input");
  auto* const extension =
      command.add_option("--extension", options.extension, "The kind of that image, such as nef");
  extension->type_name("EXT")->needs(standardInput);
  standardInput->needs(extension)->excludes(list);
  command.add_option("--why", options.why, "Tell why a file gives no record, or lacks fields")
      ->type_name("FILE")
      ->check(refuseEmpty);
}

void addForms(CLI::App& command, FormKind& form) {
  std::vector<CLI::Option*> forms;
  struct Row {
    char const* name;
    FormKind kind;
    char const* text;
  };
  for (Row const& row : {Row{"--card", FormKind::Card, "A labelled card for every photo"},
                         Row{"--json", FormKind::Json, "One JSON array, exact values"},
                         Row{"--jsonl", FormKind::Jsonl, "One JSON object a line, as they come"},
                         Row{"--csv", FormKind::Csv, "CSV (RFC 4180) with a header row"}}) {
    auto* const flag = command.add_flag_callback(
        row.name, [&form, kind = row.kind] { form = kind; }, row.text);
    flag->group("Forms (otherwise a table, or a card when there is one photo)");
    for (auto* const other : forms) {
      flag->excludes(other);
    }
    forms.push_back(flag);
  }
}

void addChoices(CLI::App& command, Options& options, Texts& texts) {
  command.add_option("--fields", texts.fields, "Show these fields, in this order")
      ->expected(1, CLI::detail::expected_max_vector_size)
      ->allow_extra_args(false)
      ->type_name("A,B,..");
  command.add_option("--sort", texts.sort, "Sort by a field; all records are kept until the end")
      ->type_name("FIELD");
  command.add_option("--absent", texts.absent, "Absent values: skip or show (CSV always shows)")
      ->type_name("skip|show");
  command
      .add_option_function<unsigned>(
          "--jobs", [&options](unsigned jobs) { options.jobs = options.cachedJobs = jobs; },
          "Files read at a time [the processors; 32 if cold]")
      ->type_name("N")
      ->check(CLI::Range(1U, kMostJobs));
  command.add_flag("-q,--quiet", options.isQuiet, "No progress and summary; see quavel(1)");
}

void check(Options& options, Texts const& texts) {
  for (auto const& list : texts.fields) {
    addFields(list, options.fields);
  }
  if (texts.sort) {
    options.sort = wantedField("--sort", *texts.sort);
  }
  if (texts.absent && texts.absent != "skip" && texts.absent != "show") {
    throw CLI::ValidationError("--absent: give skip or show");
  }
  if (texts.absent) {
    options.showAbsent = texts.absent == "show";
  }
  if (options.fromStdin) {
    options.extension = extensionOf("." + options.extension);
    if (!isPhotoExtension(options.extension)) {
      throw CLI::ValidationError("--extension: give one of: " + extensionList());
    }
  }
  bool const hasPaths = !options.paths.empty() || !options.filesFrom.empty();
  if (!options.why.empty()) {
    if (hasPaths || options.fromStdin || options.form != FormKind::Automatic) {
      throw CLI::ValidationError("--why explains one file in words: give no other and no form");
    }
    return;
  }
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
  Texts texts;
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
  addChoices(command, options, texts);
  try {
    command.parse(argc, argv);
    check(options, texts);
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
