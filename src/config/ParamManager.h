// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

#include "config/CfgParser.h"
#include "config/CommonParams.h"
#include "config/NodeParams.h"

namespace _VELT {

// Turns the driver's configuration string into its protocol-wide settings
// and one record per node section, applying the defaults of the optional keys
// and the ranges the driver relies on, and keeps the text of a failure.
class ParamManager {
 public:
  // True when the whole configuration was read; otherwise getLastError says
  // why. Fields are filled one by one, so after a failure the fields before
  // the failing key hold new values and the later ones their old ones. Node
  // records are appended, never replaced: a second parse adds a second set,
  // and look-ups keep answering with the earliest record of a node number.
  bool parse(const char* text);

  // The first record of that node number, else the default record (node
  // number -1, the protocol-wide model). Never null.
  const NodeParams* getNodeParams(int node) const;
  const CommonParams* getCommonParams() const;
  // The text of the last failed parse; empty until one fails. A later
  // successful parse does not clear it.
  const std::string& getLastError() const;
  const std::vector<NodeParams>& getNodes() const;

 private:
  bool readNodes(CfgParser& parser);
  bool readCommon(CfgParser& parser);
  bool readMandatory(CfgParser& parser);
  bool readOptional(CfgParser& parser);
  bool checkFraming();
  bool fail(const std::string& text);

  std::vector<NodeParams> nodes;
  NodeParams defaultNode;
  CommonParams common;
  std::string lastError;
};

}  // namespace _VELT
