# Finds a Python 3 that has NumPy: the first python3 on PATH is often one of its own without it.
# Sets Python3_EXECUTABLE unless it was given.

if(NOT Python3_EXECUTABLE)
    string(REPLACE ":" ";" folders "/usr/bin:$ENV{PATH}")
    list(TRANSFORM folders APPEND /python3 OUTPUT_VARIABLE candidates)
    list(REMOVE_DUPLICATES candidates)
    foreach(candidate IN LISTS candidates)
        execute_process(
            COMMAND ${candidate} -c "import numpy, sys; print(sys.executable, end='')"
            RESULT_VARIABLE failed OUTPUT_VARIABLE executable ERROR_QUIET)
        if(NOT failed)
            set(Python3_EXECUTABLE ${executable})
            break()
        endif()
    endforeach()
    if(NOT Python3_EXECUTABLE)
        message(FATAL_ERROR "No python3 with NumPy among ${candidates}: install python3-numpy, "
                            "give -DPython3_EXECUTABLE=..., or leave the Python package out with "
                            "-DTESSEL_PYTHON=OFF")
    endif()
endif()
