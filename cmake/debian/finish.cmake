# finish.cmake: run by CPack when the packages' trees are filled: what Debian has in every package,
# and what it has otherwise than `cmake --install`.
set(sources ${CMAKE_CURRENT_LIST_DIR}/../..)
set(version ${CPACK_PACKAGE_VERSION}-${CPACK_DEBIAN_PACKAGE_RELEASE})
string(TIMESTAMP now "%a, %d %b %Y %H:%M:%S +0000" UTC)

# compress(FILE RESULT): by gzip, without name and time.
function(compress file result)
    execute_process(COMMAND gzip -9nc ${file} OUTPUT_FILE ${result} COMMAND_ERROR_IS_FATAL ANY)
endfunction()

foreach(component IN LISTS CPACK_COMPONENTS_ALL)
    string(TOUPPER ${component} upper)
    set(package ${CPACK_DEBIAN_${upper}_PACKAGE_NAME})
    set(usr ${CPACK_TEMPORARY_DIRECTORY}/${component}/usr)
    set(doc ${usr}/share/doc/${package})
    file(MAKE_DIRECTORY ${doc})
    compress(${sources}/CHANGELOG.md ${doc}/changelog.gz)
    file(WRITE ${doc}/changelog "tessel (${version}) unstable; urgency=medium\n\n"
        "  * Made from the sources of this version; what is new is in changelog.gz.\n\n"
        " -- ${CPACK_DEBIAN_PACKAGE_MAINTAINER}  ${now}\n")
    compress(${doc}/changelog ${doc}/changelog.Debian.gz)
    file(REMOVE ${doc}/changelog)
    file(READ ${sources}/LICENSE licence)
    string(REGEX MATCH "Copyright .c. ([^\n]*)" line "${licence}")
    set(holder "${CMAKE_MATCH_1}")
    string(REGEX REPLACE "^.*developers\n+" "" licence "${licence}")
    string(REGEX REPLACE "\n\n" "\n.\n" licence "${licence}")
    string(REGEX REPLACE "\n(.)" "\n \\1" licence "${licence}")
    file(WRITE ${doc}/copyright
        "Format: https://www.debian.org/doc/packaging-manuals/copyright-format/1.0/\n"
        "Upstream-Name: Tessel\n\nFiles: *\nCopyright: ${holder}\nLicense: Expat\n ${licence}")
    foreach(of all ${component})
        set(overrides ${CMAKE_CURRENT_LIST_DIR}/${of}.lintian-overrides)
        if(EXISTS ${overrides})
            file(READ ${overrides} text)
            file(APPEND ${usr}/share/lintian/overrides/${package} "${text}")
        endif()
    endforeach()
endforeach()

# Stripped as by Debian's dh_strip.
set(strip strip --remove-section=.comment --remove-section=.note)
file(GLOB_RECURSE shared ${CPACK_TEMPORARY_DIRECTORY}/*.so ${CPACK_TEMPORARY_DIRECTORY}/*.so.*.*.*
    ${CPACK_TEMPORARY_DIRECTORY}/*.tsx)
file(GLOB_RECURSE static ${CPACK_TEMPORARY_DIRECTORY}/*.a)
list(FILTER shared EXCLUDE REGEX /development/) # there it is a link
execute_process(COMMAND ${strip} --strip-unneeded ${shared} COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND ${strip} --strip-debug --enable-deterministic-archives ${static}
    COMMAND_ERROR_IS_FATAL ANY)

# In /usr, the linker finds the libraries by itself.
file(GLOB_RECURSE extensions ${CPACK_TEMPORARY_DIRECTORY}/python/usr/*.so)
foreach(extension IN LISTS extensions)
    file(RPATH_REMOVE FILE ${extension})
endforeach()

# Who installed the package for Python, and takes it away.
file(GLOB_RECURSE installers ${CPACK_TEMPORARY_DIRECTORY}/python/usr/INSTALLER)
foreach(installer IN LISTS installers)
    file(WRITE ${installer} "debian\n")
endforeach()

# The book: registered, and with the scripts of Sphinx where Debian keeps them.
set(usr ${CPACK_TEMPORARY_DIRECTORY}/documentation/usr)
if(NOT EXISTS ${usr}/share/doc/tessel/html/index.html)
    message(FATAL_ERROR "The book is missing: cmake --build --preset release --target book")
endif()
file(MAKE_DIRECTORY ${usr}/share/doc-base)
file(COPY_FILE ${CMAKE_CURRENT_LIST_DIR}/tessel-doc.doc-base ${usr}/share/doc-base/tessel-doc.tessel)
file(GLOB scripts /usr/share/javascript/sphinxdoc/1.0/*.js)
foreach(script IN LISTS scripts)
    cmake_path(GET script FILENAME name)
    set(copy ${usr}/share/doc/tessel/html/_static/${name})
    execute_process(COMMAND ${CMAKE_COMMAND} -E compare_files ${script} ${copy}
        RESULT_VARIABLE different ERROR_QUIET)
    if(NOT different)
        file(REMOVE ${copy})
        file(CREATE_LINK ../../../../javascript/sphinxdoc/1.0/${name} ${copy} SYMBOLIC)
    endif()
endforeach()
