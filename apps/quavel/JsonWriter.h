#ifndef QUAVEL_APPS_JSONWRITER_H
#define QUAVEL_APPS_JSONWRITER_H

#include "Writer.h"

namespace app {

/// JSON objects, one a line, alone or as one array. An infinity, which JSON has no number for, is
/// the text "Infinity" or "-Infinity".
class JsonWriter : public Writer {
 public:
  /// Writes the array's head.
  JsonWriter(Options const& options, Output& output);

  void prepare(Outcome& outcome) const override;
  void add(Outcome&& outcome) override;
  void end() override;

 private:
  Fields fields_;
  bool showAbsent_;
  bool isArray_;
  bool isFirst_ = true;
  Output& output_;
};

}  // namespace app

#endif  // QUAVEL_APPS_JSONWRITER_H
