// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

#include "xmlblock/XmlBlock.h"

// The C++ source that puts a description block into the plug-in. It defines,
// as declared by driver/XmlDescription.h:
//   const unsigned char Xml_VELT[]    the block's bytes
//   const std::size_t XmlSize_VELT    their count
//   const char* GetXml_VELT()         a pointer to the block's length line
class BlockSource {
 public:
  // documentName names the source document in the file's leading comment.
  static std::string Render(const XmlBlock& block, const std::string& documentName);
};
