# package.cmake: installs the library, moves the prefix, and builds and runs a consumer against it.
#
#     cmake -DBUILD=... -DSOURCE=... -DWORK=... -DGENERATOR=... -DTOOLCHAIN=... -DCOMPILER=... -DLAUNCHER=...
#           -DCONFIGURATION=... -P package.cmake
#
# Checked: the list of installed files; that none of them names the folder it was built in or installed to; that the
# pages' links lead to pages; that the package's target needs nothing else; and that the consumer runs with the installed
# DLLs.

cmake_minimum_required(VERSION 3.25)
set(installed ${WORK}/installed)
set(prefix ${WORK}/moved)

# run(VARIABLE COMMAND...): the command's output; a failure ends the test.
function(run variable)
  execute_process(
    COMMAND ${ARGN}
    OUTPUT_VARIABLE output
    ERROR_VARIABLE output
    RESULT_VARIABLE status)
  if(NOT status EQUAL 0)
    message(FATAL_ERROR "status ${status} of ${ARGN}\n${output}")
  endif()
  set(${variable} "${output}" PARENT_SCOPE)
endfunction()

# expect(TEXT REGEX): the text matches.
function(expect text regex)
  if(NOT text MATCHES "${regex}")
    message(FATAL_ERROR "expected \"${regex}\" in\n${text}")
  endif()
endfunction()

# ---- the files ----

file(REMOVE_RECURSE ${WORK})
run(ignored ${CMAKE_COMMAND} --install ${BUILD} --prefix ${installed})
# A package must not care where it stands.
file(RENAME ${installed} ${prefix})

file(GLOB_RECURSE found LIST_DIRECTORIES FALSE RELATIVE ${prefix} ${prefix}/*)
set(expected
    bin/KTPublic.dll
    bin/ktdict.exe
    bin/libgcc_s_seh-1.dll
    bin/libstdc++-6.dll
    bin/libwinpthread-1.dll
    lib/libKTPublic.dll.a
    lib/cmake/KTPublic/KTPublicConfig.cmake
    lib/cmake/KTPublic/KTPublicConfigVersion.cmake
    lib/cmake/KTPublic/KTPublicTargets.cmake
    lib/cmake/KTPublic/KTPublicTargets-${CONFIGURATION}.cmake
    share/KTPublic/KTPublic.natvis
    share/doc/KTPublic/README.md)
file(GLOB headers RELATIVE ${SOURCE}/source/public/includes ${SOURCE}/source/public/includes/*.h)
list(TRANSFORM headers PREPEND include/KTPublic/)
list(APPEND expected ${headers})
file(GLOB pages RELATIVE ${SOURCE} ${SOURCE}/docs/*.md)
list(TRANSFORM pages PREPEND share/doc/KTPublic/)
list(APPEND expected ${pages})
foreach(package libboost1.81-dev libcli11-dev gcc-mingw-w64-x86-64-posix-runtime mingw-w64-x86-64-dev)
  if(LAUNCHER AND EXISTS /usr/share/doc/${package}/copyright)
    list(APPEND expected share/doc/KTPublic/docs/copyright/${package}.txt)
  endif()
endforeach()
set(missing ${expected})
list(REMOVE_ITEM missing ${found})
set(additional ${found})
list(REMOVE_ITEM additional ${expected})
if(missing OR additional)
  message(FATAL_ERROR "not installed: ${missing}\ninstalled but not expected: ${additional}")
endif()

foreach(file IN LISTS found)
  # file(READ) would stop at a zero byte, file(STRINGS) does not.
  file(STRINGS ${prefix}/${file} lines REGEX "${SOURCE}|${installed}")
  if(lines)
    message(FATAL_ERROR "${file} names a folder of this machine: ${lines}")
  endif()
endforeach()

# Links from page to page.
set(links 0)
foreach(page IN LISTS pages ITEMS share/doc/KTPublic/README.md)
  file(READ ${prefix}/${page} text)
  string(REPLACE "](" "\nlink:" text "${text}")
  string(REGEX MATCHALL "\nlink:[^)\n]+\\)" targets "${text}")
  foreach(target IN LISTS targets)
    string(REGEX REPLACE "^\nlink:(.*)\\)$" "\\1" target "${target}")
    math(EXPR links "${links} + 1")
    get_filename_component(folder ${prefix}/${page} DIRECTORY)
    string(REGEX REPLACE "#.*" "" file "${target}")
    if(NOT EXISTS ${folder}/${file})
      message(FATAL_ERROR "${page} has a link to ${file}, which is not installed")
    endif()
    if(target MATCHES "#(.*)")
      string(REPLACE "-" " " heading "${CMAKE_MATCH_1}")
      file(READ ${folder}/${file} text)
      string(TOLOWER "${text}" text)
      if(NOT text MATCHES "\n#+ ${heading}\n")
        message(FATAL_ERROR "${page} has a link to ${target}, and there is no such heading")
      endif()
    endif()
  endforeach()
endforeach()
if(links EQUAL 0)
  message(FATAL_ERROR "found no links in ${pages}")
endif()

# ---- the consumer ----

set(toolchain -DCMAKE_CXX_COMPILER=${COMPILER})
if(TOOLCHAIN)
  set(toolchain -DCMAKE_TOOLCHAIN_FILE=${TOOLCHAIN})
endif()
# The toolchain looks for packages below its root folders only.
run(configuration
    ${CMAKE_COMMAND} -G ${GENERATOR} ${toolchain} -DCMAKE_BUILD_TYPE=Release -DCMAKE_FIND_ROOT_PATH=${prefix}
    -S ${SOURCE}/tests/package/consumer -B ${WORK}/consumer)
expect("${configuration}" "package: version 1\\.0\\.0\n")
expect("${configuration}" "package: libraries libraries-NOTFOUND\n")
expect("${configuration}" "package: features cxx_std_20\n")
expect("${configuration}" "package: options -fnon-call-exceptions\n")
expect("${configuration}" "package: run-time ${prefix}/bin/KTPublic\\.dll;${prefix}/bin/lib[^\n]*\n")
run(ignored ${CMAKE_COMMAND} --build ${WORK}/consumer)

# Windows looks in the program's own folder first.
file(COPY ${WORK}/consumer/consumer.exe DESTINATION ${prefix}/bin)
if(LAUNCHER)
  list(APPEND LAUNCHER --temp ${WORK}/temp)
endif()
run(output ${LAUNCHER} ${prefix}/bin/consumer.exe)
string(REPLACE "\r" "" output "${output}")
string(REPLACE "\\" "/" output "${output}")
expect("${output}" "text Größe 12, 8 units\n")
expect("${output}" "caught an exception\n")
expect("${output}" "caught fault C0000005\n")
foreach(name KTPublic.dll libstdc\\+\\+-6.dll libgcc_s_seh-1.dll libwinpthread-1.dll)
  expect("${output}" "loaded [A-Z]:[^\n]*/package/moved/bin/${name}\n")
endforeach()
if(LAUNCHER)
  file(READ ${WORK}/temp/ktap_log.txt log)
  expect("${log}" "^[0-9]+: written by the consumer\n$")
endif()
run(output ${LAUNCHER} ${prefix}/bin/ktdict.exe --version)
expect("${output}" "^ktdict 1\\.0\\.0\n$")

# Other major versions are refused.
file(WRITE ${WORK}/later/CMakeLists.txt
     "cmake_minimum_required(VERSION 3.25)\nproject(later LANGUAGES CXX)\nfind_package(KTPublic 2.0 REQUIRED)\n")
execute_process(
  COMMAND ${CMAKE_COMMAND} -G ${GENERATOR} ${toolchain} -DCMAKE_FIND_ROOT_PATH=${prefix} -S ${WORK}/later
          -B ${WORK}/later/build
  OUTPUT_VARIABLE output
  ERROR_VARIABLE output
  RESULT_VARIABLE status)
if(status EQUAL 0)
  message(FATAL_ERROR "version 2.0 was found")
endif()
expect("${output}" "KTPublicConfig.cmake, version: 1\\.0\\.0")
message(STATUS "installed, moved, used by a consumer")
