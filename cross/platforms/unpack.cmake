# Unpacks the plug-in package into an empty folder. Run with cmake -P:
#   -DPACKAGE=<zip> -DDESTINATION=<folder>
cmake_minimum_required(VERSION 3.25)
if(NOT EXISTS "${PACKAGE}")
  message(FATAL_ERROR "no package at ${PACKAGE}: build it first (tools/package.sh)")
endif()
file(REMOVE_RECURSE "${DESTINATION}")
file(MAKE_DIRECTORY "${DESTINATION}")
execute_process(COMMAND ${CMAKE_COMMAND} -E tar xf "${PACKAGE}" WORKING_DIRECTORY "${DESTINATION}"
                RESULT_VARIABLE rc)
if(NOT rc EQUAL 0)
  message(FATAL_ERROR "cannot unpack ${PACKAGE}")
endif()
