// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// A text stream over a caller's character buffer of a fixed size, as the
// information text is written: pieces are appended one after the other, text
// that does not fit is cut off, and no terminator is ever written (the caller
// decides about one from count()). A null text puts the stream into its
// failed state, after which nothing more is written. A null buffer or a size
// below 1 holds no characters.
class BoundedText {
 public:
  BoundedText(char* out, int outSize);

  BoundedText& operator<<(const char* text);
  // The decimal digits of value, with a leading "-" when it is negative.
  BoundedText& operator<<(int value);

  // The number of characters written so far.
  int count() const { return written; }
  // True once a null text was given.
  bool failed() const { return bad; }

 private:
  void put(const char* text, int length);

  char* out;
  int size;
  int written = 0;
  bool bad = false;
};
