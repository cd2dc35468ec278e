// help_gen: writes the in-IDE help page from the help source.
//   help_gen <method_help.txt> <index.html>
// Fails (exit 1, message on stderr) when the source does not parse or the
// page would hold a link to nowhere, so a broken page never gets packaged.
#include <filesystem>
#include <fstream>
#include <iostream>
#include <iterator>
#include <sstream>

#include "tools/help_page.h"

int main(int argc, char** argv) {
  if (argc != 3) {
    std::cerr << "usage: help_gen <method_help.txt> <index.html>\n";
    return 2;
  }
  std::ifstream in(argv[1], std::ios::binary);
  if (!in) {
    std::cerr << "help_gen: cannot read " << argv[1] << "\n";
    return 1;
  }
  std::string source((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  zul::help::parsed help = zul::help::parse_help(source);
  if (!help.error.empty()) {
    std::cerr << argv[1] << ": " << help.error << "\n";
    return 1;
  }
  std::string html = zul::help::render_help(help.entries);
  for (const std::string& link : zul::help::broken_links(html)) {
    std::cerr << "help_gen: broken link " << link << "\n";
    return 1;
  }
  std::filesystem::path out(argv[2]);
  if (out.has_parent_path()) std::filesystem::create_directories(out.parent_path());
  std::ofstream file(out, std::ios::binary);
  file << html;
  if (!file.flush()) {
    std::cerr << "help_gen: cannot write " << argv[2] << "\n";
    return 1;
  }
  std::cout << "help_gen: " << help.entries.size() << " entries -> " << argv[2] << "\n";
  return 0;
}
