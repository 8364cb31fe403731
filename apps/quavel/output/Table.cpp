#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <functional>

#include "output/Forms.h"
#include "output/Layout.h"
#include "photo/Words.h"
#include "terminal/Console.h"
#include "terminal/Text.h"

namespace app {

namespace {

constexpr std::size_t kPage = 500;
constexpr auto kPatience = std::chrono::milliseconds(200);
constexpr auto kFirstPatience = std::chrono::milliseconds(12);  // then a user sees that it works
constexpr std::size_t kLeastChosen = 6;

std::vector<Column> defaultColumns() {
  return {{"File", 20, 0, true},     {"Captured", 16, 1, false}, {"Size", 9, 2, false},
          {"Orient.", 7, 4, false},  {"Camera", 12, 5, false},   {"Lens", 12, 6, false},
          {"Exposure", 24, 3, false}};
}

std::string word(std::string_view name, Outcome const& outcome) {
  return inWords(*fieldNamed(name), outcome);
}

/// Without the seconds, for which a table has no room.
std::string minutes(std::string const& date) {
  bool const isWellMade = date.size() == 19 && date[4] == '-' && date[13] == ':' && date[16] == ':';
  return isWellMade ? date.substr(0, 16) : date;
}

std::string withoutVerb(std::string const& orientation) {
  constexpr std::string_view kVerb = "turn ";
  return orientation.compare(0, kVerb.size(), kVerb) == 0 ? orientation.substr(kVerb.size())
                                                          : orientation;
}

std::vector<std::string> defaultCells(Outcome const& outcome) {
  return {escaped(outcome.path),           minutes(word("captureDate", outcome)),
          words::size(*outcome.record),    withoutVerb(word("orientation", outcome)),
          word("model", outcome),          word("lensModel", outcome),
          words::exposure(*outcome.record)};
}

std::vector<Column> columnsOf(Fields const& fields) {
  std::vector<Column> columns;
  for (auto const* field : fields) {
    columns.push_back({field->label, kLeastChosen, 0, field->name == "path"});
  }
  return columns;
}

bool isWithin(Widths const& inner, Widths const& outer) {
  return std::equal(inner.begin(), inner.end(), outer.begin(), outer.end(), std::less_equal<>());
}

class Table : public Writer {
 public:
  Table(Form const& form, Output& output);

  void prepare(Outcome& outcome) const override;
  void add(Outcome&& outcome) override;
  void pause() override;
  void end() override;

 private:
  std::vector<std::string> cellsOf(Outcome const& outcome) const;
  void writePage();
  Widths naturalWidths() const;
  void useLayout(Widths const& natural);

  Form const& form_;
  Output& output_;
  std::vector<Column> columns_;
  std::vector<std::vector<std::string>> page_;
  std::chrono::steady_clock::time_point pageStart_ = std::chrono::steady_clock::now();
  std::size_t files_ = 0;
  std::atomic<bool> isCardLikely_{true};  // no file has come yet: records are kept
  Outcome first_;
  std::size_t line_ = 0;
  Widths natural_;  // of the layout in use
  Widths widths_;
};

Table::Table(Form const& form, Output& output)
    : form_(form),
      output_(output),
      columns_(form.fields.empty() ? defaultColumns() : columnsOf(form.fields)) {}

void Table::prepare(Outcome& outcome) const {
  if (outcome.record) {
    outcome.cells = cellsOf(outcome);
    if (!isCardLikely_) {
      outcome.record.reset();
    }
  }
}

std::vector<std::string> Table::cellsOf(Outcome const& outcome) const {
  if (form_.fields.empty()) {
    return defaultCells(outcome);
  }
  std::vector<std::string> cells;
  for (auto const* field : form_.fields) {
    cells.push_back(inWords(*field, outcome));
  }
  return cells;
}

void Table::add(Outcome&& outcome) {
  if (++files_ == 1) {
    first_ = outcome;
    isCardLikely_ = false;
  }
  auto const now = std::chrono::steady_clock::now();
  if (page_.empty() && !natural_.empty()) {
    pageStart_ = now;
  }
  if (!outcome.cells.empty()) {
    page_.push_back(std::move(outcome.cells));
  }
  auto const patience = natural_.empty() ? kFirstPatience : kPatience;
  if (page_.size() == kPage || (files_ > 1 && now - pageStart_ > patience)) {
    writePage();
  }
}

void Table::pause() {
  if (files_ > 1) {
    writePage();
  }
}

void Table::end() {
  if (files_ == 1) {
    output_.add(cardOf(form_, first_));
  } else {
    writePage();
  }
}

void Table::writePage() {
  if (page_.empty()) {
    return;
  }
  useLayout(naturalWidths());
  for (auto& cells : page_) {
    std::replace(cells.begin(), cells.end(), std::string(), std::string("-"));
    output_.add(lineOf(columns_, widths_, cells));
  }
  page_.clear();
}

Widths Table::naturalWidths() const {
  Widths natural(columns_.size(), 0);
  for (std::size_t i = 0; i < columns_.size(); ++i) {
    for (auto const& cells : page_) {
      natural[i] = std::max(natural[i], app::cells(cells[i]));
    }
    if (natural[i] > 0 || form_.showAbsent.value_or(!form_.fields.empty())) {
      natural[i] = std::max(natural[i], columns_[i].label.size());
    }
  }
  return natural;
}

void Table::useLayout(Widths const& natural) {
  std::size_t const line = output_.isTerminal() ? terminalWidth(STDOUT_FILENO) : kUnlimited;
  if (line == line_ && isWithin(natural, natural_)) {
    return;
  }
  if (!natural_.empty()) {
    output_.add("\n");
  }
  line_ = line;
  natural_ = natural;
  widths_ = fit(columns_, natural, line);
  std::vector<std::string> labels;
  for (auto const& column : columns_) {
    labels.push_back(column.label);
  }
  output_.add(lineOf(columns_, widths_, labels));
}

}  // namespace

std::unique_ptr<Writer> makeTable(Form const& form, Output& output) {
  return std::make_unique<Table>(form, output);
}

}  // namespace app
