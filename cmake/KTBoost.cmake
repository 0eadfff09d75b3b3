# KT::boost_headers and KT::boost_thread, for the library, its tests and its benchmarks.
#
# Debian packages Boost's headers, but not Boost.Thread for Windows; that is compiled here from the sources of Debian's
# own package, which KT_BOOST_SOURCE names (`./kt` fetches them). Elsewhere the installed Boost is used.

set(boost_definitions BOOST_ALL_NO_LIB BOOST_THREAD_USES_DATETIME)

if(NOT (WIN32 AND CMAKE_CROSSCOMPILING))
  find_package(Boost 1.81 REQUIRED COMPONENTS thread)
  add_library(kt_boost_headers INTERFACE)
  target_link_libraries(kt_boost_headers INTERFACE Boost::headers)
  target_compile_definitions(kt_boost_headers INTERFACE ${boost_definitions})
  add_library(KT::boost_headers ALIAS kt_boost_headers)
  add_library(KT::boost_thread ALIAS Boost::thread)
  return()
endif()

set(KT_BOOST_SOURCE ${CMAKE_SOURCE_DIR}/build/sources/boost1.81 CACHE PATH "Unpacked sources of Boost")

# The cross compiler sees Boost's folder alone: the rest of /usr/include belongs to Linux.
set(boost_only ${CMAKE_BINARY_DIR}/include-boost)
file(MAKE_DIRECTORY ${boost_only})
file(CREATE_LINK /usr/include/boost ${boost_only}/boost SYMBOLIC)

add_library(kt_boost_headers INTERFACE)
add_library(KT::boost_headers ALIAS kt_boost_headers)
target_include_directories(kt_boost_headers SYSTEM INTERFACE ${boost_only})
target_compile_definitions(kt_boost_headers INTERFACE ${boost_definitions} BOOST_THREAD_USE_LIB)

set(thread_source ${KT_BOOST_SOURCE}/libs/thread/src)
if(NOT EXISTS ${thread_source}/future.cpp)
  message(FATAL_ERROR "Boost.Thread's sources are not in ${KT_BOOST_SOURCE}: run ./kt build, which fetches them")
endif()
add_library(
  kt_boost_thread STATIC
  ${thread_source}/win32/thread.cpp ${thread_source}/win32/tss_dll.cpp ${thread_source}/win32/tss_pe.cpp
  ${thread_source}/win32/thread_primitives.cpp ${thread_source}/future.cpp)
add_library(KT::boost_thread ALIAS kt_boost_thread)
target_link_libraries(kt_boost_thread PUBLIC kt_boost_headers)
target_compile_definitions(kt_boost_thread PRIVATE BOOST_THREAD_BUILD_LIB)
target_compile_options(kt_boost_thread PRIVATE -w)
target_compile_features(kt_boost_thread PRIVATE cxx_std_20)
