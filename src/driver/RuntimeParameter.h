// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

#include "driver/ChannelSettings.h"
#include "memory/MemoryType.h"

// One runtime parameter of the channel: the memory type that stages it, the
// name under which it is staged, kept live and persisted, how its value is
// exchanged, and which working setting it feeds.
struct RuntimeParameter {
  enum class Kind { Text, Integer, Boolean, Apply };

  const char* memoryType;
  const char* name;
  Kind kind;
  // The working setting (exactly one is set, none for the apply trigger).
  std::string ChannelSettings::*text;
  int ChannelSettings::*integer;
  bool ChannelSettings::*boolean;
  // Error text of a read whose text does not fit the tag (texts only).
  const char* tooLongText;
  // A written value is refused with illegalText when accepts answers false
  // (both null: every value is accepted).
  bool (*accepts)(const std::string& value);
  const char* illegalText;
  // Whether a new value makes the worker re-create the socket.
  bool needsNewSocket;

  // The parameter staged by a memory type, or null.
  static const RuntimeParameter* ForMemoryType(const MemoryType& memoryType);
  // Every parameter but the apply trigger, in the order in which an apply
  // reloads them; ended by null.
  static const RuntimeParameter* const* ReloadOrder();
};
