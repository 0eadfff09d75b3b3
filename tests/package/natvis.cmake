# natvis.cmake: the debugger's visualiser is a file that the debugger can read, and it names what there is.
#
#     cmake -DNATVIS=... -DHEADERS=... -P natvis.cmake
#
# Checked: every element is closed where it belongs; every type is a class of the public headers, and every member of the
# library's that a text shows is declared there. What the texts then look like only Visual Studio shows.

cmake_minimum_required(VERSION 3.25)
set(problems "")

file(READ ${NATVIS} text)
string(REPLACE ";" " " text "${text}") # means something to CMake's lists

set(declarations "")
file(GLOB headers ${HEADERS}/*.h)
foreach(header IN LISTS headers)
  file(READ ${header} content)
  string(APPEND declarations "${content}")
endforeach()

# ---- elements ----

string(REGEX MATCHALL "</?[A-Za-z]+[^<>]*>" tags "${text}")
set(open "")
foreach(tag IN LISTS tags)
  if(tag MATCHES "/>$")
    continue()
  elseif(tag MATCHES "^</([A-Za-z]+)")
    set(name ${CMAKE_MATCH_1})
    list(POP_BACK open last)
    if(NOT name STREQUAL "${last}")
      string(APPEND problems "${tag} closes \"${last}\"\n")
    endif()
  elseif(tag MATCHES "^<([A-Za-z]+)")
    set(name ${CMAKE_MATCH_1})
    if(name STREQUAL "Type" AND "Type" IN_LIST open)
      string(APPEND problems "${tag} stands inside of another type\n")
    endif()
    list(APPEND open ${name})
  endif()
endforeach()
if(open)
  string(APPEND problems "not closed: ${open}\n")
endif()

# ---- names ----

string(REGEX MATCHALL "Type Name=\"[A-Za-z0-9_:]+\"" types "${text}")
if(NOT types)
  string(APPEND problems "no types\n")
endif()
foreach(type IN LISTS types)
  string(REGEX REPLACE ".*[\":]([A-Za-z0-9_]+)\"" "\\1" name "${type}")
  if(NOT declarations MATCHES "(class|struct) (KT_PUBLIC_API )?${name}[ ;\n]")
    string(APPEND problems "no public header has a class ${name}\n")
  endif()
endforeach()
string(REGEX MATCHALL "m_[A-Za-z0-9]+" members "${text}")
list(REMOVE_DUPLICATES members)
foreach(member IN LISTS members)
  if(NOT declarations MATCHES "[ *&]${member}[ ;]")
    string(APPEND problems "no public header has a member ${member}\n")
  endif()
endforeach()

if(problems)
  message(FATAL_ERROR "${NATVIS}:\n${problems}")
endif()
