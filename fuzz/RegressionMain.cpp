// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// Runs a fuzz target over the files of a corpus, without the fuzzing engine:
// the seed corpus and the saved reproducers become an ordinary test. Each
// argument is a file or a folder of files (not searched recursively); a run
// that finds no file at all fails, so an emptied corpus cannot pass unseen.

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <system_error>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace {

std::vector<std::filesystem::path> InputsOf(const std::filesystem::path& argument) {
  std::vector<std::filesystem::path> inputs;
  std::error_code error;
  if (!std::filesystem::is_directory(argument, error)) {
    inputs.push_back(argument);
    return inputs;
  }
  for (const auto& entry : std::filesystem::directory_iterator(argument, error)) {
    if (entry.is_regular_file(error)) {
      inputs.push_back(entry.path());
    }
  }
  std::sort(inputs.begin(), inputs.end());
  return inputs;
}

bool Run(const std::filesystem::path& input) {
  std::ifstream file(input, std::ios::binary);
  if (!file) {
    std::fprintf(stderr, "cannot read %s\n", input.c_str());
    return false;
  }
  const std::vector<char> bytes((std::istreambuf_iterator<char>(file)),
                                std::istreambuf_iterator<char>());
  // A copy of exactly the input's size, so reading past it is caught.
  std::vector<std::uint8_t> exact(bytes.begin(), bytes.end());
  static const std::uint8_t kNothing = 0;
  LLVMFuzzerTestOneInput(exact.empty() ? &kNothing : exact.data(), exact.size());
  return true;
}

}  // namespace

int main(int argc, char** argv) {
  std::size_t ran = 0;
  for (int i = 1; i < argc; ++i) {
    for (const auto& input : InputsOf(argv[i])) {
      if (!Run(input)) {
        return 1;
      }
      ++ran;
    }
  }
  std::printf("%zu inputs ran\n", ran);
  return ran == 0 ? 1 : 0;
}
