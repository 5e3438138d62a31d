# Installs BUILD into PREFIX as packagers do, for each place that Python looks in, and into a virtual
# environment, and then uses nothing but that: the command shows FILE, PYTHON finds the package, and
# xarray in it the engine.
#
# SERIES is Python's, such as 3.11; DEBIAN says whether it is one of Debian's.
file(REMOVE_RECURSE ${PREFIX})
set(program "import xarray
dataset = xarray.open_dataset('${FILE}', engine='tessel', decode_times=False)
print(dataset.sizes['COADSY'], dataset.COADSY.values[0])")

function(expect pattern)
    execute_process(COMMAND ${ARGN} WORKING_DIRECTORY / OUTPUT_VARIABLE found
        COMMAND_ERROR_IS_FATAL ANY)
    if(NOT found MATCHES "${pattern}")
        message(FATAL_ERROR "${ARGN} printed: ${found}")
    endif()
endfunction()

foreach(prefix /usr /usr/local /opt/tessel)
    set(folder lib/python${SERIES}/site-packages)
    if(DEBIAN AND prefix STREQUAL /usr)
        set(folder lib/python3/dist-packages)
    elseif(DEBIAN AND prefix STREQUAL /usr/local)
        set(folder lib/python${SERIES}/dist-packages)
    endif()
    set(tree ${PREFIX}/as${prefix})
    execute_process(COMMAND ${CMAKE_COMMAND} -E env DESTDIR=${PREFIX}/as
            ${CMAKE_COMMAND} --install ${BUILD} --prefix ${prefix}
        OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
    unset(ENV{PYTHONPATH})
    expect("COADSY" ${tree}/bin/tessel info ${FILE})
    set(ENV{PYTHONPATH} ${tree}/${folder})
    expect("^90 -89.0\n$" ${PYTHON} -B -c ${program})
    foreach(page man1/tessel.1 man3/tessel-open.3 man7/tessel-errors.7)
        expect("SH NAME" gzip -dc ${tree}/share/man/${page}.gz)
    endforeach()
    foreach(root ${BUILD}/share ${tree}/share) # the book, if there is one
        file(GLOB_RECURSE pages RELATIVE ${root} ${root}/doc/tessel/html/*.html)
        list(LENGTH pages of_${root})
    endforeach()
    if(NOT of_${BUILD}/share EQUAL of_${tree}/share)
        message(FATAL_ERROR "Of the book, ${of_${tree}/share} pages are installed")
    endif()
endforeach()

# The interpreter of a virtual environment finds the package there without being told, and before
# any that the system has.
unset(ENV{PYTHONPATH})
set(environment ${PREFIX}/environment)
execute_process(COMMAND ${PYTHON} -m venv --without-pip --system-site-packages ${environment}
    COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND ${CMAKE_COMMAND} --install ${BUILD} --prefix ${environment}
    OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
expect("^90 -89.0\n$" ${environment}/bin/python -B -c ${program})
expect("/environment/lib/python${SERIES}/site-packages/tessel\n$" ${environment}/bin/python -B -c
    "import tessel\nprint(*tessel.__path__)")
expect("COADSY" ${environment}/bin/tessel info ${FILE})
