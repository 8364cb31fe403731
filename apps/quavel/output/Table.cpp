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

constexpr std::size_t kMostRows = 500;                      // in a page
constexpr auto kPageTime = std::chrono::milliseconds(200);  // a terminal waits no longer for a page
constexpr auto kFirstPageTime = std::chrono::milliseconds(12);  // seems to come at once

/// The folder that all paths in the column are in, with a "/" at its end; empty when there is none.
std::string commonFolder(std::vector<rows::Row> const& rows, std::size_t column) {
  std::string folder = rows.front()[column];
  for (auto const& row : rows) {
    std::string const& path = row[column];
    auto const difference = std::mismatch(folder.begin(), folder.end(), path.begin(), path.end());
    folder.erase(difference.first, folder.end());
    auto const lastSlash = folder.rfind('/');
    folder.resize(lastSlash == std::string::npos ? 0 : lastSlash + 1);
  }
  return folder.size() <= 2 ? "" : folder;  // such as "./": too short to save room
}

class Table : public Writer {
 public:
  Table(Form const& form, Output& output);

  void prepare(Outcome& outcome) const override;
  void add(Outcome&& outcome) override;
  void writeHeldBack() override;
  void end() override;

 private:
  void writePage(bool isLast);
  void layOutUncut(bool isLast);
  void layOutForTerminal();
  bool pageFitsLayout(std::size_t width) const;
  void writeHeader();
  Widths naturalWidths(bool mustShowEmpty = false) const;
  rows::Row asShown(rows::Row row) const;

  Form const& form_;
  Output& output_;
  std::vector<Column> columns_;
  bool isTerminal_;
  std::size_t pathColumn_ = 0;  // columns_.size() when the path is not shown
  std::size_t files_ = 0;
  std::atomic<bool> keepsRecords_{true};  // `prepare` drops them once the first file is added
  Outcome first_;  // with its record, because it becomes a card if no other file follows
  std::vector<rows::Row> page_;
  std::chrono::steady_clock::time_point pageStart_ = std::chrono::steady_clock::now();
  // The layout of the rows below the last header:
  Widths natural_;            // the uncut widths, 0 for an empty column; none before the first page
  Widths widths_;             // the columns' widths as shown
  std::size_t width_ = 0;     // the terminal's
  std::string folder_;        // stands above the header and is removed from the paths
  bool hasDaysOnly_ = false;  // dates are shown without the time
};

Table::Table(Form const& form, Output& output)
    : form_(form),
      output_(output),
      columns_(rows::columnsOf(form.fields)),
      isTerminal_(output.isTerminal()) {
  // The path's column is the only one that keeps its end when it is cut.
  while (pathColumn_ < columns_.size() && !columns_[pathColumn_].keepsEnd) {
    ++pathColumn_;
  }
}

void Table::prepare(Outcome& outcome) const {
  if (outcome.record) {
    outcome.cells = rows::rowOf(form_.fields, outcome);
    if (!keepsRecords_) {
      outcome.record.reset();
    }
  }
}

void Table::add(Outcome&& outcome) {
  if (++files_ == 1) {
    first_ = outcome;
    keepsRecords_ = false;
  }
  auto const now = std::chrono::steady_clock::now();
  bool const isFirstPage = natural_.empty();
  if (page_.empty() && !isFirstPage) {  // the first is timed from the start of the command
    pageStart_ = now;
  }
  if (!outcome.cells.empty()) {
    page_.push_back(std::move(outcome.cells));
  }
  auto const pageTime = isFirstPage ? kFirstPageTime : kPageTime;
  // Sorted rows come all at once, so no page needs to be short. A single file may become a card.
  bool const isDue = isTerminal_ && !form_.sort && files_ > 1 && now - pageStart_ > pageTime;
  if (page_.size() == kMostRows || isDue) {
    writePage(/*isLast=*/false);
  }
}

void Table::writeHeldBack() {
  if (isTerminal_ && files_ > 1) {
    writePage(/*isLast=*/false);
  }
}

void Table::end() {
  if (files_ == 1 && form_.kind == FormKind::Automatic) {
    output_.add(cardOf(form_, first_));
  } else {
    writePage(/*isLast=*/true);
  }
}

void Table::writePage(bool isLast) {
  if (page_.empty()) {
    return;
  }
  if (isTerminal_) {
    layOutForTerminal();
  } else {
    layOutUncut(isLast);
  }
  for (auto& row : page_) {
    row = asShown(std::move(row));
    std::replace(row.begin(), row.end(), std::string(), std::string("-"));
    output_.add(lineOf(columns_, widths_, row));
  }
  page_.clear();
}

/// One header serves all pages, so an empty column is left out only if there is just one page.
void Table::layOutUncut(bool isLast) {
  bool const isFirst = natural_.empty();
  Widths const ofPage = naturalWidths(/*mustShowEmpty=*/!(isFirst && isLast));
  natural_.resize(ofPage.size());
  for (std::size_t i = 0; i < ofPage.size(); ++i) {
    natural_[i] = std::max(natural_[i], ofPage[i]);
  }
  widths_ = natural_;
  if (isFirst) {
    writeHeader();
  }
}

/// Leaves out what does not fit: the common folder, then parts of cells, then times, then columns.
void Table::layOutForTerminal() {
  std::size_t const width = terminalWidth(STDOUT_FILENO);
  if (pageFitsLayout(width)) {
    return;
  }
  output_.add(natural_.empty() ? "" : "\n");  // a blank line between two layouts
  width_ = width;
  folder_.clear();
  hasDaysOnly_ = false;
  natural_ = naturalWidths();  // with whole paths and dates
  if (lineWidth(natural_) > width && pathColumn_ < columns_.size()) {
    folder_ = commonFolder(page_, pathColumn_);
    natural_ = naturalWidths();  // without the folder
  }
  widths_ = fit(columns_, natural_, width);
  auto const hidden = [](Widths const& all) { return std::count(all.begin(), all.end(), 0U); };
  bool const dropsColumns = hidden(widths_) > hidden(natural_);
  if (dropsColumns && form_.fields.empty()) {  // `dropTime` knows the default columns only
    hasDaysOnly_ = true;
    natural_ = naturalWidths();
    widths_ = fit(columns_, natural_, width);
  }
  output_.add(folder_.empty() ? "" : "In " + folder_ + "\n");
  writeHeader();
}

bool Table::pageFitsLayout(std::size_t width) const {
  auto const isInFolder = [this](rows::Row const& row) {
    return folder_.empty() || row[pathColumn_].compare(0, folder_.size(), folder_) == 0;
  };
  if (width != width_ || !std::all_of(page_.begin(), page_.end(), isInFolder)) {
    return false;
  }
  Widths const natural = naturalWidths();
  return std::equal(natural.begin(), natural.end(), natural_.begin(), natural_.end(),
                    std::less_equal<>());  // no column is wider than in the layout
}

void Table::writeHeader() {
  std::vector<std::string> labels;
  for (auto const& column : columns_) {
    labels.push_back(column.label);
  }
  output_.add(lineOf(columns_, widths_, labels));
}

/// The widths that hold the page's texts uncut, as `asShown` gives them; 0 hides an empty column.
Widths Table::naturalWidths(bool mustShowEmpty) const {
  bool const areFieldsChosen = !form_.fields.empty();  // empty columns then show by default
  bool const showEmpty = mustShowEmpty || form_.showAbsent.value_or(areFieldsChosen);
  Widths natural(columns_.size(), 0);
  for (auto const& row : page_) {
    auto const shown = asShown(row);
    for (std::size_t i = 0; i < shown.size(); ++i) {
      natural[i] = std::max(natural[i], widthOf(shown[i]));
    }
  }
  for (std::size_t i = 0; i < natural.size(); ++i) {
    if (natural[i] > 0 || showEmpty) {
      natural[i] = std::max(natural[i], columns_[i].label.size());
    }
  }
  return natural;
}

rows::Row Table::asShown(rows::Row row) const {
  if (!folder_.empty()) {
    row[pathColumn_].erase(0, folder_.size());
  }
  if (hasDaysOnly_) {
    rows::dropTime(row);
  }
  return row;
}

}  // namespace

std::unique_ptr<Writer> makeTable(Form const& form, Output& output) {
  return std::make_unique<Table>(form, output);
}

}  // namespace app
