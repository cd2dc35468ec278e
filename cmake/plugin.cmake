# The plug-in: every .cpp of the shared host-free primitives (common/), the
# frame and the four families, except tests and benchmarks, compiled once
# into zul_objects. zul_core (static) is what
# unit tests link; StringGlobalsZUL (shared) is what users ship, exporting
# REALPluginMain and nothing else.
set(ZUL_FAMILIES common plugin search encodings binary text)
set(ZUL_SOURCES "")
foreach(dir IN LISTS ZUL_FAMILIES)
  file(GLOB family_sources CONFIGURE_DEPENDS "${PROJECT_SOURCE_DIR}/${dir}/*.cpp")
  list(FILTER family_sources EXCLUDE REGEX "_(test|bench|fuzz)\\.cpp$")
  list(APPEND ZUL_SOURCES ${family_sources})
endforeach()

add_library(zul_objects OBJECT ${ZUL_SOURCES})
target_include_directories(zul_objects PUBLIC ${PROJECT_SOURCE_DIR})
# Fuzzing builds instrument the library itself for coverage; libFuzzer in
# the fuzz target supplies the callbacks.
option(ZUL_LIBFUZZER "Build fuzz targets with libFuzzer and instrument the library (clang)" OFF)
if(ZUL_LIBFUZZER)
  target_compile_options(zul_objects PRIVATE -fsanitize=fuzzer-no-link)
endif()

add_library(zul_core STATIC $<TARGET_OBJECTS:zul_objects>)
target_include_directories(zul_core PUBLIC ${PROJECT_SOURCE_DIR})

add_library(StringGlobalsZUL SHARED $<TARGET_OBJECTS:zul_objects>)
set_target_properties(StringGlobalsZUL PROPERTIES OUTPUT_NAME StringGlobalsZUL)
if(APPLE OR WIN32)
  set_target_properties(StringGlobalsZUL PROPERTIES PREFIX "")
endif()

# One exported symbol. The C++ runtime is linked in and kept hidden so two
# plug-ins in one host process never share or clash over it.
if(CMAKE_SYSTEM_NAME STREQUAL "Linux")
  target_link_options(StringGlobalsZUL PRIVATE
    "LINKER:--version-script=${PROJECT_SOURCE_DIR}/cmake/exports.map"
    "LINKER:--exclude-libs,ALL")
  if(NOT ZUL_SANITIZE)
    target_link_options(StringGlobalsZUL PRIVATE -static-libstdc++ -static-libgcc)
    if(NOT ZUL_LIBFUZZER)  # the coverage callbacks come from the fuzz target
      target_link_options(StringGlobalsZUL PRIVATE "LINKER:--no-undefined")
    endif()
  endif()
endif()
