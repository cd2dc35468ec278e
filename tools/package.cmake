# Stages and zips the plug-in package:
#   StringGlobalsZUL/Build Resources/<platform>/<library>
#   StringGlobalsZUL/IDE Resources/Help/<pages>
# Platform folder names are the host's, case-sensitive. Run with cmake -P:
#   -DARTIFACTS_FILE=<file of "<platform>|<library>" lines> -DHELP_DIR=... -DSTAGE=... -DOUTPUT=...
cmake_minimum_required(VERSION 3.25)
foreach(var ARTIFACTS_FILE HELP_DIR STAGE OUTPUT)
  if(NOT DEFINED ${var})
    message(FATAL_ERROR "package.cmake needs -D${var}=...")
  endif()
endforeach()

file(STRINGS "${ARTIFACTS_FILE}" artifacts)
set(root "${STAGE}/StringGlobalsZUL")
file(REMOVE_RECURSE "${STAGE}")
foreach(entry IN LISTS artifacts)
  string(REGEX REPLACE "\\|.*" "" platform "${entry}")
  string(REGEX REPLACE "^[^|]*\\|" "" library "${entry}")
  if(NOT EXISTS "${library}")
    message(FATAL_ERROR "missing library for ${platform}: ${library}")
  endif()
  file(COPY "${library}" DESTINATION "${root}/Build Resources/${platform}")
endforeach()

# The help folder is flat: every page sits beside index.html.
file(GLOB pages LIST_DIRECTORIES false "${HELP_DIR}/*")
if(NOT EXISTS "${HELP_DIR}/index.html")
  message(FATAL_ERROR "missing ${HELP_DIR}/index.html")
endif()
file(COPY ${pages} DESTINATION "${root}/IDE Resources/Help")

file(REMOVE "${OUTPUT}")
execute_process(COMMAND ${CMAKE_COMMAND} -E tar cf "${OUTPUT}" --format=zip StringGlobalsZUL
  WORKING_DIRECTORY "${STAGE}" RESULT_VARIABLE result)
if(NOT result EQUAL 0)
  message(FATAL_ERROR "could not write ${OUTPUT}")
endif()
file(SIZE "${OUTPUT}" size)
message(STATUS "Package ${OUTPUT}: ${size} bytes")
