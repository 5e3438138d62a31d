# What Python programs do with threads, under the thread sanitizer.
#
# The interpreter, NumPy and the netCDF library are not compiled for it. It sees their locks and
# threads all the same, and what they allocate, copy, read and write by functions of the C library;
# of their own variables it sees nothing.
set(environment ${TESSEL_PYTHON_TEST_ENVIRONMENT}
    "TSAN_OPTIONS=atexit_sleep_ms=100 suppressions=${CMAKE_CURRENT_SOURCE_DIR}/thread_sanitizer.txt")
set(tests threads.python)
add_test(NAME threads.python # what the sanitizer says is not to be captured with a test's output
    COMMAND ${pytest} --capture=sys -m "not without_sanitizers" test_threads.py test_exit.py
        test_xarray_engine.py test_xarray_writing.py
    WORKING_DIRECTORY ${CMAKE_CURRENT_SOURCE_DIR})

# That it would say something: calls that no lock protects are a race, and those that the host's or the
# interpreter's does are none.
foreach(lock host interpreter nobody)
    list(APPEND tests threads.python_lock_of_${lock})
    add_test(NAME threads.python_lock_of_${lock}
        COMMAND ${Python3_EXECUTABLE} -B ${CMAKE_CURRENT_SOURCE_DIR}/counting.py
            $<TARGET_FILE:module_counter> ${lock})
endforeach()
set_tests_properties(${tests} PROPERTIES LABELS "python;threads" ENVIRONMENT "${environment}")
set_tests_properties(threads.python_lock_of_nobody PROPERTIES
    PASS_REGULAR_EXPRESSION "ThreadSanitizer: data race[^#]*#0 tsxFunction")
