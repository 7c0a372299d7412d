#include "LoopbackUdp.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/socket.h>

#include "velt-peer/FileDescriptor.h"

namespace {

sockaddr_in Loopback(std::uint16_t port) {
  sockaddr_in address{};
  address.sin_family = AF_INET;
  address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
  address.sin_port = htons(port);
  return address;
}

}  // namespace

std::uint16_t FreeUdpPort() {
  const veltpeer::FileDescriptor probe(::socket(AF_INET, SOCK_DGRAM, 0));
  sockaddr_in address = Loopback(0);
  socklen_t size = sizeof address;
  if (!probe.Valid() ||
      ::bind(probe.Get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0 ||
      ::getsockname(probe.Get(), reinterpret_cast<sockaddr*>(&address), &size) != 0) {
    return 0;
  }
  return ntohs(address.sin_port);
}

bool SendUdpDatagram(std::uint16_t port, const std::string& bytes) {
  const veltpeer::FileDescriptor sender(::socket(AF_INET, SOCK_DGRAM, 0));
  const sockaddr_in address = Loopback(port);
  return sender.Valid() && ::sendto(sender.Get(), bytes.data(), bytes.size(), 0,
                                    reinterpret_cast<const sockaddr*>(&address),
                                    sizeof address) == static_cast<ssize_t>(bytes.size());
}
