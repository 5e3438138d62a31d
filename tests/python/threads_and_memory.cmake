# The tests of threads and memory that take long, each as a test of its own. Their short forms run
# with all the others.
add_library(library_observer MODULE library_observer.cpp)
target_link_libraries(library_observer PRIVATE tessel_warnings PkgConfig::netcdf ${CMAKE_DL_LIBS})
target_link_options(library_observer PRIVATE LINKER:--no-as-needed) # its functions come next
list(APPEND TESSEL_PYTHON_TEST_ENVIRONMENT TESSEL_OBSERVER=$<TARGET_FILE:library_observer>)

set(pytest ${Python3_EXECUTABLE} -B -m pytest -q -p no:cacheprovider)
add_test(NAME python.threads_for_a_minute COMMAND ${pytest}
    ${CMAKE_CURRENT_SOURCE_DIR}/test_threads.py -k different_and_the_same_files)
set_tests_properties(python.threads_for_a_minute PROPERTIES
    ENVIRONMENT "${TESSEL_PYTHON_TEST_ENVIRONMENT};TESSEL_THREAD_SECONDS=60")
add_test(NAME python.a_million_calls COMMAND ${pytest}
    ${CMAKE_CURRENT_SOURCE_DIR}/test_memory.py -k mixed_calls)
set_tests_properties(python.a_million_calls PROPERTIES
    ENVIRONMENT "${TESSEL_PYTHON_TEST_ENVIRONMENT};TESSEL_MIXED_CALLS=1000000")
set_tests_properties(python.threads_for_a_minute python.a_million_calls PROPERTIES
    LABELS "python;long")
