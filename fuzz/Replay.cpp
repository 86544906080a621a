// Runs a target over every file of the folders that are named, without an engine; after
// `--random COUNT` over so many inputs of random bytes, too.
#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "Input.h"

namespace {

// None where there is no such folder.
std::vector<std::filesystem::path> FilesIn(const char* folder) {
  std::vector<std::filesystem::path> files;
  if (!std::filesystem::exists(folder)) return files;
  for (const auto& file : std::filesystem::directory_iterator(folder)) {
    files.push_back(file.path());
  }
  std::sort(files.begin(), files.end());
  return files;
}

// From a block that ends where the input ends.
void Run(const std::string& input) {
  const auto block = std::make_unique<uint8_t[]>(input.size());
  std::copy(input.begin(), input.end(), block.get());
  LLVMFuzzerTestOneInput(block.get(), input.size());
}

void Replay(const std::filesystem::path& path) {
  std::ifstream stream(path, std::ios::binary);
  Require(stream.is_open(), "an input can be opened");
  Run(std::string(std::istreambuf_iterator<char>(stream), {}));
}

void RunRandom(size_t count) {
  std::mt19937 random(8);
  for (size_t number = 0; number < count; ++number) {
    std::string input(random() % 2048, 0);
    for (char& byte : input) byte = static_cast<char>(random() >> 24);
    std::fprintf(stderr, "\rrandom input %zu", number);
    Run(input);
  }
  std::fprintf(stderr, "\n");
}

}  // namespace

int main(int argc, char** argv) {
  size_t count = 0;
  for (int i = 1; i < argc; ++i) {
    if (argv[i] == std::string("--random")) {
      Require(i + 1 < argc, "a count follows --random");
      const size_t randomCount = std::stoul(argv[++i]);
      RunRandom(randomCount);
      count += randomCount;
      continue;
    }
    for (const auto& file : FilesIn(argv[i])) {
      std::fprintf(stderr, "%s\n", file.string().c_str());
      Replay(file);
      ++count;
    }
  }
  std::fprintf(stderr, "%zu inputs\n", count);
  return count == 0 ? 1 : 0;
}
