# nimbo_library(NAME SOURCES ... LIBRARIES ...): a static library of the project, headers found below src/.
function(nimbo_library name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;LIBRARIES;PRIVATE_LIBRARIES")
  add_library(${name} STATIC ${arg_SOURCES})
  target_include_directories(${name} PUBLIC ${PROJECT_SOURCE_DIR}/src)
  target_link_libraries(${name} PUBLIC ${arg_LIBRARIES} PRIVATE nimbo_warnings ${arg_PRIVATE_LIBRARIES})
endfunction()

# nimbo_test(NAME SOURCES ... LIBRARIES ...): one test program; ctest lists each of its tests.
function(nimbo_test name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;LIBRARIES")
  add_executable(${name} ${arg_SOURCES})
  target_include_directories(${name} PRIVATE ${PROJECT_SOURCE_DIR}/tests)
  target_link_libraries(${name} PRIVATE ${arg_LIBRARIES} nimbo_warnings GTest::gmock GTest::gtest_main)
  gtest_discover_tests(${name} DISCOVERY_TIMEOUT 60)
endfunction()

# Where programs look for their parts.
set(NIMBO_PARTS_FOLDER ${PROJECT_BINARY_DIR}/src/process)
set(CMAKE_BUILD_RPATH ${NIMBO_PARTS_FOLDER})
set(CMAKE_INSTALL_RPATH $ORIGIN/../${CMAKE_INSTALL_LIBDIR}/nimbo-transit)

# nimbo_part(NAME SOURCES ... LIBRARIES ...): libnimbo-NAME.so, which the programs open with its first use
# (src/desktop/system/LatePart.h), through its one function nimbo_NAME. It is linked against LIBRARIES; what else of the
# project it needs stays open, and every program that links nimbo_desktop exports that and no more. The objects are also
# a library nimbo_NAME, for tests of what is inside.
function(nimbo_part name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;LIBRARIES")
  add_library(nimbo_${name} OBJECT ${arg_SOURCES})
  set_target_properties(nimbo_${name} PROPERTIES POSITION_INDEPENDENT_CODE ON)
  target_include_directories(nimbo_${name} PUBLIC ${PROJECT_SOURCE_DIR}/src)
  target_link_libraries(nimbo_${name} PUBLIC ${arg_LIBRARIES} PRIVATE nimbo_warnings)

  set(part nimbo_${name}_part)
  set(interface ${CMAKE_CURRENT_BINARY_DIR}/${part}.map)
  file(CONFIGURE OUTPUT ${interface} CONTENT "{ global: nimbo_${name}; local: *; };\n")
  add_library(${part} SHARED)
  set_target_properties(${part} PROPERTIES
    OUTPUT_NAME nimbo-${name} LIBRARY_OUTPUT_DIRECTORY ${NIMBO_PARTS_FOLDER} BUILD_RPATH "" INSTALL_RPATH ""
    LINK_DEPENDS ${interface})
  target_link_libraries(${part} PRIVATE nimbo_${name})
  target_link_options(${part} PRIVATE -Wl,--version-script=${interface})
  install(TARGETS ${part} LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}/nimbo-transit)

  set(exports ${CMAKE_CURRENT_BINARY_DIR}/${part}.exports)
  add_custom_command(OUTPUT ${exports} DEPENDS ${part} VERBATIM
    COMMAND sh -c "$1 -D --undefined-only -j $2 | sed -n 's/.*5nimbo.*/-Wl,-u,&,--export-dynamic-symbol=&/p' >$3"
      exports ${CMAKE_NM} $<TARGET_FILE:${part}> ${exports})
  add_custom_target(${part}_exports DEPENDS ${exports})
  target_link_options(nimbo_desktop INTERFACE @${exports})
  set_property(TARGET nimbo_desktop APPEND PROPERTY INTERFACE_LINK_DEPENDS ${exports})
endfunction()
