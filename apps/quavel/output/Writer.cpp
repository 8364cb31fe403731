#include "output/Writer.h"

#include <algorithm>
#include <exception>

#include "output/Forms.h"
#include "photo/Reasons.h"
#include "terminal/Text.h"

namespace app {

namespace {

/// Writes a text for each file, with `start` before the first and `separator` before the others.
class TextWriter : public Writer {
 public:
  TextWriter(Output& output, TextMaker textOf, std::string start, std::string separator)
      : output_(output),
        textOf_(std::move(textOf)),
        beforeNext_(std::move(start)),
        separator_(std::move(separator)) {}

  void prepare(Outcome& outcome) const override {
    outcome.text = textOf_(outcome);
    outcome.record.reset();
    outcome.notes.clear();
  }
  void add(Outcome&& outcome) override {
    if (!outcome.text.empty()) {
      output_.add(outcome.text.insert(0, beforeNext_));
      beforeNext_ = separator_;
    }
  }
  void end() override { output_.finish(); }  // writes the tail, such as the "]" of a JSON array

 private:
  Output& output_;
  TextMaker textOf_;
  std::string beforeNext_;
  std::string separator_;
};

/// Keeps all outcomes and hands them to another writer in the order of a field.
class SortingWriter : public Writer {
 public:
  SortingWriter(Form const& form, std::unique_ptr<Writer> next)
      : form_(form), next_(std::move(next)) {}

  void prepare(Outcome&) const override {}  // not before `end`: sorting needs the record
  void add(Outcome&& outcome) override { outcomes_.push_back(std::move(outcome)); }
  void end() override {
    auto const isBefore = [this](Outcome const& a, Outcome const& b) {
      Value const left = comparedValue(*form_.sort, a);
      Value const right = comparedValue(*form_.sort, b);
      if (isAbsent(left) || isAbsent(right)) {
        return !isAbsent(left) && isAbsent(right);  // absent values come last
      }
      return form_.isDescending ? right < left : left < right;
    };
    std::stable_sort(outcomes_.begin(), outcomes_.end(), isBefore);
    for (auto& outcome : outcomes_) {
      next_->prepareOrSetProblem(outcome);
      next_->add(std::move(outcome));
      outcome = {};  // frees what `add` did not take
    }
    next_->end();
  }

 private:
  Form const& form_;
  std::unique_ptr<Writer> next_;
  std::vector<Outcome> outcomes_;
};

/// The path of each file that gave a record, ended by a NUL. If there are conditions, such as
/// 'reason==empty', all files that come here meet them and are listed, with or without a record.
TextMaker paths(Form const& form, bool isForTerminal) {
  return [hasConditions = !form.conditions.empty(), isForTerminal](Outcome const& outcome) {
    std::string const path = isForTerminal ? escapedPath(outcome.path) : outcome.path;
    bool const isListed = outcome.record || hasConditions;
    return isListed ? path + '\0' : std::string();
  };
}

std::unique_ptr<Writer> makeText(Form const& form, Output& output) {
  bool const isTerminal = output.isTerminal();
  auto const writer = [&output](TextMaker textOf, char const* start, char const* separator) {
    return std::make_unique<TextWriter>(output, std::move(textOf), start, separator);
  };
  switch (form.kind) {  // each text ends its own line, except in a JSON array
    case FormKind::Json:
      output.enclose("[", "\n]\n");
      return writer(jsonObjectMaker(form, isTerminal), "\n", ",\n");
    case FormKind::Jsonl:
      return writer(jsonObjectMaker(form, isTerminal), "", "");
    case FormKind::Csv:
      output.add(csvHeader(form));
      return writer(csvRowMaker(form, isTerminal), "", "");
    case FormKind::Paths:
      return writer(paths(form, isTerminal), "", "");
    case FormKind::Card:
      return writer([&form](Outcome const& outcome) { return cardOf(form, outcome); }, "", "\n");
    default:  // Automatic with notes; `makeWriter` gives the others to `makeTable`
      return writer(explanationOf, "", "\n");
  }
}

}  // namespace

void Writer::prepareOrSetProblem(Outcome& outcome) const {
  try {
    prepare(outcome);
  } catch (std::exception const& error) {
    Outcome failed;
    failed.path = std::move(outcome.path);
    failed.problem = reason::failure(error);
    outcome = std::move(failed);
    prepare(outcome);  // the text of a file without a record
  }
}

std::unique_ptr<Writer> makeWriter(Form const& form, Output& output) {
  // Automatic is a table too, which `makeTable` turns into a card if there is only one photo.
  bool const isTable =
      form.kind == FormKind::Table || (form.kind == FormKind::Automatic && !form.hasNotes);
  auto writer = isTable ? makeTable(form, output) : makeText(form, output);
  if (form.sort == nullptr) {
    return writer;
  }
  return std::make_unique<SortingWriter>(form, std::move(writer));
}

}  // namespace app
