#ifndef QUAVEL_PYTHON_UNLOCKED_H
#define QUAVEL_PYTHON_UNLOCKED_H

#include <Python.h>
#include <unistd.h>

namespace binding {

/// Python may unwind a thread to end it once the interpreter has ended. That cannot pass a
/// destructor, nor could a destructor still release objects. So the thread waits for the process to
/// end.
[[noreturn]] inline void waitForTheEnd() {
  while (true) {
    ::pause();
  }
}

/// While it lives, the thread does not hold the GIL.
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
