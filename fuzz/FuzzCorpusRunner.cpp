// Runs a fuzz target's entry point once on each file it is given, or on
// each file of each directory it is given, so that a compiler without
// libFuzzer still builds the target and replays its corpus as a regression
// test. Exits non-zero when a path cannot be read; a failing input aborts
// inside the target.
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(uint8_t const* data, size_t size);

namespace {

bool runFile(std::filesystem::path const& path) {
  std::ifstream file(path, std::ios::binary);
  if (!file)
    return false;
  std::string const bytes((std::istreambuf_iterator<char>(file)), std::istreambuf_iterator<char>());
  LLVMFuzzerTestOneInput(reinterpret_cast<uint8_t const*>(bytes.data()), bytes.size());
  return true;
}

}  // namespace

int main(int argc, char** argv) {
  size_t inputs = 0;
  for (int i = 1; i < argc; ++i) {
    std::filesystem::path const path(argv[i]);
    std::vector<std::filesystem::path> files;
    if (std::filesystem::is_directory(path)) {
      for (auto const& entry : std::filesystem::directory_iterator(path))
        files.push_back(entry.path());
    } else {
      files.push_back(path);
    }
    for (auto const& file : files) {
      if (!runFile(file)) {
        std::fprintf(stderr, "cannot read %s\n", file.c_str());
        return 1;
      }
      ++inputs;
    }
  }
  std::printf("%zu inputs ran\n", inputs);
  return 0;
}
