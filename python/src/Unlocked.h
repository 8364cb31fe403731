#ifndef QUAVEL_PYTHON_UNLOCKED_H
#define QUAVEL_PYTHON_UNLOCKED_H

#include <Python.h>
#include <unistd.h>

namespace binding {

/// For a thread that Python ends by unwinding it, since the interpreter has ended: no destructor
/// lets that through, nor could one let go of an object. The process is about to end.
[[noreturn]] inline void waitForTheEnd() {
  while (true) {
    ::pause();
  }
}

/// While it lives, the thread does without the interpreter's lock.
class Unlocked {
 public:
  Unlocked() : state_(PyEval_SaveThread()) {}
  Unlocked(Unlocked const&) = delete;
  Unlocked& operator=(Unlocked const&) = delete;
  ~Unlocked() {
    try {
      PyEval_RestoreThread(state_);
    } catch (...) {
      waitForTheEnd();
    }
  }

 private:
  PyThreadState* state_;
};

}  // namespace binding

#endif  // QUAVEL_PYTHON_UNLOCKED_H
