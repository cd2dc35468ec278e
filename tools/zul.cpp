// zul: lists the functions the plug-in registers and calls them by name
// through the stand-in host, e.g. `zul call InStrBytesZUL "hello world" ow`.
// The work is in host/zul_cli.cpp, where the tests reach it too.
#include <iostream>
#include <string>
#include <vector>

#include "host/zul_cli.h"

#ifndef ZUL_DEFAULT_PLUGIN
#define ZUL_DEFAULT_PLUGIN "libStringGlobalsZUL.so"
#endif

int main(int argc, char** argv) {
  const std::vector<std::string> args(argv + 1, argv + argc);
  return zul_host::run_zul(args, ZUL_DEFAULT_PLUGIN, std::cout, std::cerr);
}
