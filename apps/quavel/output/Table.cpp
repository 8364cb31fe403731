#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <functional>

#include "output/Forms.h"
#include "output/Layout.h"
#include "output/Rows.h"
#include "terminal/Console.h"
#include "terminal/Text.h"

namespace app {

namespace {

constexpr std::size_t kPage = 500;  // rows
constexpr auto kFlushInterval = std::chrono::milliseconds(200);
constexpr auto kFirstFlushInterval = std::chrono::milliseconds(12);  // so that rows show soon

/// The folder that all paths of the rows are in, with a "/" at its end; empty when there is none.
std::string commonFolder(std::vector<std::vector<std::string>> const& rows, std::size_t column) {
  std::string folder = rows.front()[column];
  for (auto const& row : rows) {
    std::string const& path = row[column];
    auto const difference = std::mismatch(folder.begin(), folder.end(), path.begin(), path.end());
    folder.erase(difference.first, folder.end());
    folder.erase(folder.rfind('/') + 1);  // everything, if there is no "/"
  }
  return folder.size() <= 2 ? "" : folder;  // such as "./": too short to save room
}

class Table : public Writer {
 public:
  Table(Form const& form, Output& output);

  void prepare(Outcome& outcome) const override;
  void add(Outcome&& outcome) override;
  void pause() override;
  void end() override;

 private:
  void writePage(bool isLast);
  void widen(bool isLast);
  void fitTerminal();
  bool fitsLayout(std::size_t line) const;
  void writeHeader();
  Widths naturalWidths(bool showAll) const;
  std::vector<std::string> inLayout(std::vector<std::string> cells) const;

  Form const& form_;
  Output& output_;
  std::vector<Column> columns_;
  std::vector<std::vector<std::string>> page_;
  std::chrono::steady_clock::time_point pageStart_ = std::chrono::steady_clock::now();
  std::size_t files_ = 0;
  std::atomic<bool> isCardLikely_{true};  // false once a file is added; records are kept until then
  Outcome first_;                         // becomes a card if no other file follows
  bool isTerminal_;
  std::size_t pathColumn_ = 0;  // columns_.size() when there is none
  std::size_t line_ = 0;        // the terminal's width in the layout in use
  std::string folder_;          // of all paths, when it stands above the table
  bool hasDaysOnly_ = false;    // dates are shown without the time
  Widths natural_;              // in the layout in use; empty before the first page
  Widths widths_;
};

Table::Table(Form const& form, Output& output)
    : form_(form),
      output_(output),
      columns_(rows::columnsOf(form.fields)),
      isTerminal_(output.isTerminal()) {
  while (pathColumn_ < columns_.size() && !columns_[pathColumn_].keepsEnd) {
    ++pathColumn_;
  }
}

void Table::prepare(Outcome& outcome) const {
  if (outcome.record) {
    outcome.cells = rows::cellsOf(form_.fields, outcome);
    if (!isCardLikely_) {
      outcome.record.reset();
    }
  }
}

void Table::add(Outcome&& outcome) {
  if (++files_ == 1) {
    first_ = outcome;
    isCardLikely_ = false;
  }
  auto const now = std::chrono::steady_clock::now();
  if (page_.empty() && !natural_.empty()) {  // the first page started with the command
    pageStart_ = now;
  }
  if (!outcome.cells.empty()) {
    page_.push_back(std::move(outcome.cells));
  }
  auto const interval = natural_.empty() ? kFirstFlushInterval : kFlushInterval;
  // Sorted rows come all at once, so no page needs to be short. A first file may become a card.
  bool const isDue =
      isTerminal_ && form_.sort == nullptr && files_ > 1 && now - pageStart_ > interval;
  if (page_.size() == kPage || isDue) {
    writePage(false);
  }
}

void Table::pause() {
  if (isTerminal_ && files_ > 1) {
    writePage(false);
  }
}

void Table::end() {
  if (files_ == 1 && form_.kind == FormKind::Automatic) {
    output_.add(cardOf(form_, first_));
  } else {
    writePage(true);
  }
}

void Table::writePage(bool isLast) {
  if (page_.empty()) {
    return;
  }
  if (isTerminal_) {
    fitTerminal();
  } else {
    widen(isLast);
  }
  for (auto& row : page_) {
    row = inLayout(std::move(row));
    std::replace(row.begin(), row.end(), std::string(), std::string("-"));
    output_.add(lineOf(columns_, widths_, row));
  }
  page_.clear();
}

/// One header serves all pages, so an empty column is left out only if there is just one page.
void Table::widen(bool isLast) {
  bool const isFirst = natural_.empty();
  Widths const natural = naturalWidths(!(isFirst && isLast));
  natural_.resize(columns_.size());
  std::transform(natural.begin(), natural.end(), natural_.begin(), natural_.begin(),
                 [](std::size_t a, std::size_t b) { return std::max(a, b); });
  widths_ = natural_;
  if (isFirst) {
    writeHeader();
  }
}

/// Leaves out what does not fit: the common folder, then parts of cells, then times, then columns.
void Table::fitTerminal() {
  std::size_t const line = terminalWidth(STDOUT_FILENO);
  if (fitsLayout(line)) {
    return;
  }
  output_.add(natural_.empty() ? "" : "\n");
  line_ = line;
  folder_.clear();
  hasDaysOnly_ = false;
  natural_ = naturalWidths(false);
  if (lineWidth(natural_) > line && pathColumn_ < columns_.size()) {
    folder_ = commonFolder(page_, pathColumn_);
    natural_ = naturalWidths(false);
  }
  widths_ = fit(columns_, natural_, line);
  auto const hidden = [](Widths const& all) { return std::count(all.begin(), all.end(), 0U); };
  if (form_.fields.empty() && hidden(widths_) > hidden(natural_)) {
    hasDaysOnly_ = true;
    natural_ = naturalWidths(false);
    widths_ = fit(columns_, natural_, line);
  }
  output_.add(folder_.empty() ? "" : "In " + folder_ + "\n");
  writeHeader();
}

bool Table::fitsLayout(std::size_t line) const {
  auto const isInFolder = [this](std::vector<std::string> const& row) {
    return folder_.empty() || row[pathColumn_].compare(0, folder_.size(), folder_) == 0;
  };
  Widths const natural = naturalWidths(false);
  return line == line_ && std::all_of(page_.begin(), page_.end(), isInFolder) &&
         std::equal(natural.begin(), natural.end(), natural_.begin(), natural_.end(),
                    std::less_equal<>());  // no column is wider than in the layout
}

void Table::writeHeader() {
  std::vector<std::string> labels;
  for (auto const& column : columns_) {
    labels.push_back(column.label);
  }
  output_.add(lineOf(columns_, widths_, labels));
}

Widths Table::naturalWidths(bool showAll) const {
  bool const showAbsent = showAll || form_.showAbsent.value_or(!form_.fields.empty());
  Widths natural(columns_.size(), 0);
  for (auto const& row : page_) {
    auto const shown = inLayout(row);
    for (std::size_t i = 0; i < shown.size(); ++i) {
      natural[i] = std::max(natural[i], app::cells(shown[i]));
    }
  }
  for (std::size_t i = 0; i < natural.size(); ++i) {
    if (natural[i] > 0 || showAbsent) {
      natural[i] = std::max(natural[i], columns_[i].label.size());
    }
  }
  return natural;
}

std::vector<std::string> Table::inLayout(std::vector<std::string> cells) const {
  if (!folder_.empty()) {
    cells[pathColumn_].erase(0, folder_.size());
  }
  if (hasDaysOnly_) {
    rows::dropTime(cells);
  }
  return cells;
}

}  // namespace

std::unique_ptr<Writer> makeTable(Form const& form, Output& output) {
  return std::make_unique<Table>(form, output);
}

}  // namespace app
