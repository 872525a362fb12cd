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

# nimbo_library_name(OUT FILE...): the name by which programs ask for the first of these shared libraries, such as
# "libcurl.so.4".
function(nimbo_library_name out file)
  execute_process(COMMAND ${CMAKE_OBJDUMP} -p ${file} OUTPUT_VARIABLE dump COMMAND_ERROR_IS_FATAL ANY)
  if(NOT dump MATCHES "SONAME +([^\n ]+)")
    message(FATAL_ERROR "${file} is no shared library")
  endif()
  set(${out} ${CMAKE_MATCH_1} PARENT_SCOPE)
endfunction()
