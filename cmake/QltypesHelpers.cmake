# Functions that every folder's CMakeLists.txt uses.

# Settings that are ours alone and never reach a user's build.
function(qltypes_private_settings target)
  target_compile_features(${target} PUBLIC cxx_std_20)
  set_target_properties(${target} PROPERTIES CXX_EXTENSIONS OFF)
  if(QLTYPES_WARNINGS)
    # g++ 12 reports overlapping copies inside std::string that cannot happen.
    target_compile_options(${target} PRIVATE -Wall -Wextra -Wpedantic -Wshadow -Werror
                                             $<$<CXX_COMPILER_ID:GNU>:-Wno-restrict>)
    # It also finds uninitialised values in instrumented standard headers where there are none.
    if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND "${CMAKE_CXX_FLAGS} ${CMAKE_CXX_FLAGS_DEBUG}" MATCHES "-fsanitize")
      target_compile_options(${target} PRIVATE -Wno-maybe-uninitialized)
    endif()
  endif()
endfunction()

# The headers that clients may include, relative to the source tree.
function(qltypes_public_headers result)
  file(GLOB_RECURSE headers CONFIGURE_DEPENDS RELATIVE "${qltypes_SOURCE_DIR}" "${qltypes_SOURCE_DIR}/qlplatform/*.h"
       "${qltypes_SOURCE_DIR}/qltypes/*.h")
  list(FILTER headers EXCLUDE REGEX "_internal\\.h$")
  set(${result} "${headers}" PARENT_SCOPE)
endfunction()

# A shared (or static) library of the product: hidden visibility, versioned soname, found beside its sibling.
function(qltypes_library_settings target)
  qltypes_private_settings(${target})
  set_target_properties(
    ${target}
    PROPERTIES CXX_VISIBILITY_PRESET hidden
               VISIBILITY_INLINES_HIDDEN ON
               POSITION_INDEPENDENT_CODE ON
               DEFINE_SYMBOL "" # objects are the same in shared and in static libraries
               VERSION ${PROJECT_VERSION}
               SOVERSION ${PROJECT_VERSION_MAJOR}
               INSTALL_RPATH "$ORIGIN")
  target_include_directories(
    ${target} PUBLIC $<BUILD_INTERFACE:${qltypes_SOURCE_DIR}>
                     $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>)
  get_target_property(type ${target} TYPE)
  if(type STREQUAL "SHARED_LIBRARY")
    set(map "${qltypes_SOURCE_DIR}/cmake/hidden.map")
    target_link_options(${target} PRIVATE "LINKER:--version-script=${map}")
    set_property(TARGET ${target} APPEND PROPERTY LINK_DEPENDS "${map}")
  endif()
endfunction()

# A program that ctest runs as unit.NAME, under QLTYPES_TEST_LAUNCHER where that is set. The target unit_tests builds all.
function(qltypes_add_unit_test name target)
  add_test(NAME unit.${name} COMMAND ${QLTYPES_TEST_LAUNCHER} $<TARGET_FILE:${target}>)
  if(NOT TARGET unit_tests)
    add_custom_target(unit_tests)
  endif()
  add_dependencies(unit_tests ${target})
endfunction()

# One test executable a folder: qltypes_add_test(types DataType_test.cpp ...).
# LIBRARIES adds what the folder needs beyond the two libraries and GoogleTest.
# White-box tests of hidden symbols compile the sources they need into the test with WHITE_BOX.
function(qltypes_add_test name)
  cmake_parse_arguments(arg "" "" "LIBRARIES;WHITE_BOX" ${ARGN})
  list(TRANSFORM arg_WHITE_BOX PREPEND "${qltypes_SOURCE_DIR}/")
  add_executable(test_${name} ${arg_UNPARSED_ARGUMENTS} ${arg_WHITE_BOX})
  qltypes_private_settings(test_${name})
  target_include_directories(test_${name} PRIVATE "${qltypes_SOURCE_DIR}")
  target_compile_definitions(test_${name} PRIVATE QLTYPES_TEST_DATA_DIR="${qltypes_SOURCE_DIR}/tests/data")
  target_link_libraries(test_${name} PRIVATE qltypes::qltypes qltypes::platform ${arg_LIBRARIES} testsupport)
  qltypes_add_unit_test(${name} test_${name})
endfunction()

# One benchmark program a topic: qltypes_add_bench(types lookup_bench.cpp LIBRARIES ...).
# The program is bench/<folder>/<topic>_bench in the build tree.
function(qltypes_add_bench folder source)
  cmake_parse_arguments(arg "" "" "LIBRARIES" ${ARGN})
  get_filename_component(topic ${source} NAME_WE)
  add_executable(${topic} ${source})
  qltypes_private_settings(${topic})
  target_include_directories(${topic} PRIVATE "${qltypes_SOURCE_DIR}")
  target_link_libraries(${topic} PRIVATE qltypes::qltypes qltypes::platform ${arg_LIBRARIES} benchmark::benchmark)
endfunction()
