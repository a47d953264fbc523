# Debian packages: `cpack --preset release`. One a component of QltypesInstall.cmake.

set(CPACK_PACKAGE_NAME qltypes)
set(CPACK_PACKAGE_CONTACT "The qltypes developers <qltypes@localhost>")
set(CPACK_PACKAGE_VERSION "${PROJECT_VERSION}")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "${PROJECT_DESCRIPTION}")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_STRIP_FILES ON)
set(CPACK_VERBATIM_VARIABLES ON)
set(CPACK_GENERATOR DEB)

# What is not built has no package: a static build no runtime, a build without the inspector no tools.
set(CPACK_COMPONENTS_ALL development)
if(BUILD_SHARED_LIBS)
  list(APPEND CPACK_COMPONENTS_ALL runtime)
endif()
if(QLTYPES_BUILD_TOOLS)
  list(APPEND CPACK_COMPONENTS_ALL tools)
endif()

set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_ENABLE_COMPONENT_DEPENDS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS "${PROJECT_BINARY_DIR}/qlplatform" "${PROJECT_BINARY_DIR}/qltypes")

set(CPACK_DEBIAN_RUNTIME_PACKAGE_NAME "libqltypes${PROJECT_VERSION_MAJOR}")
set(CPACK_DEBIAN_RUNTIME_PACKAGE_SECTION libs)
set(CPACK_DEBIAN_RUNTIME_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
set(CPACK_COMPONENT_RUNTIME_DESCRIPTION "Shared libraries: they register data types by name, hand out small integer\n\
identifiers, and answer every question about a type by its identifier.")

set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME libqltypes-dev)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS "libboost-dev (>= 1.81) | libboost1.81-dev")
if(BUILD_SHARED_LIBS)
  set(CPACK_COMPONENT_DEVELOPMENT_DEPENDS runtime)
else()
  string(APPEND CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS ", libflint-dev, libgmp-dev, libmd-dev")
endif()
set(CPACK_COMPONENT_DEVELOPMENT_DESCRIPTION "What a build against the libraries needs: headers, the CMake package and the\n\
pkg-config files.")

set(CPACK_DEBIAN_TOOLS_PACKAGE_NAME qltypes)
set(CPACK_DEBIAN_TOOLS_PACKAGE_SECTION devel)
set(CPACK_DEBIAN_TOOLS_PACKAGE_SHLIBDEPS ON)
if(BUILD_SHARED_LIBS)
  set(CPACK_COMPONENT_TOOLS_DEPENDS runtime)
endif()
set(CPACK_COMPONENT_TOOLS_DESCRIPTION "The inspector: shows where the elements of a structure lie and why, reads\n\
number types and converts values from the command line.")

include(CPack)
