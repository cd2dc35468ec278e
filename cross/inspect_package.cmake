# Checks the plug-in package: one top folder StringGlobalsZUL/, the seven
# host platform folders (case-sensitive) each with its one library, and a flat
# help folder whose index.html has an entry per declaration of the help
# source. Run with cmake -P: -DPACKAGE=<zip> -DDECLARATIONS=<method_help.txt>
cmake_minimum_required(VERSION 3.25)
if(NOT EXISTS "${PACKAGE}")
  message(FATAL_ERROR "no package at ${PACKAGE}")
endif()
execute_process(COMMAND ${CMAKE_COMMAND} -E tar tf "${PACKAGE}" OUTPUT_VARIABLE listing RESULT_VARIABLE rc)
if(NOT rc EQUAL 0)
  message(FATAL_ERROR "cannot list ${PACKAGE}")
endif()
string(REPLACE "\n" ";" entries "${listing}")
list(FILTER entries EXCLUDE REGEX "(^$|/$)")  # files only

set(want
  "StringGlobalsZUL/Build Resources/Mac x86-64/StringGlobalsZUL.dylib"
  "StringGlobalsZUL/Build Resources/Mac arm64/StringGlobalsZUL.dylib"
  "StringGlobalsZUL/Build Resources/Mac Universal/StringGlobalsZUL.dylib"
  "StringGlobalsZUL/Build Resources/Windows x86-64/StringGlobalsZUL.dll"
  "StringGlobalsZUL/Build Resources/Windows arm64/StringGlobalsZUL.dll"
  "StringGlobalsZUL/Build Resources/Linux x86-64/libStringGlobalsZUL.so"
  "StringGlobalsZUL/Build Resources/Linux arm64/libStringGlobalsZUL.so"
  "StringGlobalsZUL/IDE Resources/Help/index.html")
foreach(file IN LISTS want)
  list(FIND entries "${file}" at)
  if(at EQUAL -1)
    message(FATAL_ERROR "package lacks ${file}")
  endif()
endforeach()
foreach(file IN LISTS entries)
  if(NOT file MATCHES "^StringGlobalsZUL/(Build Resources/[^/]+/[^/]+|IDE Resources/Help/[^/]+)$")
    message(FATAL_ERROR "unexpected file in package: ${file}")
  endif()
  if(file MATCHES "^StringGlobalsZUL/Build Resources/" AND NOT file IN_LIST want)
    message(FATAL_ERROR "unexpected library in package: ${file}")
  endif()
endforeach()

# The packaged help page holds every declaration of the help source.
set(unpack "${CMAKE_CURRENT_BINARY_DIR}/inspect-package")
file(REMOVE_RECURSE "${unpack}")
file(MAKE_DIRECTORY "${unpack}")
execute_process(COMMAND ${CMAKE_COMMAND} -E tar xf "${PACKAGE}" WORKING_DIRECTORY "${unpack}")
file(READ "${unpack}/StringGlobalsZUL/IDE Resources/Help/index.html" page)
file(STRINGS "${DECLARATIONS}" declarations REGEX "^@ ")
list(LENGTH declarations count)
if(NOT count EQUAL 64)
  message(FATAL_ERROR "help source lists ${count} declarations, expected 64")
endif()
foreach(line IN LISTS declarations)
  string(REGEX REPLACE "^@ " "" declaration "${line}")
  string(REPLACE "\"" "&quot;" declaration "${declaration}")
  string(FIND "${page}" "<pre class=\"decl\">${declaration}</pre>" at)
  if(at EQUAL -1)
    message(FATAL_ERROR "help page lacks ${declaration}")
  endif()
endforeach()
file(REMOVE_RECURSE "${unpack}")
message(STATUS "package ${PACKAGE}: 7 platform folders, help with ${count} entries")
