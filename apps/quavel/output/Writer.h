#ifndef QUAVEL_APPS_WRITER_H
#define QUAVEL_APPS_WRITER_H

#include <memory>

#include "output/Form.h"
#include "output/Output.h"

namespace app {

/// Writes the output in one form.
class Writer {
 public:
  Writer() = default;
  virtual ~Writer();
  Writer(Writer const&) = delete;
  Writer& operator=(Writer const&) = delete;

  /// Does the form's part of the work on one file, on any thread. Drops what is no longer needed.
  virtual void prepare(Outcome& outcome) const = 0;
  /// The same, but an exception becomes the file's problem.
  void prepareSafely(Outcome& outcome) const;
  /// Takes the prepared outcomes in the order of the output.
  virtual void add(Outcome&& outcome) = 0;
  /// Writes what is held back, because nothing else may come for a while.
  virtual void pause() {}
  virtual void end() {}
};

/// The writer for the form. Both arguments must outlive it.
std::unique_ptr<Writer> makeWriter(Form const& form, Output& output);

}  // namespace app

#endif  // QUAVEL_APPS_WRITER_H
