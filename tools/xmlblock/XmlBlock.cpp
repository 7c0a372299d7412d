// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "xmlblock/XmlBlock.h"

#include <zlib.h>

#include <limits>
#include <stdexcept>

#include "xmlblock/HexByte.h"

XmlBlock::XmlBlock(const std::string& document) {
  if (document.empty()) {
    throw std::runtime_error("the description document is empty");
  }
  const std::vector<unsigned char> compressed = Compress(document);
  Verify(compressed, document);
  appendText(kHeader);
  header = block.size();
  appendText(kLengthKey + std::to_string(compressed.size()));
  block.insert(block.end(), compressed.begin(), compressed.end());
  appendText(kTrailer);
}

std::vector<unsigned char> XmlBlock::Compress(const std::string& document) {
  if (document.size() > std::numeric_limits<uLong>::max() / 2) {
    throw std::runtime_error("the description document is too large");
  }
  const auto sourceLength = static_cast<uLong>(document.size());
  uLongf length = compressBound(sourceLength);
  std::vector<unsigned char> compressed(length);
  const int result =
      compress2(compressed.data(), &length, reinterpret_cast<const Bytef*>(document.data()),
                sourceLength, Z_DEFAULT_COMPRESSION);
  if (result != Z_OK) {
    throw std::runtime_error(std::string("zlib compress2 failed: ") + zError(result));
  }
  compressed.resize(length);
  return compressed;
}

void XmlBlock::Verify(const std::vector<unsigned char>& compressed, const std::string& document) {
  // 78 9C is the zlib header of a 32 KiB window at the default level; the
  // host's reader relies on it.
  if (compressed.size() < 2 || compressed[0] != 0x78 || compressed[1] != 0x9C) {
    std::string found;
    for (std::size_t i = 0; i < compressed.size() && i < 2; ++i) {
      found += HexByte(compressed[i]) + " ";
    }
    throw std::runtime_error("the zlib stream begins with " + found + "instead of 78 9c");
  }
  std::string inflated(document.size(), '\0');
  auto inflatedLength = static_cast<uLongf>(inflated.size());
  auto consumed = static_cast<uLong>(compressed.size());
  const int result = uncompress2(reinterpret_cast<Bytef*>(inflated.data()), &inflatedLength,
                                 compressed.data(), &consumed);
  if (result != Z_OK || inflatedLength != document.size() || consumed != compressed.size() ||
      inflated != document) {
    throw std::runtime_error("the zlib stream does not inflate back to the document");
  }
}

void XmlBlock::appendText(const std::string& text) {
  block.insert(block.end(), text.begin(), text.end());
  block.push_back(0);
}
