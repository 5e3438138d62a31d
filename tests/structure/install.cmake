# Installs BUILD into PREFIX, and then uses nothing but that: builds a program and one with a guard by
# the command that DOCUMENT shows for pkg-config, and the projects of EXAMPLES by the CMake package,
# and runs all of it on FILE.
file(REMOVE_RECURSE ${PREFIX})
unset(ENV{TESSEL_MODULE_PATH})
execute_process(COMMAND ${CMAKE_COMMAND} --install ${BUILD} --prefix ${PREFIX}/usr
    OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
set(lib ${PREFIX}/usr/${LIBDIR})

function(expect printed)
    execute_process(COMMAND ${ARGN} OUTPUT_VARIABLE found COMMAND_ERROR_IS_FATAL ANY)
    if(NOT found STREQUAL printed)
        message(FATAL_ERROR "${ARGN} printed: ${found}")
    endif()
endfunction()

file(READ ${DOCUMENT} text)
if(NOT text MATCHES "```sh\n(export PKG_CONFIG_PATH=PREFIX/[^`]*pkg-config --cflags[^`]*)```")
    message(FATAL_ERROR "${DOCUMENT} has no command by which programs are built")
endif()
string(REPLACE "PREFIX/lib/x86_64-linux-gnu" "${lib}" command "${CMAKE_MATCH_1}")
string(REPLACE "c++ " "${COMPILER} " command "${command}")
function(build_by_pkg_config package program)
    get_filename_component(name ${program} NAME_WE)
    string(REPLACE "embed.cpp" "${EXAMPLES}/${program}" command "${command}")
    string(REPLACE " tessel)" " ${package})" command "${command}")
    string(REPLACE "-o embed" "-o ${PREFIX}/${name}" command "${command}")
    execute_process(COMMAND sh -ec "${command}" COMMAND_ERROR_IS_FATAL ANY)
endfunction()
build_by_pkg_config(tessel embed.cpp)
expect("90 values, from -89 to 89\n" ${PREFIX}/embed ${FILE} COADSY)
build_by_pkg_config(tessel-netcdf-guard embedding/guarded.cpp)
expect("opened\n" ${PREFIX}/guarded ${FILE})

foreach(project second_module embedding)
    execute_process(COMMAND ${CMAKE_COMMAND} -S ${EXAMPLES}/${project} -B ${PREFIX}/${project}
            -G Ninja -DCMAKE_PREFIX_PATH=${PREFIX}/usr -DCMAKE_CXX_COMPILER=${COMPILER}
            -DCMAKE_CXX_FLAGS=-Werror
        OUTPUT_VARIABLE told COMMAND_ERROR_IS_FATAL ANY)
    execute_process(COMMAND ${CMAKE_COMMAND} --build ${PREFIX}/${project}
        OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
endforeach()

set(line "COADSY: 90 values from -89 to 89, mean 0\n")
set(arguments ${PREFIX}/second_module/series.tsx ${FILE} COADSY)
expect("${line}" ${PREFIX}/embedding/means ${arguments})
expect("opened\n" ${PREFIX}/embedding/guarded ${FILE})
execute_process(COMMAND ${PREFIX}/embedding/means_static ${arguments}
    ERROR_VARIABLE found RESULT_VARIABLE status) # beside a program in one piece there are no modules
if(NOT status EQUAL 1 OR NOT found MATCHES "^TESSEL:host:moduleNotFound")
    message(FATAL_ERROR "means_static has a module from somewhere: ${found}")
endif()
if(NOT told MATCHES "TESSEL_MODULE_PATH=([^\n]+)")
    message(FATAL_ERROR "The project does not say where the modules are: ${told}")
endif()
set(ENV{TESSEL_MODULE_PATH} "${CMAKE_MATCH_1}")
expect("${line}" ${PREFIX}/embedding/means_static ${arguments})
expect("opened\n" ${PREFIX}/embedding/guarded_static ${FILE})
foreach(program guarded guarded_static)
    execute_process(COMMAND ${PREFIX}/embedding/${program} https://localhost/file.nc
        OUTPUT_VARIABLE found RESULT_VARIABLE status)
    if(NOT status EQUAL 1 OR NOT found STREQUAL "refused: TESSEL:guard:remote\n")
        message(FATAL_ERROR "The guard let an address through: ${found}")
    endif()
endforeach()

# What they want of the system at run time has neither the build tree in it nor, where the host is
# linked into the program, the host's library.
foreach(program means_static guarded_static)
    execute_process(COMMAND objdump -p ${PREFIX}/embedding/${program} OUTPUT_VARIABLE wanted
        COMMAND_ERROR_IS_FATAL ANY)
    if(wanted MATCHES "libtessel")
        message(FATAL_ERROR "${program} wants the shared library")
    endif()
endforeach()
foreach(file libtessel.so tessel/netcdf.tsx)
    execute_process(COMMAND objdump -p ${lib}/${file} OUTPUT_VARIABLE wanted
        COMMAND_ERROR_IS_FATAL ANY)
    if(wanted MATCHES "R(UN)?PATH")
        message(FATAL_ERROR "${file} has a path of the build in it")
    endif()
endforeach()

# A program in one piece that is called by its bare name takes no module from the current folder.
file(WRITE ${PREFIX}/planted/tessel/netcdf.tsx "planted")
set(ENV{TESSEL_MODULE_PATH} "")
set(ENV{PATH} "${PREFIX}/embedding:$ENV{PATH}")
execute_process(COMMAND sh -c "means_static series.tsx file variable"
    WORKING_DIRECTORY ${PREFIX}/planted ERROR_VARIABLE found RESULT_VARIABLE status)
if(status EQUAL 0 OR NOT found MATCHES "^TESSEL:host:moduleNotFound" OR found MATCHES "planted")
    message(FATAL_ERROR "from the current folder: ${found}")
endif()

# Nor does the Python package take a library from there, built or installed: an empty entry of a
# path means the current folder.
file(GLOB_RECURSE extensions ${BUILD}/python/tessel/*.so ${PREFIX}/usr/*/_*.so)
foreach(file IN LISTS extensions)
    execute_process(COMMAND objdump -p ${file} OUTPUT_VARIABLE wanted COMMAND_ERROR_IS_FATAL ANY)
    if(wanted MATCHES "R(UN)?PATH +([^\n]*)")
        if(NOT "${CMAKE_MATCH_2}" MATCHES "^([$]ORIGIN[^:]*)(:[$]ORIGIN[^:]*)*$")
            message(FATAL_ERROR "${file} looks for libraries in \"${CMAKE_MATCH_2}\"")
        endif()
    endif()
endforeach()
list(LENGTH extensions count)
if(WITH_PYTHON AND NOT count EQUAL 4)
    message(FATAL_ERROR "there are ${count} extensions: ${extensions}")
endif()
