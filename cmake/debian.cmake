# Debian packages, split as Debian would. After the book: cpack --preset release
#
# debian/finish.cmake puts in what every package has; debian/amend.cmake mends what CPack cannot say.
set(CPACK_GENERATOR DEB)
set(CPACK_COMPONENTS_ALL runtime module development documentation)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_PACKAGE_VENDOR "The Tessel developers")
set(CPACK_INSTALL_DEFAULT_DIRECTORY_PERMISSIONS
    OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)
set(CPACK_PRE_BUILD_SCRIPTS ${CMAKE_CURRENT_LIST_DIR}/debian/finish.cmake)
set(CPACK_POST_BUILD_SCRIPTS ${CMAKE_CURRENT_LIST_DIR}/debian/amend.cmake)

# Who makes packages says so as for Debian's own tools.
set(CPACK_DEBIAN_PACKAGE_MAINTAINER "The Tessel developers <tessel@localhost>")
if(DEFINED ENV{DEBEMAIL})
    set(CPACK_DEBIAN_PACKAGE_MAINTAINER "$ENV{DEBFULLNAME} <$ENV{DEBEMAIL}>")
endif()

set(CPACK_DEBIAN_PACKAGE_SOURCE tessel)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_PRIORITY optional)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${TESSEL_LIB_DIR})

set(library libtessel${PROJECT_VERSION_MAJOR}.${PROJECT_VERSION_MINOR})
set(exactly "(= ${PROJECT_VERSION}-${CPACK_DEBIAN_PACKAGE_RELEASE})")
set(about "Tessel gives a numeric environment call-for-call access to the netCDF C
library: a host loads modules and calls their operations by name with arrays.")

macro(debian_package component name section synopsis description)
    set(CPACK_DEBIAN_${component}_PACKAGE_NAME ${name})
    set(CPACK_DEBIAN_${component}_PACKAGE_SECTION ${section})
    set(CPACK_DEBIAN_${component}_DESCRIPTION "${synopsis}\n${about}\n.\n${description}")
endmacro()

debian_package(RUNTIME ${library} libs "embeddable host for modules of numeric operations"
"This package has the host as a shared library, which any program can embed.")
set(CPACK_DEBIAN_RUNTIME_PACKAGE_RECOMMENDS "tessel-module-netcdf ${exactly}")
file(WRITE ${CMAKE_BINARY_DIR}/debian/triggers "activate-noawait ldconfig\n")
file(WRITE ${CMAKE_BINARY_DIR}/debian/shlibs
    "libtessel ${PROJECT_VERSION_MAJOR}.${PROJECT_VERSION_MINOR} ${library} (>= ${PROJECT_VERSION})\n")
set(CPACK_DEBIAN_RUNTIME_PACKAGE_CONTROL_EXTRA
    ${CMAKE_BINARY_DIR}/debian/triggers ${CMAKE_BINARY_DIR}/debian/shlibs)

# The module's file has no version in its name, so it cannot be in the library's package, of which
# two versions may be installed together.
debian_package(MODULE tessel-module-netcdf libs "netCDF library as a module for the host Tessel"
"This package has the module: the file netcdf.tsx, which hosts load.")

debian_package(DEVELOPMENT libtessel-dev libdevel "embeddable host for modules (development files)"
"This package has what it takes to embed the host and to write modules: the
headers, the host as a static library, the guard that keeps calls from the
netCDF library which it does not survive (for the library and for programs in
one piece), files for CMake and pkg-config, and a manual page for every
operation.")
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS
    "${library} ${exactly}, tessel-module-netcdf ${exactly}")
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SUGGESTS tessel-doc)

debian_package(DOCUMENTATION tessel-doc doc "embeddable host for modules (documentation)"
"This package has the book in HTML: concepts, how-to pages, and a page for
every operation with all of its errors.")
set(CPACK_DEBIAN_DOCUMENTATION_PACKAGE_ARCHITECTURE all)
# The scripts of the book are links to files of that package, and from this version on it has all.
set(CPACK_DEBIAN_DOCUMENTATION_PACKAGE_DEPENDS "libjs-sphinxdoc (>= 5.2)")

if(TESSEL_PYTHON)
    include(${CMAKE_SOURCE_DIR}/python/find_python.cmake)
    find_package(Python3 REQUIRED COMPONENTS Interpreter)
    list(APPEND CPACK_COMPONENTS_ALL python)
    debian_package(PYTHON python3-tessel python "netCDF library for NumPy and xarray, call for call"
"This package has the package tessel for Python 3, which takes and gives NumPy
arrays, its engine for xarray, and the command tessel, which shows, draws,
copies and checks netCDF files.")
    math(EXPR next "${Python3_VERSION_MINOR} + 1")
    set(CPACK_DEBIAN_PYTHON_PACKAGE_DEPENDS "${library} ${exactly}, tessel-module-netcdf ${exactly}, \
python3 (<< 3.${next}), python3 (>= 3.${Python3_VERSION_MINOR}~), python3-cftime, python3-numpy")
    set(CPACK_DEBIAN_PYTHON_PACKAGE_RECOMMENDS python3-matplotlib)
    set(CPACK_DEBIAN_PYTHON_PACKAGE_SUGGESTS
        "python3-dask, python3-distributed, python3-xarray, tessel-doc")
    set(CPACK_DEBIAN_PYTHON_PACKAGE_CONTROL_EXTRA
        ${CMAKE_CURRENT_LIST_DIR}/debian/postinst ${CMAKE_CURRENT_LIST_DIR}/debian/prerm)
endif()
include(CPack)
