# What every target is compiled with.

add_library(tessel_warnings INTERFACE)
target_compile_options(tessel_warnings INTERFACE
    -Wall -Wextra -Wpedantic -Werror -Wconversion -Wsign-conversion -Wshadow -Wold-style-cast
    -Wnon-virtual-dtor -Woverloaded-virtual -Wcast-align -Wformat=2 -Wno-format-nonliteral)

# For what stands between the caller and the library: its many calls across files go straight to where
# the loader found the functions, and not by way of a table of jumps. That is a tenth of an inquiry.
add_library(tessel_direct_calls INTERFACE)
target_compile_options(tessel_direct_calls INTERFACE -fno-plt)

# A call passes through many small functions, which can be inlined wherever they stand.
function(tessel_inline_across_files)
    if(CMAKE_CXX_COMPILER_ID STREQUAL GNU AND NOT TESSEL_SANITIZE)
        set_target_properties(${ARGN} PROPERTIES INTERPROCEDURAL_OPTIMIZATION_RELWITHDEBINFO ON)
        foreach(target ${ARGN})
            target_compile_options(${target} PRIVATE -fno-semantic-interposition)
        endforeach()
    endif()
endfunction()

add_library(tessel_sanitizers INTERFACE)
if(TESSEL_SANITIZE)
    set(flags -fsanitize=${TESSEL_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer)
    target_compile_options(tessel_sanitizers INTERFACE ${flags})
    target_link_options(tessel_sanitizers INTERFACE ${flags})
endif()
if(TESSEL_COVERAGE)
    target_compile_options(tessel_sanitizers INTERFACE --coverage)
    target_link_options(tessel_sanitizers INTERFACE --coverage)
endif()
target_link_libraries(tessel_warnings INTERFACE tessel_sanitizers)
