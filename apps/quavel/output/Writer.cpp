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
  TextWriter(Output& output, TextOf textOf, std::string start, std::string separator)
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
  TextOf textOf_;
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

/// Each path, ended by a NUL. With conditions, which all files here meet, even without a record.
TextOf paths(Form const& form, bool isForTerminal) {
  return [hasConditions = !form.conditions.empty(), isForTerminal](Outcome const& outcome) {
    std::string const path = isForTerminal ? escapedPath(outcome.path) : outcome.path;
    bool const isListed = outcome.record || hasConditions;
    return isListed ? path + '\0' : std::string();
  };
}

std::unique_ptr<Writer> makeText(Form const& form, Output& output) {
  bool const isTerminal = output.isTerminal();
  auto const writer = [&output](TextOf textOf, char const* start, char const* separator) {
    return std::make_unique<TextWriter>(output, std::move(textOf), start, separator);
  };
  switch (form.kind) {  // each text ends its own line, except in a JSON array
    case FormKind::Json:
      output.enclose("[", "\n]\n");
      return writer(jsonObjects(form, isTerminal), "\n", ",\n");
    case FormKind::Jsonl:
      return writer(jsonObjects(form, isTerminal), "", "");
    case FormKind::Csv:
      output.add(csvHeader(form));
      return writer(csvRows(form, isTerminal), "", "");
    case FormKind::Paths:
      return writer(paths(form, isTerminal), "", "");
    case FormKind::Card:
      return writer([&form](Outcome const& outcome) { return cardOf(form, outcome); }, "", "\n");
    default:  // only Automatic with notes: tables do not come here
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
    prepare(outcome);
  }
}

std::unique_ptr<Writer> makeWriter(Form const& form, Output& output) {
  bool const isTable =  // a table of one photo becomes a card if the form is automatic
      form.kind == FormKind::Table || (form.kind == FormKind::Automatic && !form.hasNotes);
  auto writer = isTable ? makeTable(form, output) : makeText(form, output);
  if (form.sort == nullptr) {
    return writer;
  }
  return std::make_unique<SortingWriter>(form, std::move(writer));
}

}  // namespace app
