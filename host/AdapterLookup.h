// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <string>

// Finds the local network adapter for an IPv4 address. Addresses and masks
// are numbers with the first octet most significant (127.0.0.1 is
// 0x7F000001), the order the driver's address parser uses.
class AdapterLookup {
 public:
  struct Adapter {
    std::uint32_t address = 0;
    std::uint32_t mask = 0;
    // The interface index (if_nametoindex); 0 when the system has none.
    std::uint32_t index = 0;
  };

  // The adapter for ip, or false when there is none:
  // - an address of a local interface gives that interface's address and
  //   mask;
  // - 0.0.0.0 gives the adapter of the default route (the kernel itself would
  //   treat 0.0.0.0 as this host, which is no use for finding the network a
  //   panel sits on);
  // - any other address gives the adapter whose address the kernel would use
  //   as the source for sending to it. Without a route the look-up fails.
  // Nothing is sent: the route is asked with an unsent UDP connect.
  static bool Find(std::uint32_t ip, Adapter& adapter);
  // Find in the form of the host's GetAdapterInfo: 1 and the results through
  // the non-null pointers, or 0.
  static int FindInto(unsigned int ip, unsigned int* address, unsigned int* mask,
                      unsigned int* index);

  // The kernel's IPv4 default route with the lowest metric, from
  // /proc/net/route: its interface name and gateway (0 for a route without
  // one). False when there is no default route.
  static bool DefaultRoute(std::string& interfaceName, std::uint32_t& gateway);

 private:
  static bool FindLocal(std::uint32_t ip, Adapter& adapter);
  static bool FindFirstOnInterface(const std::string& interfaceName, Adapter& adapter);
  static bool SourceAddressFor(std::uint32_t ip, std::uint32_t& source);
  static bool FindDefault(Adapter& adapter);
};
