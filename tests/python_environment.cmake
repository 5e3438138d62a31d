# Sets Python3_EXECUTABLE, and TESSEL_PYTHON_TEST_ENVIRONMENT, with which tests run the package of
# this build tree.
include(${CMAKE_SOURCE_DIR}/python/find_python.cmake)
set(TESSEL_PYTHON_TEST_ENVIRONMENT PYTHONPATH=${CMAKE_BINARY_DIR}/python)
if(TESSEL_SANITIZE)
    # The interpreter is not built for the sanitizer, whose library must then come first, and with
    # it the C++ library, in which it looks for the function that throws. The interpreter does not
    # free all that it allocated; that is not ours to report.
    set(sanitizer asan)
    if(TESSEL_SANITIZE STREQUAL thread)
        set(sanitizer tsan)
    endif()
    foreach(name ${sanitizer} stdc++)
        execute_process(COMMAND ${CMAKE_CXX_COMPILER} -print-file-name=lib${name}.so
            OUTPUT_VARIABLE ${name} OUTPUT_STRIP_TRAILING_WHITESPACE)
    endforeach()
    list(APPEND TESSEL_PYTHON_TEST_ENVIRONMENT
        LD_PRELOAD=${${sanitizer}}:${stdc++} ASAN_OPTIONS=detect_leaks=0)
endif()
