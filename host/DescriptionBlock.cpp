// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "DescriptionBlock.h"

#include <zlib.h>

#include <cstring>
#include <string_view>
#include <vector>

namespace {

using namespace std::string_view_literals;

constexpr std::string_view kLengthKey = "compressedXML=";
constexpr std::size_t kLengthKeyBytes = kLengthKey.size();
// "<<TAVU_XML_END>>" with its zero byte.
constexpr std::string_view kTrailer = "<<TAVU_XML_END>>\0"sv;
// More digits than any accepted length needs; a longer line is refused
// before anything past it is read.
constexpr std::size_t kMaxDigits = 9;
constexpr std::size_t kChunkBytes = 16384;

}  // namespace

DescriptionBlock::DescriptionBlock(const char* lengthLine) {
  if (lengthLine == nullptr) {
    error_ = "the plug-in gives no description";
    return;
  }
  std::size_t streamBytes = 0;
  std::size_t lineBytes = 0;
  if (!ReadLengthLine(lengthLine, streamBytes, lineBytes)) {
    return;
  }
  const auto* const stream = reinterpret_cast<const unsigned char*>(lengthLine + lineBytes);
  if (!Inflate(stream, streamBytes) ||
      !CheckTrailer(lengthLine + lineBytes + static_cast<std::ptrdiff_t>(streamBytes))) {
    document_.clear();
  }
}

// The line is read one byte at a time and never past its zero byte, nor past
// the longest line that could be valid.
bool DescriptionBlock::ReadLengthLine(const char* lengthLine, std::size_t& streamBytes,
                                      std::size_t& lineBytes) {
  for (std::size_t i = 0; i < kLengthKeyBytes; ++i) {
    if (lengthLine[i] != kLengthKey[i]) {
      error_ = "the description does not begin with its length line \"compressedXML=\"";
      return false;
    }
  }
  std::size_t value = 0;
  std::size_t digits = 0;
  const char* position = lengthLine + kLengthKeyBytes;
  for (; *position != '\0'; ++position, ++digits) {
    if (*position < '0' || *position > '9' || digits == kMaxDigits) {
      error_ = "the description's length line is not \"compressedXML=\" and a decimal number";
      return false;
    }
    value = value * 10 + static_cast<std::size_t>(*position - '0');
  }
  if (digits == 0) {
    error_ = "the description's length line gives no length";
    return false;
  }
  if (value == 0 || value > kMaxStreamBytes) {
    error_ = "the description's stated length " + std::to_string(value) + " is not plausible";
    return false;
  }
  streamBytes = value;
  lineBytes = kLengthKeyBytes + digits + 1;
  return true;
}

bool DescriptionBlock::Inflate(const unsigned char* stream, std::size_t streamBytes) {
  z_stream z{};
  if (inflateInit(&z) != Z_OK) {
    error_ = "zlib cannot start inflating";
    return false;
  }
  z.next_in = stream;
  z.avail_in = static_cast<uInt>(streamBytes);
  std::vector<char> chunk(kChunkBytes);
  int status = Z_OK;
  while (status == Z_OK) {
    z.next_out = reinterpret_cast<Bytef*>(chunk.data());
    z.avail_out = static_cast<uInt>(chunk.size());
    status = inflate(&z, Z_NO_FLUSH);
    document_.append(chunk.data(), chunk.size() - z.avail_out);
    if (document_.size() > kMaxDocumentBytes) {
      status = Z_MEM_ERROR;
    }
  }
  const std::size_t unused = z.avail_in;
  const std::string zlibText = z.msg == nullptr ? std::string() : std::string(z.msg);
  inflateEnd(&z);
  if (status == Z_STREAM_END && unused == 0) {
    return true;
  }
  const std::string stated = std::to_string(streamBytes);
  if (status == Z_STREAM_END) {
    error_ = "the compressed description ends " + std::to_string(unused) +
             " bytes before its stated length of " + stated + " bytes";
  } else if (status == Z_BUF_ERROR) {
    error_ = "the compressed description goes on past its stated length of " + stated + " bytes";
  } else if (status == Z_MEM_ERROR && document_.size() > kMaxDocumentBytes) {
    error_ =
        "the description inflates to more than " + std::to_string(kMaxDocumentBytes) + " bytes";
  } else {
    error_ = "the compressed description is damaged" +
             (zlibText.empty() ? std::string() : ": " + zlibText);
  }
  return false;
}

bool DescriptionBlock::CheckTrailer(const char* trailer) {
  if (std::memcmp(trailer, kTrailer.data(), kTrailer.size()) != 0) {
    error_ = "the description does not end with \"<<TAVU_XML_END>>\"";
    return false;
  }
  return true;
}
