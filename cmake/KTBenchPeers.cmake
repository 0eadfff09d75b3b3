# kt_bench_peers: what the benchmarks measure the library against, and Google Benchmark itself. None of it is ever
# linked into the library.
#
# Debian packages the peers as headers. The cross compiler sees just their folders, through links, as the rest of
# /usr/include belongs to Linux. Google Benchmark is compiled from the sources of Debian's own package (`./kt` fetches
# them).

set(KT_BENCHMARK_SOURCE ${CMAKE_SOURCE_DIR}/build/sources/benchmark CACHE PATH "Unpacked sources of Google Benchmark")
if(NOT EXISTS ${KT_BENCHMARK_SOURCE}/CMakeLists.txt)
  message(FATAL_ERROR "Google Benchmark is not in ${KT_BENCHMARK_SOURCE}: run ./kt bench, which fetches it")
endif()

set(BENCHMARK_ENABLE_TESTING OFF CACHE BOOL "" FORCE)
set(BENCHMARK_ENABLE_GTEST_TESTS OFF CACHE BOOL "" FORCE)
set(BENCHMARK_ENABLE_INSTALL OFF CACHE BOOL "" FORCE)
set(BENCHMARK_ENABLE_WERROR OFF CACHE BOOL "" FORCE)
# A library of fixed kind: the project's own are chosen one by one.
set(BUILD_SHARED_LIBS OFF)
add_subdirectory(${KT_BENCHMARK_SOURCE} ${CMAKE_BINARY_DIR}/benchmark EXCLUDE_FROM_ALL)
target_compile_options(benchmark PRIVATE -w)
get_target_property(benchmark_includes benchmark INTERFACE_INCLUDE_DIRECTORIES)
set_target_properties(benchmark PROPERTIES INTERFACE_SYSTEM_INCLUDE_DIRECTORIES "${benchmark_includes}")

add_library(kt_bench_peers INTERFACE)
target_link_libraries(kt_bench_peers INTERFACE benchmark KT::boost_headers KT::boost_thread)
# Both are used as headers alone: neither is packaged as a library for Windows.
target_compile_definitions(kt_bench_peers INTERFACE FMT_HEADER_ONLY SPDLOG_HEADER_ONLY)

# Boost.Serialization's binary archives, compiled from the sources that Boost.Thread comes with; elsewhere the installed
# library is used.
if(CMAKE_CROSSCOMPILING)
  file(GLOB serialization_sources ${KT_BOOST_SOURCE}/libs/serialization/src/*.cpp)
  if(NOT serialization_sources)
    message(FATAL_ERROR "Boost.Serialization's sources are not in ${KT_BOOST_SOURCE}: run ./kt bench, which fetches them")
  endif()
  list(FILTER serialization_sources EXCLUDE REGEX "/(xml|text|polymorphic|basic_text|basic_xml|codecvt|utf8)[^/]*$")
  add_library(kt_boost_serialization STATIC ${serialization_sources})
  target_link_libraries(kt_boost_serialization PUBLIC kt_boost_headers)
  target_compile_options(kt_boost_serialization PRIVATE -w)
  target_link_libraries(kt_bench_peers INTERFACE kt_boost_serialization)
else()
  find_package(Boost 1.81 REQUIRED COMPONENTS serialization)
  target_link_libraries(kt_bench_peers INTERFACE Boost::serialization)
endif()

if(CMAKE_CROSSCOMPILING)
  set(peers_only ${CMAKE_BINARY_DIR}/include-peers)
  file(MAKE_DIRECTORY ${peers_only})
  foreach(header cereal rapidjson spdlog fmt utf8 utf8.h SimpleIni.h)
    if(NOT EXISTS /usr/include/${header})
      message(FATAL_ERROR "/usr/include/${header} is missing: run ./kt bench, which installs its package")
    endif()
    file(CREATE_LINK /usr/include/${header} ${peers_only}/${header} SYMBOLIC)
  endforeach()
  target_include_directories(kt_bench_peers SYSTEM INTERFACE ${peers_only})
endif()
