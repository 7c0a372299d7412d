// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "AdapterLookup.h"

#include <arpa/inet.h>
#include <ifaddrs.h>
#include <net/if.h>
#include <net/route.h>
#include <netinet/in.h>
#include <sys/socket.h>

#include <cstring>
#include <fstream>
#include <functional>
#include <limits>
#include <memory>
#include <sstream>

#include "FileDescriptor.h"

namespace {

struct IfAddrsDeleter {
  void operator()(ifaddrs* list) const { ::freeifaddrs(list); }
};
using IfAddrsList = std::unique_ptr<ifaddrs, IfAddrsDeleter>;

IfAddrsList ReadInterfaces() {
  ifaddrs* list = nullptr;
  if (::getifaddrs(&list) != 0) {
    return nullptr;
  }
  return IfAddrsList(list);
}

// The list's entries are sockaddr_in records behind sockaddr pointers, whose
// alignment is smaller on some targets (2 on armhf): copied out, never cast.
std::uint32_t HostOrder(const sockaddr* address) {
  sockaddr_in ipv4{};
  std::memcpy(&ipv4, address, sizeof ipv4);
  return ntohl(ipv4.sin_addr.s_addr);
}

bool IsIpv4(const ifaddrs& entry) {
  return entry.ifa_addr != nullptr && entry.ifa_addr->sa_family == AF_INET;
}

// Alias labels ("eth0:1") share the index of their device ("eth0").
std::uint32_t InterfaceIndex(const char* name) {
  std::string device(name);
  const auto colon = device.find(':');
  if (colon != std::string::npos) {
    device.erase(colon);
  }
  return ::if_nametoindex(device.c_str());
}

AdapterLookup::Adapter Describe(const ifaddrs& entry) {
  AdapterLookup::Adapter adapter;
  adapter.address = HostOrder(entry.ifa_addr);
  adapter.mask = entry.ifa_netmask == nullptr ? 0 : HostOrder(entry.ifa_netmask);
  adapter.index = InterfaceIndex(entry.ifa_name);
  return adapter;
}

bool FindInterface(const std::function<bool(const ifaddrs&)>& matches,
                   AdapterLookup::Adapter& adapter) {
  const IfAddrsList list = ReadInterfaces();
  for (const ifaddrs* entry = list.get(); entry != nullptr; entry = entry->ifa_next) {
    if (IsIpv4(*entry) && matches(*entry)) {
      adapter = Describe(*entry);
      return true;
    }
  }
  return false;
}

}  // namespace

bool AdapterLookup::Find(std::uint32_t ip, Adapter& adapter) {
  if (ip == 0) {
    return FindDefault(adapter);
  }
  if (FindLocal(ip, adapter)) {
    return true;
  }
  std::uint32_t source = 0;
  return SourceAddressFor(ip, source) && FindLocal(source, adapter);
}

int AdapterLookup::FindInto(unsigned int ip, unsigned int* address, unsigned int* mask,
                            unsigned int* index) {
  Adapter adapter;
  if (!Find(ip, adapter)) {
    return 0;
  }
  if (address != nullptr) {
    *address = adapter.address;
  }
  if (mask != nullptr) {
    *mask = adapter.mask;
  }
  if (index != nullptr) {
    *index = adapter.index;
  }
  return 1;
}

bool AdapterLookup::FindLocal(std::uint32_t ip, Adapter& adapter) {
  return FindInterface([ip](const ifaddrs& entry) { return HostOrder(entry.ifa_addr) == ip; },
                       adapter);
}

bool AdapterLookup::FindFirstOnInterface(const std::string& interfaceName, Adapter& adapter) {
  return FindInterface(
      [&interfaceName](const ifaddrs& entry) { return interfaceName == entry.ifa_name; }, adapter);
}

bool AdapterLookup::SourceAddressFor(std::uint32_t ip, std::uint32_t& source) {
  const FileDescriptor probe(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0));
  if (!probe.Valid()) {
    return false;
  }
  // Broadcast destinations are only routed for sockets allowed to broadcast.
  const int on = 1;
  ::setsockopt(probe.Get(), SOL_SOCKET, SO_BROADCAST, &on, sizeof on);
  sockaddr_in target{};
  target.sin_family = AF_INET;
  target.sin_addr.s_addr = htonl(ip);
  // Any port will do; a UDP connect only asks the routing table.
  target.sin_port = htons(9);
  if (::connect(probe.Get(), reinterpret_cast<const sockaddr*>(&target), sizeof target) != 0) {
    return false;
  }
  sockaddr_in local{};
  socklen_t length = sizeof local;
  if (::getsockname(probe.Get(), reinterpret_cast<sockaddr*>(&local), &length) != 0) {
    return false;
  }
  source = ntohl(local.sin_addr.s_addr);
  return source != 0;
}

bool AdapterLookup::FindDefault(Adapter& adapter) {
  std::string interfaceName;
  std::uint32_t gateway = 0;
  if (!DefaultRoute(interfaceName, gateway)) {
    return false;
  }
  // With a gateway, the adapter is the one that reaches the gateway (the
  // right address when the interface carries several).
  std::uint32_t source = 0;
  if (gateway != 0 && SourceAddressFor(gateway, source) && FindLocal(source, adapter)) {
    return true;
  }
  return FindFirstOnInterface(interfaceName, adapter);
}

bool AdapterLookup::DefaultRoute(std::string& interfaceName, std::uint32_t& gateway) {
  std::ifstream table("/proc/net/route");
  std::string line;
  if (!std::getline(table, line)) {
    return false;
  }
  bool found = false;
  unsigned long bestMetric = std::numeric_limits<unsigned long>::max();
  while (std::getline(table, line)) {
    std::istringstream fields(line);
    std::string name;
    std::uint32_t destination = 0;
    std::uint32_t via = 0;
    unsigned flags = 0;
    unsigned long refCount = 0;
    unsigned long use = 0;
    unsigned long metric = 0;
    std::uint32_t mask = 0;
    fields >> name >> std::hex >> destination >> via >> flags >> std::dec >> refCount >> use >>
        metric >> std::hex >> mask;
    if (!fields || destination != 0 || mask != 0 || (flags & RTF_UP) == 0) {
      continue;
    }
    if (!found || metric < bestMetric) {
      found = true;
      bestMetric = metric;
      interfaceName = name;
      // The table holds addresses in network byte order, printed as a
      // native integer.
      gateway = (flags & RTF_GATEWAY) != 0 ? ntohl(via) : 0;
    }
  }
  return found;
}
