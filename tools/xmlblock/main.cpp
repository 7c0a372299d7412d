// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// velt-xmlblock INPUT.xml OUTPUT.cpp
//
// Compresses the driver's XML description and writes the C++ source of the
// Xml_VELT block that the plug-in carries. The output is replaced atomically,
// so an interrupted build never leaves a half-written source behind.
#include <cstdio>
#include <exception>
#include <stdexcept>
#include <string>

#include "xmlblock/AtomicFile.h"
#include "xmlblock/BlockSource.h"
#include "xmlblock/InputFile.h"
#include "xmlblock/XmlBlock.h"

namespace {

std::string BaseName(const std::string& path) {
  const std::size_t slash = path.find_last_of('/');
  return slash == std::string::npos ? path : path.substr(slash + 1);
}

// Errors of the block itself name the document they came from.
XmlBlock Compile(const std::string& input) {
  const std::string document = InputFile::Read(input);
  try {
    return XmlBlock(document);
  } catch (const std::exception& error) {
    throw std::runtime_error(input + ": " + error.what());
  }
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 3) {
    // A failed write to standard error has nowhere left to be reported.
    (void)std::fputs("usage: velt-xmlblock INPUT.xml OUTPUT.cpp\n", stderr);
    return 2;
  }
  const std::string input = argv[1];
  const std::string output = argv[2];
  try {
    const XmlBlock block = Compile(input);
    AtomicFile::Write(output, BlockSource::Render(block, BaseName(input)));
  } catch (const std::exception& error) {
    (void)std::fprintf(stderr, "velt-xmlblock: %s\n", error.what());
    return 1;
  }
  return 0;
}
