// Runs a target over every file of the folders that are named, without an engine; after
// `--random COUNT` over so many inputs of random bytes, too, and after `--mutated COUNT` over so
// many that are made of pieces of the files before it.
#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "fuzz/Input.h"

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

std::string Replay(const std::filesystem::path& path) {
  std::ifstream stream(path, std::ios::binary);
  Require(stream.is_open(), "an input can be opened");
  std::string input(std::istreambuf_iterator<char>(stream), {});
  Run(input);
  return input;
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

// A piece of `donor`, any byte, or a small number takes the place of a piece of `input`.
void Mutate(std::string& input, const std::string& donor, std::mt19937& random) {
  const size_t at = random() % (input.size() + 1);
  const size_t length = random() % (random() % 4 == 0 ? input.size() + 1 : 8);
  switch (random() % 4) {
    case 0:
      input.replace(at, length, donor, random() % (donor.size() + 1), random() % 32);
      break;
    case 1:
      input.replace(at, 1, 1, static_cast<char>(random()));
      break;
    case 2:
      input.replace(at, 1, 1, static_cast<char>(random() % 8));
      break;
    default:
      random() % 4 == 0 ? input.erase(at) : input.erase(at, length);
  }
}

void RunMutated(size_t count, const std::vector<std::string>& inputs) {
  Require(!inputs.empty(), "files come before --mutated");
  std::mt19937 random(9);
  const auto any = [&]() -> const std::string& { return inputs[random() % inputs.size()]; };
  for (size_t number = 0; number < count; ++number) {
    std::string input = any();
    if (random() % 8 == 0) input += kSeparator + any();
    for (size_t changes = random() % 4; changes-- > 0;) Mutate(input, any(), random);
    std::fprintf(stderr, "\rmutated input %zu", number);
    Run(input);
  }
  std::fprintf(stderr, "\n");
}

}  // namespace

int main(int argc, char** argv) {
  std::vector<std::string> inputs;
  size_t count = 0;
  for (int i = 1; i < argc; ++i) {
    const std::string argument = argv[i];
    if (argument == "--random" || argument == "--mutated") {
      Require(i + 1 < argc, "a count follows");
      const size_t made = std::stoul(argv[++i]);
      argument == "--random" ? RunRandom(made) : RunMutated(made, inputs);
      count += made;
      continue;
    }
    for (const auto& file : FilesIn(argv[i])) {
      std::fprintf(stderr, "%s\n", file.string().c_str());
      inputs.push_back(Replay(file));
    }
  }
  count += inputs.size();
  std::fprintf(stderr, "%zu inputs\n", count);
  return count == 0 ? 1 : 0;
}
