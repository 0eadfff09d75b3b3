# kt_compile_options: what every target of this project is compiled with.

add_library(kt_compile_options INTERFACE)
# Our own code is compiled as C++23, whose std::string::resize_and_overwrite saves clearing memory that is written anyway;
# the headers need C++20 only. As a feature, because CMake's own option for a target's C++20 would override a plain one.
target_compile_features(kt_compile_options INTERFACE cxx_std_23)

if(MSVC)
  target_compile_options(kt_compile_options INTERFACE /W4 /WX /utf-8 /permissive- /EHa)
  target_compile_definitions(kt_compile_options INTERFACE _CRT_SECURE_NO_WARNINGS)
else()
  target_compile_options(
    kt_compile_options
    INTERFACE -Wall
              -Wextra
              -Wpedantic
              -Wshadow
              -Wconversion
              -Wnon-virtual-dtor
              -Woverloaded-virtual
              -Werror
              # Two exported queries return constant values, as their callers expect.
              -Wno-ignored-qualifiers
              -fno-math-errno
              # No path of the building machine in the products.
              -ffile-prefix-map=${CMAKE_SOURCE_DIR}=.)
endif()

target_compile_definitions(
  kt_compile_options
  INTERFACE $<$<BOOL:${WIN32}>:WIN32_LEAN_AND_MEAN
            NOMINMAX
            UNICODE
            _UNICODE
            WINVER=0x0A00
            _WIN32_WINNT=0x0A00>)

if(KT_SANITIZE)
  add_compile_options(-fsanitize=${KT_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer)
  string(REPLACE "fuzzer-no-link," "" link_sanitizers "${KT_SANITIZE}")
  add_link_options(-fsanitize=${link_sanitizers})
endif()
