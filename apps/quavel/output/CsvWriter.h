#ifndef QUAVEL_APPS_CSVWRITER_H
#define QUAVEL_APPS_CSVWRITER_H

#include "output/Writer.h"

namespace app {

/// Comma-separated values by RFC 4180, with a header row; absent values are empty.
class CsvWriter : public Writer {
 public:
  /// Adds the header row.
  CsvWriter(Form const& form, Output& output);

  void prepare(Outcome& outcome) const override;
  void add(Outcome&& outcome) override;

 private:
  Fields fields_;
  Output& output_;
};

}  // namespace app

#endif  // QUAVEL_APPS_CSVWRITER_H
