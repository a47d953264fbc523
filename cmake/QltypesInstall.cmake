# What `cmake --install` puts where: headers, both libraries, the inspector, the CMake package and the pkg-config files.
# Always on, also below a parent project, whose own exported targets may depend on these. Components: `runtime` has the
# shared libraries, `development` what a build against them needs (static libraries too), `tools` the inspector.

include(CMakePackageConfigHelpers)

set(packageDir "${CMAKE_INSTALL_LIBDIR}/cmake/qltypes")

install(
  TARGETS platform qltypes
  EXPORT qltypesTargets
  LIBRARY DESTINATION "${CMAKE_INSTALL_LIBDIR}"
          COMPONENT runtime
          NAMELINK_COMPONENT development
  ARCHIVE DESTINATION "${CMAKE_INSTALL_LIBDIR}" COMPONENT development)

if(BUILD_SHARED_LIBS)
  install(FILES "${PROJECT_SOURCE_DIR}/LICENSE" DESTINATION "${CMAKE_INSTALL_DATADIR}/doc/qltypes" COMPONENT runtime)
else()
  install(FILES "${PROJECT_SOURCE_DIR}/LICENSE" DESTINATION "${CMAKE_INSTALL_DATADIR}/doc/qltypes"
          COMPONENT development)
endif()

qltypes_public_headers(headers)
foreach(header IN LISTS headers)
  cmake_path(GET header PARENT_PATH folder)
  install(FILES "${PROJECT_SOURCE_DIR}/${header}" DESTINATION "${CMAKE_INSTALL_INCLUDEDIR}/${folder}"
          COMPONENT development)
endforeach()

# Libraries that only the static form leaves to whoever links it.
set(privateLibraries md flint gmp)

configure_package_config_file("${PROJECT_SOURCE_DIR}/cmake/qltypesConfig.cmake.in"
                              "${PROJECT_BINARY_DIR}/cmake/qltypesConfig.cmake" INSTALL_DESTINATION "${packageDir}")
# Below 1.0 each minor version may break the interface.
write_basic_package_version_file("${PROJECT_BINARY_DIR}/cmake/qltypesConfigVersion.cmake"
                                 COMPATIBILITY SameMinorVersion)
install(FILES "${PROJECT_BINARY_DIR}/cmake/qltypesConfig.cmake"
              "${PROJECT_BINARY_DIR}/cmake/qltypesConfigVersion.cmake" DESTINATION "${packageDir}"
        COMPONENT development)
install(EXPORT qltypesTargets NAMESPACE qltypes:: DESTINATION "${packageDir}" COMPONENT development)

# The prefix of a .pc file follows from where the file lies, so that a moved tree stays right; folders that are absolute
# stay absolute.
function(qltypes_pc_path result dir)
  if(IS_ABSOLUTE "${dir}")
    set(${result} "${dir}" PARENT_SCOPE)
  else()
    set(${result} "\${prefix}/${dir}" PARENT_SCOPE)
  endif()
endfunction()
if(IS_ABSOLUTE "${CMAKE_INSTALL_LIBDIR}")
  set(pcPrefix "${CMAKE_INSTALL_PREFIX}")
else()
  file(RELATIVE_PATH up "/${CMAKE_INSTALL_LIBDIR}/pkgconfig" "/")
  string(REGEX REPLACE "/$" "" up "${up}")
  set(pcPrefix "\${pcfiledir}/${up}")
endif()
list(TRANSFORM privateLibraries PREPEND "-l" OUTPUT_VARIABLE pcPrivateLibraries)
list(JOIN pcPrivateLibraries " " pcPrivateLibraries)
qltypes_pc_path(pcLibDir "${CMAKE_INSTALL_LIBDIR}")
qltypes_pc_path(pcIncludeDir "${CMAKE_INSTALL_INCLUDEDIR}")
foreach(name qltypes qlplatform)
  configure_file("${PROJECT_SOURCE_DIR}/cmake/${name}.pc.in" "${PROJECT_BINARY_DIR}/cmake/${name}.pc" @ONLY)
  install(FILES "${PROJECT_BINARY_DIR}/cmake/${name}.pc" DESTINATION "${CMAKE_INSTALL_LIBDIR}/pkgconfig"
          COMPONENT development)
endforeach()

# Printers for gdb, to be read with `source`; those of a shared library are read by gdb itself, which looks for a script
# whose path is that of the library behind its own folder of scripts. Which one that is follows from the prefix of the
# installation; the script finds the printers from where it lies.
install(FILES "${PROJECT_SOURCE_DIR}/tools/gdb/qltypes_gdb.py" DESTINATION "${CMAKE_INSTALL_DATADIR}/qltypes/gdb"
        COMPONENT development)
if(BUILD_SHARED_LIBS)
  install(
    CODE "
    set(LIBRARY \"$<TARGET_FILE_NAME:qltypes>\")
    cmake_path(ABSOLUTE_PATH CMAKE_INSTALL_PREFIX NORMALIZE OUTPUT_VARIABLE prefix)
    set(libraries \"${CMAKE_INSTALL_LIBDIR}\")
    cmake_path(ABSOLUTE_PATH libraries BASE_DIRECTORY \"\${prefix}\" NORMALIZE)
    set(shared \"${CMAKE_INSTALL_DATADIR}\")
    cmake_path(ABSOLUTE_PATH shared BASE_DIRECTORY \"\${prefix}\" NORMALIZE)
    set(folder \"\${shared}/gdb/auto-load\${libraries}\")
    file(RELATIVE_PATH DISTANCE \"\${folder}\" \"\${shared}/qltypes/gdb\")
    set(script \"${PROJECT_BINARY_DIR}/gdb/\${LIBRARY}-gdb.py\")
    configure_file(\"${PROJECT_SOURCE_DIR}/tools/gdb/autoload.py.in\" \"\${script}\" @ONLY)
    file(INSTALL \"\${script}\" DESTINATION \"\${folder}\")"
    COMPONENT development)
endif()
