# Installs BUILD into PREFIX, and then uses nothing but that: PYTHON finds the package in FOLDER below
# the prefix, and xarray in it the engine, which opens FILE.
file(REMOVE_RECURSE ${PREFIX})
execute_process(COMMAND ${CMAKE_COMMAND} --install ${BUILD} --prefix ${PREFIX}
    OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
set(ENV{PYTHONPATH} ${PREFIX}/${FOLDER})
set(program "import xarray
dataset = xarray.open_dataset('${FILE}', engine='tessel', decode_times=False)
print(dataset.sizes['COADSY'], dataset.COADSY.values[0])")
execute_process(COMMAND ${PYTHON} -B -c ${program} WORKING_DIRECTORY /
    OUTPUT_VARIABLE found COMMAND_ERROR_IS_FATAL ANY)
if(NOT found STREQUAL "90 -89.0\n")
    message(FATAL_ERROR "It printed: ${found}")
endif()
