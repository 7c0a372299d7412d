// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>
#include <vector>

// The driver's description block exactly as the plug-in carries it:
//   header       "<<TAVU_XML_START>>Name=VELT?...?Platform=QX42_LIN" and a zero byte
//   length line  "compressedXML=" and the stream's decimal length and a zero byte
//   stream       the document, zlib-compressed at the default level
//   trailer      "<<TAVU_XML_END>>" and a zero byte
class XmlBlock {
 public:
  static constexpr const char* kHeader =
      "<<TAVU_XML_START>>Name=VELT?FullName=Velt Conduit?Version=112?Platform=QX42_LIN";
  static constexpr const char* kLengthKey = "compressedXML=";
  static constexpr const char* kTrailer = "<<TAVU_XML_END>>";

  // Compresses the document and lays the block out. Throws std::runtime_error
  // when the document is empty, when zlib fails, when the stream does not
  // begin with the bytes 78 9C that the host's reader expects, or when it
  // does not inflate back to exactly the document.
  explicit XmlBlock(const std::string& document);

  [[nodiscard]] const std::vector<unsigned char>& bytes() const { return block; }
  // Bytes up to and including the header's zero byte; the host is handed a
  // pointer this far into the block, at the length line.
  [[nodiscard]] std::size_t headerSize() const { return header; }

 private:
  static std::vector<unsigned char> Compress(const std::string& document);
  static void Verify(const std::vector<unsigned char>& compressed, const std::string& document);
  void appendText(const std::string& text);

  std::vector<unsigned char> block;
  std::size_t header = 0;
};
