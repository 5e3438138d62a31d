// python/src/others_run.hpp: letting other threads of Python's run, and not running when the
// interpreter ends.
//
// A daemon thread that wants the interpreter when that is ending is ended instead, by unwinding its
// stack. In C++ this would be the end of the process, where it meets a destructor, and on its way
// it would let go of Python's objects without the interpreter's lock. So such a thread stops where
// it is: it waits for the process to end, which is what Python itself has done since 3.14.
#pragma once

#include <pybind11/pybind11.h>

#include <unistd.h>

namespace tessel::python {

/// What `work` gives, in which no object of C++ may need to be destroyed when it does not come
/// back. It calls functions of Python's, out of which no exception of C++ comes: what is caught is
/// the unwinding.
template <class Work>
auto orStop(const Work &work) {
    try {
        return work();
    } catch (...) {
        while (true) {
            pause();
        }
    }
}

/// Lets other threads of Python's run.
class OthersRun {
  public:
    OthersRun() noexcept : state(PyEval_SaveThread()) {}
    ~OthersRun() {
        orStop([this] { PyEval_RestoreThread(state); });
    }
    OthersRun(const OthersRun &) = delete;
    OthersRun &operator=(const OthersRun &) = delete;

  private:
    PyThreadState *state;
};

/// What a function of Python's gives. Until it does, other threads may run.
inline pybind11::object called(pybind11::handle function, const pybind11::tuple &arguments) {
    PyObject *const given =
        orStop([&] { return PyObject_CallObject(function.ptr(), arguments.ptr()); });
    if (given == nullptr) {
        throw pybind11::error_already_set();
    }
    return pybind11::reinterpret_steal<pybind11::object>(given);
}

} // namespace tessel::python
