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
    # Without their debug information, which is ten times as large as they are, and which every crash dump would read.
    file(MAKE_DIRECTORY ${CMAKE_BINARY_DIR}/bin)
    execute_process(COMMAND ${CMAKE_STRIP} --strip-unneeded -o ${CMAKE_BINARY_DIR}/bin/${name} ${path}
                    COMMAND_ERROR_IS_FATAL ANY)
    list(APPEND KT_RUNTIME_DLLS ${CMAKE_BINARY_DIR}/bin/${name})
  endforeach()
endif()
