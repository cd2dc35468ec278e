// Replay driver for the fuzz targets when they are not built with libFuzzer:
// runs every file named on the command line (directories are walked), then
// a fixed run of pseudo-random inputs from a fixed seed (20,000, or N with
// -runs=N, libFuzzer's spelling), so CTest exercises each target's
// invariants on every build.
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <string>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace {

void run_file(const std::filesystem::path& path) {
  std::ifstream in(path, std::ios::binary);
  std::vector<std::uint8_t> bytes((std::istreambuf_iterator<char>(in)), {});
  LLVMFuzzerTestOneInput(bytes.data(), bytes.size());
}

}  // namespace

int main(int argc, char** argv) {
  int files = 0;
  int random_runs = 20000;
  for (int i = 1; i < argc; ++i) {
    const std::string text = argv[i];
    if (text.rfind("-runs=", 0) == 0) {
      random_runs = std::stoi(text.substr(6));
      continue;
    }
    const std::filesystem::path arg(text);
    if (std::filesystem::is_directory(arg)) {
      for (const auto& entry : std::filesystem::recursive_directory_iterator(arg)) {
        if (entry.is_regular_file()) run_file(entry.path()), ++files;
      }
    } else if (std::filesystem::is_regular_file(arg)) {
      run_file(arg), ++files;
    }  // a target without a corpus folder yet: random inputs only
  }
  // Random inputs biased towards the bytes decoders care about.
  std::mt19937 rng(20261123);
  const std::uint8_t interesting[] = {0,   '%', '&', ';', '#', '=',  '<',  '>',  '\r', '\n', ' ',
                                      '+', 'a', 'F', '0', '9', 0x7F, 0x80, 0xC3, 0xE2, 0xF0, 0xFF};
  std::vector<std::uint8_t> input;
  for (int run = 0; run < random_runs; ++run) {
    input.resize(rng() % 200);
    for (auto& b : input) {
      b = (rng() % 2) ? interesting[rng() % sizeof interesting] : static_cast<std::uint8_t>(rng());
    }
    LLVMFuzzerTestOneInput(input.data(), input.size());
  }
  std::printf("replayed %d files and %d random inputs\n", files, random_runs);
  return 0;
}
