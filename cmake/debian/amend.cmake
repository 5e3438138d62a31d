# amend.cmake: run by CPack when the packages are made: with the field Multi-Arch, which CPack does not
# know, and without the scripts by which it calls ldconfig, which the library's trigger does.
set(multi_arch_libtessel same)
set(multi_arch_tessel-module same)
set(multi_arch_tessel-doc foreign)

foreach(package IN LISTS CPACK_PACKAGE_FILES)
    cmake_path(GET package FILENAME name)
    string(REGEX MATCH "^(libtessel|tessel-module|tessel-doc)" kind ${name})
    if(NOT kind)
        continue()
    endif()
    set(tree ${package}.tree)
    execute_process(COMMAND dpkg-deb --raw-extract ${package} ${tree} COMMAND_ERROR_IS_FATAL ANY)
    file(READ ${tree}/DEBIAN/control control)
    string(STRIP "${control}" control)
    file(WRITE ${tree}/DEBIAN/control "${control}\nMulti-Arch: ${multi_arch_${kind}}\n")
    file(REMOVE ${tree}/DEBIAN/postinst ${tree}/DEBIAN/postrm)
    execute_process(COMMAND dpkg-deb --root-owner-group --build ${tree} ${package}
        OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
    file(REMOVE_RECURSE ${tree})
endforeach()
