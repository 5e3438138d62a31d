# Installs into PREFIX, builds PROGRAM against nothing but that, and runs it on FILE.
file(REMOVE_RECURSE ${PREFIX})
execute_process(COMMAND ${CMAKE_COMMAND} --install ${BUILD} --prefix ${PREFIX}
    OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
execute_process(
    COMMAND ${COMPILER} -std=c++20 ${PROGRAM} -I${PREFIX}/include -L${PREFIX}/${LIBDIR} -ltessel
        -Wl,-rpath,${PREFIX}/${LIBDIR} -o ${PREFIX}/embed
    COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND ${PREFIX}/embed ${FILE} COADSY OUTPUT_VARIABLE printed
    COMMAND_ERROR_IS_FATAL ANY)
if(NOT printed STREQUAL "90 values, from -89 to 89\n")
    message(FATAL_ERROR "it printed: ${printed}")
endif()
