// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <arpa/inet.h>
#include <gtest/gtest.h>
#include <ifaddrs.h>
#include <net/if.h>
#include <netinet/in.h>
#include <sched.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstring>
#include <fstream>
#include <map>
#include <set>
#include <sstream>
#include <string>

#include "HostSocketFactory.h"

namespace {

struct Answer {
  int result = -1;
  unsigned address = 0;
  unsigned mask = 0;
  unsigned index = 0;
};

Answer AskSocket(unsigned ip) {
  HostSocketFactory factory;
  ISocket* const socket = factory.CreateSocket(0, 0, 0);
  Answer answer;
  answer.result = socket->GetAdapterInfo(ip, &answer.address, &answer.mask, &answer.index);
  return answer;
}

Answer AskFactory(unsigned ip) {
  HostSocketFactory factory;
  Answer answer;
  answer.result = factory.GetAdapterInfo(ip, &answer.address, &answer.mask, &answer.index);
  return answer;
}

// An IPv4 address of the system's list in host order; copied out of the
// entry, whose sockaddr pointer is less aligned than sockaddr_in on armhf.
unsigned HostOrder(const sockaddr* address) {
  sockaddr_in ipv4{};
  std::memcpy(&ipv4, address, sizeof ipv4);
  return ntohl(ipv4.sin_addr.s_addr);
}

// Every IPv4 address of the machine with its mask, from the system's list.
std::map<unsigned, unsigned> LocalAddresses() {
  std::map<unsigned, unsigned> addresses;
  ifaddrs* list = nullptr;
  if (::getifaddrs(&list) != 0) {
    return addresses;
  }
  for (const ifaddrs* entry = list; entry != nullptr; entry = entry->ifa_next) {
    if (entry->ifa_addr != nullptr && entry->ifa_addr->sa_family == AF_INET) {
      addresses.emplace(HostOrder(entry->ifa_addr), HostOrder(entry->ifa_netmask));
    }
  }
  ::freeifaddrs(list);
  return addresses;
}

// The interface of the IPv4 default route, read from the kernel's table;
// empty when there is none.
std::string DefaultRouteInterface() {
  std::ifstream table("/proc/net/route");
  std::string line;
  std::getline(table, line);
  while (std::getline(table, line)) {
    std::istringstream fields(line);
    std::string name;
    std::string destination;
    std::string gateway;
    std::string flags;
    std::string refCount;
    std::string use;
    std::string metric;
    std::string mask;
    fields >> name >> destination >> gateway >> flags >> refCount >> use >> metric >> mask;
    if (destination == "00000000" && mask == "00000000") {
      return name;
    }
  }
  return std::string();
}

std::set<unsigned> AddressesOf(const std::string& interfaceName) {
  std::set<unsigned> addresses;
  ifaddrs* list = nullptr;
  if (::getifaddrs(&list) != 0) {
    return addresses;
  }
  for (const ifaddrs* entry = list; entry != nullptr; entry = entry->ifa_next) {
    if (entry->ifa_addr != nullptr && entry->ifa_addr->sa_family == AF_INET &&
        interfaceName == entry->ifa_name) {
      addresses.insert(HostOrder(entry->ifa_addr));
    }
  }
  ::freeifaddrs(list);
  return addresses;
}

}  // namespace

TEST(AdapterLookup, LoopbackAnswersItsAddressAndAClassAMask) {
  const Answer answer = AskSocket(0x7F000001U);
  EXPECT_EQ(answer.result, 1);
  EXPECT_EQ(answer.address, 0x7F000001U);
  EXPECT_EQ(answer.mask, 0xFF000000U);
  EXPECT_EQ(answer.index, ::if_nametoindex("lo"));
}

TEST(AdapterLookup, AnotherLoopbackAddressAnswersTheLoopbackAdapter) {
  const Answer answer = AskSocket(0x7F010203U);  // 127.1.2.3
  EXPECT_EQ(answer.result, 1);
  EXPECT_EQ(answer.address, 0x7F000001U);
  EXPECT_EQ(answer.mask, 0xFF000000U);
}

TEST(AdapterLookup, EveryLocalAddressAnswersItselfAndItsMask) {
  const auto addresses = LocalAddresses();
  ASSERT_FALSE(addresses.empty());
  for (const auto& [address, mask] : addresses) {
    const Answer answer = AskSocket(address);
    EXPECT_EQ(answer.result, 1) << std::hex << address;
    EXPECT_EQ(answer.address, address);
    EXPECT_EQ(answer.mask, mask);
  }
}

TEST(AdapterLookup, AnyAddressAnswersTheAdapterOfTheDefaultRoute) {
  const std::string routeInterface = DefaultRouteInterface();
  const Answer answer = AskSocket(0);
  if (routeInterface.empty()) {
    EXPECT_EQ(answer.result, 0);
    GTEST_SKIP() << "no default route here: 0.0.0.0 correctly fails";
  }
  ASSERT_EQ(answer.result, 1);
  EXPECT_EQ(AddressesOf(routeInterface).count(answer.address), 1U)
      << "answered " << std::hex << answer.address << " not on " << routeInterface;
  EXPECT_EQ(answer.mask, LocalAddresses().at(answer.address));
  EXPECT_EQ(answer.index, ::if_nametoindex(routeInterface.c_str()));
}

TEST(AdapterLookup, TheFactoryAnswersAsASocketDoes) {
  for (const unsigned ip : {0x7F000001U, 0x7F010203U, 0U}) {
    const Answer bySocket = AskSocket(ip);
    const Answer byFactory = AskFactory(ip);
    EXPECT_EQ(byFactory.result, bySocket.result);
    EXPECT_EQ(byFactory.address, bySocket.address);
    EXPECT_EQ(byFactory.mask, bySocket.mask);
    EXPECT_EQ(byFactory.index, bySocket.index);
  }
}

TEST(AdapterLookup, NullOutputsAreSkipped) {
  HostSocketFactory factory;
  EXPECT_EQ(factory.GetAdapterInfo(0x7F000001U, nullptr, nullptr, nullptr), 1);
  unsigned mask = 0;
  EXPECT_EQ(factory.GetAdapterInfo(0x7F000001U, nullptr, &mask, nullptr), 1);
  EXPECT_EQ(mask, 0xFF000000U);
}

TEST(AdapterLookup, WithoutARouteTheLookUpFails) {
  // A network namespace of its own has no routes at all (even its loopback
  // is down), so nothing can be looked up there.
  const pid_t child = ::fork();
  ASSERT_GE(child, 0);
  if (child == 0) {
    if (::unshare(CLONE_NEWNET) != 0) {
      ::_exit(77);
    }
    HostSocketFactory factory;
    unsigned address = 0;
    unsigned mask = 0;
    unsigned index = 0;
    int found = 0;
    // 10.1.2.3, 192.0.2.1, 0.0.0.0 and 127.0.0.1
    for (const unsigned ip : {0x0A010203U, 0xC0000201U, 0U, 0x7F000001U}) {
      found += factory.GetAdapterInfo(ip, &address, &mask, &index);
    }
    ::_exit(found == 0 ? 0 : 1);
  }
  int status = 0;
  ASSERT_EQ(::waitpid(child, &status, 0), child);
  ASSERT_TRUE(WIFEXITED(status));
  if (WEXITSTATUS(status) == 77) {
    GTEST_SKIP() << "cannot make a network namespace here (needs CAP_SYS_ADMIN), and this "
                    "machine routes every address";
  }
  EXPECT_EQ(WEXITSTATUS(status), 0) << "an address was found without any route";
}
