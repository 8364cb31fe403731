#include "output/Writer.h"

#include <algorithm>
#include <exception>

#include "output/CardWriter.h"
#include "output/CsvWriter.h"
#include "output/JsonWriter.h"
#include "output/TableWriter.h"

namespace app {

namespace {

bool isAbsent(Value const& value) { return std::holds_alternative<std::monostate>(value); }

/// Keeps all outcomes and hands them to another writer in the order of a field.
class SortingWriter : public Writer {
 public:
  SortingWriter(Field const& field, std::unique_ptr<Writer> next)
      : field_(field), next_(std::move(next)) {}

  void prepare(Outcome&) const override {}
  void add(Outcome&& outcome) override { outcomes_.push_back(std::move(outcome)); }
  void end() override;

 private:
  Field const& field_;
  std::unique_ptr<Writer> next_;
  std::vector<Outcome> outcomes_;
};

void SortingWriter::end() {
  auto const value = field_.value;
  std::stable_sort(outcomes_.begin(), outcomes_.end(), [value](Outcome const& a, Outcome const& b) {
    Value const left = value(a);
    Value const right = value(b);
    if (isAbsent(left) || isAbsent(right)) {
      return !isAbsent(left) && isAbsent(right);  // what has no value comes last
    }
    return left < right;
  });
  for (auto& outcome : outcomes_) {
    next_->prepareSafely(outcome);
    next_->add(std::move(outcome));
    outcome = {};
  }
  next_->end();
}

std::unique_ptr<Writer> makeUnsorted(Form const& form, Output& output) {
  switch (form.kind) {
    case FormKind::Json:
    case FormKind::Jsonl:
      return std::make_unique<JsonWriter>(form, output);
    case FormKind::Csv:
      return std::make_unique<CsvWriter>(form, output);
    case FormKind::Card:
      return std::make_unique<CardWriter>(form, output);
    default:
      return std::make_unique<TableWriter>(form, output);
  }
}

}  // namespace

Writer::~Writer() = default;

void Writer::prepareSafely(Outcome& outcome) const {
  try {
    prepare(outcome);
  } catch (std::exception const& error) {
    Outcome failed;
    failed.path = std::move(outcome.path);
    failed.error = std::string("cannot be shown: ") + error.what();
    outcome = std::move(failed);
    prepare(outcome);
  }
}

std::unique_ptr<Writer> makeWriter(Form const& form, Output& output) {
  auto writer = makeUnsorted(form, output);
  if (form.sort == nullptr) {
    return writer;
  }
  return std::make_unique<SortingWriter>(*form.sort, std::move(writer));
}

}  // namespace app
