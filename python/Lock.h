#ifndef WORDCATCHER_PYTHON_LOCK_H
#define WORDCATCHER_PYTHON_LOCK_H

#include <pybind11/pybind11.h>
#include <unistd.h>

#include <exception>

namespace wordcatcher::python {

/// Calls what waits for Python's lock or runs a program's Python code.
///
/// When the interpreter ends, Python ends a daemon thread in such a call by pthread_exit(), which
/// unwinds the thread's stack. A C++ stack cannot be unwound so: a destructor or a catch (...) on
/// it ends the process with an abort, and others release Python objects without the lock. Such a
/// thread stays here instead, for the short time until the process is gone.
///
/// What the function itself throws has to be a std::exception.
template <typename Function>
auto callPython(const Function& function) {
  try {
    return function();
  } catch (const std::exception&) {
    throw;
  } catch (...) {
    // Caught by its type, abi::__forced_unwind, it would be a reference to nothing.
    while (true) {
      ::pause();
    }
  }
}

/// Python's lock is given up as long as it lives, so that other Python threads run.
class Unlocked {
 public:
  Unlocked() : _state(PyEval_SaveThread()) {}
  ~Unlocked() { lock(); }
  Unlocked(const Unlocked&) = delete;
  Unlocked& operator=(const Unlocked&) = delete;

  /// Calls something with the lock.
  template <typename Function>
  void withLock(const Function& function) {
    lock();
    try {
      function();
    } catch (...) {
      _state = PyEval_SaveThread();
      throw;
    }
    _state = PyEval_SaveThread();
  }

 private:
  // PyGILState_Ensure() and what pybind11 makes of it would make a thread state when Python has
  // thrown this one away, for which there is no interpreter any more.
  void lock() {
    callPython([this] { PyEval_RestoreThread(_state); });
  }

  PyThreadState* _state;
};

}  // namespace wordcatcher::python

#endif
