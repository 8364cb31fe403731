#ifndef QUAVEL_APPS_TABLEWRITER_H
#define QUAVEL_APPS_TABLEWRITER_H

#include <atomic>
#include <chrono>

#include "output/Layout.h"
#include "output/Writer.h"

namespace app {

/// A table for people, laid out page by page so that no more than a page is ever held. On a
/// terminal it fits the width; elsewhere nothing is cut. A single file becomes a card.
class TableWriter : public Writer {
 public:
  TableWriter(Form const& form, Output& output);

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

}  // namespace app

#endif  // QUAVEL_APPS_TABLEWRITER_H
