# kt_add_test(NAME LABEL label SOURCES files... [LIBRARIES targets...] [PORTABLE] [TIMEOUT seconds])
#
# A GoogleTest program and the CTest test that runs it. On Windows (and under Wine) each program gets a temporary folder
# of its own, as the library keeps its log there. Natively only PORTABLE tests are built; they may use the library's
# internal headers.

# Debian packages GoogleTest as sources, which compile for any target; elsewhere it is installed.
if(EXISTS /usr/src/googletest)
  add_subdirectory(/usr/src/googletest ${CMAKE_BINARY_DIR}/googletest EXCLUDE_FROM_ALL)
  foreach(target gtest gtest_main gmock gmock_main)
    target_compile_options(${target} PRIVATE -w)
    target_compile_features(${target} PUBLIC cxx_std_20)
  endforeach()
else()
  find_package(GTest REQUIRED)
  add_library(gtest ALIAS GTest::gtest)
  add_library(gtest_main ALIAS GTest::gtest_main)
endif()

set(KT_WINE_RUN ${CMAKE_SOURCE_DIR}/cmake/wine-run)

# kt_test_command(VARIABLE NAME PROGRAM ARGS...): the command line that runs a program with its own temporary folder.
function(kt_test_command variable name)
  set(temp ${CMAKE_BINARY_DIR}/temp/${name})
  if(NOT WIN32)
    set(${variable} ${ARGN} PARENT_SCOPE)
  elseif(CMAKE_CROSSCOMPILING)
    set(${variable} ${KT_WINE_RUN} --temp ${temp} ${ARGN} PARENT_SCOPE)
  else()
    file(MAKE_DIRECTORY ${temp})
    set(${variable} $<TARGET_FILE:ktlaunch> ${temp} ${ARGN} PARENT_SCOPE)
  endif()
endfunction()

function(kt_add_test name)
  cmake_parse_arguments(arg "PORTABLE" "LABEL;TIMEOUT" "SOURCES;LIBRARIES" ${ARGN})
  if(NOT WIN32 AND NOT arg_PORTABLE)
    return()
  endif()
  if(NOT arg_TIMEOUT)
    set(arg_TIMEOUT 300)
  endif()
  add_executable(${name} ${arg_SOURCES})
  target_link_libraries(${name} PRIVATE kt_compile_options KTPublic KT::boost_headers KT::boost_thread gtest gtest_main
                                        ${arg_LIBRARIES})
  target_include_directories(${name} PRIVATE ${CMAKE_SOURCE_DIR}/tests/support)
  kt_test_command(command ${name} $<TARGET_FILE:${name}>)
  add_test(NAME ${name} COMMAND ${command})
  set_tests_properties(${name} PROPERTIES LABELS "${arg_LABEL}" TIMEOUT ${arg_TIMEOUT})
  if(NOT WIN32)
    set(temp ${CMAKE_BINARY_DIR}/temp/${name})
    file(MAKE_DIRECTORY ${temp})
    set_tests_properties(${name} PROPERTIES ENVIRONMENT TMPDIR=${temp})
  endif()
endfunction()
