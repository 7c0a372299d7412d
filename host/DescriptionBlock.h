// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>

// Reads the description block a protocol hands out through GetXml(): the
// pointer is positioned at the length line ("compressedXML=" and the decimal
// byte count of the zlib stream, ended by a zero byte); the stream follows,
// then the trailer "<<TAVU_XML_END>>" and a zero byte. Exactly the stated
// number of bytes is inflated; the stream must end there, and the trailer
// must follow it.
class DescriptionBlock {
 public:
  // Largest compressed stream and largest document accepted; a length line
  // beyond them is taken as damage rather than read.
  static constexpr std::size_t kMaxStreamBytes = 16U << 20U;
  static constexpr std::size_t kMaxDocumentBytes = 64U << 20U;

  // Reads the block at lengthLine (may be null). Never throws for a bad
  // block: Ok() tells, Error() says why.
  explicit DescriptionBlock(const char* lengthLine);

  bool Ok() const { return error_.empty(); }
  // The inflated document; empty unless Ok().
  const std::string& Document() const { return document_; }
  // Why the block was refused; empty when it was read.
  const std::string& Error() const { return error_; }

 private:
  bool ReadLengthLine(const char* lengthLine, std::size_t& streamBytes, std::size_t& lineBytes);
  bool Inflate(const unsigned char* stream, std::size_t streamBytes);
  bool CheckTrailer(const char* trailer);

  std::string document_;
  std::string error_;
};
