// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// velt-host's typed values (TypedValue::Parse and Format): the text of a
// .write turned into a tag's bytes, and a tag's bytes printed by .read.
//
// Input: the data type (a byte, taken modulo 30 so that unknown types come
// too), the length in bytes (two bytes, -4..300), the item type (a byte,
// modulo 30), a length byte and that many bytes of a value to print, then
// the text to parse.
//
// Parsed bytes are as long as the tag; a refusal names the type and the
// text and leaves zeros. Printing is stable: the printed text parses, and
// prints the same again. For booleans, integers and hex types printing
// loses nothing: the printed text parses back to the very bytes.

#include <cstdint>
#include <string>
#include <vector>

#include "FuzzInput.h"
#include "Require.h"
#include "velt-host/TypedValue.h"

namespace {

using velthost::TypedValue;
using velthost::ValueShape;

constexpr int kTypes = 30;

// The bytes of one integer of the data-type table; 0 for other types.
int IntegerBytes(ICU_Type type) {
  switch (type) {
    case ICU_BYTE:
    case ICU_UNSIGNED_BYTE:
      return 1;
    case ICU_SHORT:
    case ICU_UNSIGNED_SHORT:
      return 2;
    case ICU_INT:
    case ICU_UNSIGNED_INT:
      return 4;
    case ICU_UINT64:
    case ICU_INT64:
      return 8;
    default:
      return 0;
  }
}

// The integer type of an integer array type; ICU_NONE for other types.
ICU_Type IntegerItem(ICU_Type type) {
  switch (type) {
    case ICU_BYTE_ARRAY:
      return ICU_BYTE;
    case ICU_SHORT_ARRAY:
      return ICU_SHORT;
    case ICU_INT_ARRAY:
      return ICU_INT;
    case ICU_UNSIGNED_BYTE_ARRAY:
      return ICU_UNSIGNED_BYTE;
    case ICU_UNSIGNED_SHORT_ARRAY:
      return ICU_UNSIGNED_SHORT;
    case ICU_UNSIGNED_INT_ARRAY:
      return ICU_UNSIGNED_INT;
    case ICU_UINT64_ARRAY:
      return ICU_UINT64;
    case ICU_INT64_ARRAY:
      return ICU_INT64;
    default:
      return ICU_NONE;
  }
}

// Shapes a tag has whose every byte pattern prints to a text of its own:
// an integer of its natural length, integer arrays of whole items, and
// binary values. (A boolean prints 1 for any non-zero byte, %g rounds
// floats, a text ends at its first zero byte.)
bool PrintsExactly(const ValueShape& shape) {
  if (shape.type == ICU_BINARY) {
    return true;
  }
  const int scalar = IntegerBytes(shape.type);
  if (scalar != 0) {
    return shape.length == scalar;
  }
  const ICU_Type item = IntegerItem(shape.type);
  const int itemBytes = IntegerBytes(item);
  return itemBytes != 0 && (shape.itemType == ICU_NONE || shape.itemType == item) &&
         shape.length >= 0 && shape.length % itemBytes == 0;
}

void CheckParse(const ValueShape& shape, const std::string& text) {
  const std::size_t length = shape.length < 0 ? 0 : static_cast<std::size_t>(shape.length);
  std::vector<unsigned char> bytes(3, 0xEE);
  std::string error;
  if (TypedValue::Parse(shape, text, bytes, error)) {
    Require(bytes.size() == length, "parsed bytes are as long as the tag");
    const std::string printed = TypedValue::Format(shape, bytes.data());
    std::vector<unsigned char> again;
    Require(TypedValue::Parse(shape, printed, again, error) &&
                TypedValue::Format(shape, again.data()) == printed,
            "a printed value parses and prints the same");
    return;
  }
  Require(bytes == std::vector<unsigned char>(length, 0), "a refused text leaves zeros");
  Require(error.rfind("bad " + TypedValue::TypeName(shape) + " value '" + text + "' (", 0) == 0,
          "a refusal names the type and the text");
}

void CheckFormat(const ValueShape& shape, std::vector<unsigned char> value) {
  const std::size_t length = shape.length < 0 ? 0 : static_cast<std::size_t>(shape.length);
  value.resize(length);
  value.push_back(0);  // room for a tag of length 0
  const std::string printed = TypedValue::Format(shape, value.data());
  value.pop_back();
  std::vector<unsigned char> parsed;
  std::string error;
  if (shape.type == ICU_STRING && printed.find('\0') == std::string::npos) {
    Require(TypedValue::Parse(shape, printed, parsed, error), "a printed text parses");
  }
  const bool parses = TypedValue::Parse(shape, printed, parsed, error);
  if (PrintsExactly(shape)) {
    Require(parses && parsed == value, "a printed value parses back to its bytes");
  }
  if (parses) {  // other shapes may print what does not parse (no tag has them)
    Require(TypedValue::Format(shape, parsed.data()) == printed, "a value prints the same again");
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzInput input(data, size);
  ValueShape shape;
  shape.type = static_cast<ICU_Type>(input.Byte() % kTypes);
  shape.length = input.IntInRange(-4, 300);
  shape.itemType = static_cast<ICU_Type>(input.Byte() % kTypes);
  const std::string raw = input.ShortText(256);
  CheckFormat(shape, std::vector<unsigned char>(raw.begin(), raw.end()));
  CheckParse(shape, input.Rest());
  return 0;
}
