// Arrays: NumPy arrays as the package hands them over, and the interpreter lock while they are worked on.
#ifndef MORVIK_BINDINGS_PYTHON_MODULE_ARRAYS_H
#define MORVIK_BINDINGS_PYTHON_MODULE_ARRAYS_H

#include <pybind11/numpy.h>
#include <unistd.h>

#include <cstddef>

namespace morvik::python {

template <class Element>
using Array = pybind11::array_t<Element, pybind11::array::c_style>;

inline std::size_t sizeOf(pybind11::ssize_t extent)
{
    return static_cast<std::size_t>(extent);
}

/// Releases the interpreter lock during its lifetime. If the interpreter has ended meanwhile, because this is a daemon
/// thread, asking for the lock would unwind the thread, through owners of objects that must no longer be touched.
/// Instead, the thread sleeps until the process ends.
class Unlocked {
public:
    Unlocked() : itsThread(PyEval_SaveThread()) {}

    ~Unlocked()
    {
        try {
            PyEval_RestoreThread(itsThread);
        } catch (...) {
            for (;;) {
                pause();
            }
        }
    }

    Unlocked(const Unlocked&) = delete;
    Unlocked& operator=(const Unlocked&) = delete;

private:
    PyThreadState* itsThread;
};

}  // namespace morvik::python

#endif
