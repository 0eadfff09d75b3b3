# What `cmake --install` puts into a prefix. Everything in it is relative to the prefix, which may be moved.
#
#     bin/                   KTPublic.dll, the compiler's run-time DLLs, and ktdict.exe (tools/CMakeLists.txt)
#     lib/                   the import library
#     lib/cmake/KTPublic/    the CMake package: find_package(KTPublic) gives KTPublic::KTPublic
#     include/KTPublic/      the public headers
#     share/KTPublic/        the debugger visualiser
#     share/doc/KTPublic/    README.md, and docs/ with the pages that it links to and the licences' texts

include(CMakePackageConfigHelpers)

set(kt_package_folder ${CMAKE_INSTALL_LIBDIR}/cmake/KTPublic)
set(kt_doc_folder ${CMAKE_INSTALL_DATADIR}/doc/KTPublic)

# The library's own dependencies are private and linked into the DLL, so the exported target names none of them.
install(
  TARGETS KTPublic
  EXPORT KTPublicTargets
  RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR}
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR})
install(FILES ${KT_RUNTIME_DLLS} DESTINATION ${CMAKE_INSTALL_BINDIR})
install(DIRECTORY source/public/includes/ DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/KTPublic FILES_MATCHING PATTERN "*.h")
install(EXPORT KTPublicTargets NAMESPACE KTPublic:: DESTINATION ${kt_package_folder})

# Names of the run-time DLLs beside the library, for hosts that copy them.
set(KT_RUNTIME_DLL_NAMES "")
foreach(path IN LISTS KT_RUNTIME_DLLS)
  get_filename_component(name ${path} NAME)
  list(APPEND KT_RUNTIME_DLL_NAMES ${name})
endforeach()
# The package serves compilers with the library's own C++ ABI only.
if(MSVC)
  set(KT_PACKAGE_ABI MSVC)
else()
  set(KT_PACKAGE_ABI MINGW)
endif()
configure_package_config_file(
  cmake/KTPublicConfig.cmake.in ${CMAKE_BINARY_DIR}/KTPublicConfig.cmake
  INSTALL_DESTINATION ${kt_package_folder}
  PATH_VARS CMAKE_INSTALL_BINDIR)
write_basic_package_version_file(${CMAKE_BINARY_DIR}/KTPublicConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_BINARY_DIR}/KTPublicConfig.cmake ${CMAKE_BINARY_DIR}/KTPublicConfigVersion.cmake
        DESTINATION ${kt_package_folder})

install(FILES source/KTPublic.natvis DESTINATION ${CMAKE_INSTALL_DATADIR}/KTPublic)
# As in the sources, so that the links between the pages lead somewhere.
install(FILES README.md DESTINATION ${kt_doc_folder})
install(DIRECTORY docs/ DESTINATION ${kt_doc_folder}/docs FILES_MATCHING PATTERN "*.md")

# The full texts, as the packages of the parts inside and beside the DLL bring them.
if(CMAKE_CROSSCOMPILING)
  foreach(package libboost1.81-dev libcli11-dev gcc-mingw-w64-x86-64-posix-runtime mingw-w64-x86-64-dev)
    set(copyright /usr/share/doc/${package}/copyright)
    if(EXISTS ${copyright})
      install(FILES ${copyright} DESTINATION ${kt_doc_folder}/docs/copyright RENAME ${package}.txt)
    endif()
  endforeach()
endif()
