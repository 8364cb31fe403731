#ifndef QUAVEL_APPS_WRITER_H
#define QUAVEL_APPS_WRITER_H

#include <memory>

#include "output/Form.h"
#include "output/Output.h"

namespace app {

/// Writes the output in one form.
class Writer {
 public:
  virtual ~Writer() = default;

  /// Sets the outcome's text or cells; may drop what `add` does not need. Called on any thread.
  virtual void prepare(Outcome& outcome) const = 0;
  /// The same, but an exception becomes the outcome's `problem`.
  void prepareOrSetProblem(Outcome& outcome) const;
  /// Takes a prepared outcome, in the order of the output.
  virtual void add(Outcome&& outcome) = 0;
  /// Writes what is held back. Called when the next outcome may take a while.
  virtual void writeHeldBack() {}
  virtual void end() {}
};

/// The writer for the form. Both arguments must outlive it.
std::unique_ptr<Writer> makeWriter(Form const& form, Output& output);

}  // namespace app

#endif  // QUAVEL_APPS_WRITER_H
