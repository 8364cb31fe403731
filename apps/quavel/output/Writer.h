#ifndef QUAVEL_APPS_WRITER_H
#define QUAVEL_APPS_WRITER_H

#include <memory>

#include "output/Form.h"
#include "output/Output.h"

namespace app {

/// A form of the output.
class Writer {
 public:
  Writer() = default;
  virtual ~Writer();
  Writer(Writer const&) = delete;
  Writer& operator=(Writer const&) = delete;

  /// Does the form's part of the work on one file, on any thread. Drops the record.
  virtual void prepare(Outcome& outcome) const = 0;
  /// The same, but a failure becomes the error of the file and ends nothing.
  void prepareSafely(Outcome& outcome) const;
  /// Takes the prepared outcomes in the order of the output.
  virtual void add(Outcome&& outcome) = 0;
  /// Writes what was held back: nothing else may come for a while.
  virtual void pause() {}
  /// Called at the end.
  virtual void end() {}
};

/// The writer for the form. Both arguments must outlive it.
std::unique_ptr<Writer> makeWriter(Form const& form, Output& output);

}  // namespace app

#endif  // QUAVEL_APPS_WRITER_H
