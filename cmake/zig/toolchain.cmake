# Toolchain for one cross target built with zig's clang (see zig-cxx.sh).
# Inputs, given by the cross build (cross/CMakeLists.txt): ZUL_TARGET (one of
# mac-x86_64, mac-arm64, win-x86_64, win-arm64, linux-x86_64, linux-arm64) and
# ZUL_ZIG_WRAPPERS (the folder holding <target>-cc, <target>-c++, -ar, -ranlib).
set(CMAKE_TRY_COMPILE_PLATFORM_VARIABLES ZUL_TARGET ZUL_ZIG_WRAPPERS)

if(ZUL_TARGET MATCHES "^mac-")
  set(CMAKE_SYSTEM_NAME Darwin)
  # Keep CMake from probing for an Xcode SDK: zig brings its own headers.
  set(CMAKE_OSX_SYSROOT "" CACHE PATH "" FORCE)
  set(CMAKE_OSX_DEPLOYMENT_TARGET "" CACHE STRING "" FORCE)
elseif(ZUL_TARGET MATCHES "^win-")
  set(CMAKE_SYSTEM_NAME Windows)
elseif(ZUL_TARGET MATCHES "^linux-")
  set(CMAKE_SYSTEM_NAME Linux)
else()
  message(FATAL_ERROR "ZUL_TARGET '${ZUL_TARGET}' is not a cross target")
endif()
if(ZUL_TARGET MATCHES "x86_64$")
  set(CMAKE_SYSTEM_PROCESSOR x86_64)
else()
  set(CMAKE_SYSTEM_PROCESSOR aarch64)
endif()

set(CMAKE_C_COMPILER "${ZUL_ZIG_WRAPPERS}/${ZUL_TARGET}-cc")
set(CMAKE_CXX_COMPILER "${ZUL_ZIG_WRAPPERS}/${ZUL_TARGET}-c++")
set(CMAKE_AR "${ZUL_ZIG_WRAPPERS}/zig-ar" CACHE FILEPATH "" FORCE)
set(CMAKE_RANLIB "${ZUL_ZIG_WRAPPERS}/zig-ranlib" CACHE FILEPATH "" FORCE)
set(CMAKE_RC_COMPILER "${ZUL_ZIG_WRAPPERS}/zig-rc" CACHE FILEPATH "" FORCE)

# Compiler checks compile only: linking a test executable would build zig's
# whole C++ runtime once more for nothing.
set(CMAKE_TRY_COMPILE_TARGET_TYPE STATIC_LIBRARY)

set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
