# Puts the compiler's run-time DLLs beside the programs: host and library must share one of each, or an exception thrown
# by the library could not be caught by the host. KT_RUNTIME_DLLS lists them for the installation.

set(KT_RUNTIME_DLLS "")
if(MINGW)
  foreach(name libstdc++-6.dll libgcc_s_seh-1.dll libwinpthread-1.dll)
    execute_process(
      COMMAND ${CMAKE_CXX_COMPILER} -print-file-name=${name}
      OUTPUT_VARIABLE path
      OUTPUT_STRIP_TRAILING_WHITESPACE)
    if(NOT IS_ABSOLUTE "${path}")
      message(FATAL_ERROR "The compiler does not say where ${name} is")
    endif()
    file(COPY ${path} DESTINATION ${CMAKE_BINARY_DIR}/bin)
    list(APPEND KT_RUNTIME_DLLS ${CMAKE_BINARY_DIR}/bin/${name})
  endforeach()
endif()
