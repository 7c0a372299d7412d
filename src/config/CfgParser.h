// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <string>
#include <vector>

// Reads the configuration string that the host hands to a driver. The parser
// cuts out the version-1 section (the text after "CfgVer=1" up to the next
// "CfgVer="), lists the node numbers it speaks of, and answers look-ups of one
// parameter at a time. Entries are "name=value" separated by white space; a
// node's own entry carries the prefix "Node<number>::" in front of its name.
class CfgParser {
 public:
  // The numbers are fixed: readers treat every value below ParseNotFound as
  // success and ParseNotFound as a missing parameter.
  enum parseResult : int {
    ParseOk = 0,
    // A node-independent look-up of a per-node parameter found no plain
    // entry while node sections exist; counts as success, nothing copied.
    ParseNodeOnly = 1,
    ParseNotFound = 2,
    // Made by the value converters, never by getParam.
    ParseIllegalValue = 3,
    // A protocol-wide parameter was given with the requested node's prefix.
    ParseCantBePrefixed = 4,
    // A per-node parameter was given plain although node sections exist.
    ParseCantBeNodeIndependent = 5,
    // Both look-up flags at once.
    ParseInvalidSpec = 6
  };

  // Look-up flags for getParam.
  enum paramFlags : int {
    // Protocol-wide: an entry with the requested node's prefix is an error.
    ParamNoPrefix = 1,
    // Per node: once node sections exist, asking node-independently for a
    // plain entry is an error.
    ParamNodeOnly = 2
  };

  // Never fails; KnownFormat tells whether a version-1 section was found.
  // Without one the whole text is kept and no node scan is made. A null text
  // reads as the empty text.
  explicit CfgParser(const char* text);

  // 1 when "CfgVer=1" was found, else 0.
  int KnownFormat() const;
  // The number of distinct node numbers found.
  int GetNodeCount() const;
  // The node number at index in order of first appearance; 0 for an index
  // that is negative or not below the count.
  int GetNodeID(int index) const;

  // The value of the entry name (the full name, node prefix included when a
  // prefixed entry is wanted), or null when absent. The text stays valid
  // until the next look-up.
  const char* GetParam(const char* name);

  // The value of name for node (a node number, or -1 for a node-independent
  // look-up), with flags a set of paramFlags. A node falls back to the plain
  // entry when it has no prefixed one. value is written only on ParseOk.
  parseResult getParam(const char* name, int node, std::string& value, int flags);

 private:
  void selectSection();
  void scanNodes();
  void addNode(int node);

  std::string cfgText;
  std::string lastValue;
  std::vector<std::int32_t> nodeIds;
  std::int32_t knownFormat = 0;
};
