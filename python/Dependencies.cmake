# What the Python bindings need: pybind11 and the headers of the interpreter
# they are for. Debian's /usr/bin/python3 is the default interpreter: it is
# the one that sees Debian's numpy, scipy, pytest and pybind11, which a
# python3 earlier on PATH may not.
if(NOT DEFINED Python3_EXECUTABLE AND EXISTS /usr/bin/python3)
    set(Python3_EXECUTABLE /usr/bin/python3 CACHE FILEPATH "The Python interpreter of the bindings")
endif()
find_package(Python3 QUIET COMPONENTS Interpreter Development.Module)
if(Python3_FOUND)
    find_package(pybind11 2.6 CONFIG QUIET)
endif()
set(KESTACCEL_PYTHON_FOUND OFF)
if(Python3_FOUND AND pybind11_FOUND)
    set(KESTACCEL_PYTHON_FOUND ON)
endif()
