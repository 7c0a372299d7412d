// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <deque>
#include <functional>
#include <mutex>
#include <string>
#include <vector>

#include "ISocket.h"

// A socket that plays a script. Receive consumes the script from the front:
// a datagram step is delivered whole by one call (cut to the caller's maximum),
// a stream step is handed out up to the caller's maximum per call (a repeated
// one as often as asked, without copying it again), a time-out step answers 0
// once and an error step -1 once; an action step runs its function when a
// receive reaches it (as if something happened while the caller waited) and
// the receive goes on with the next step; an empty script answers 0.
// Connect answers the queued results (0 once the queue is empty); IsBroken
// answers the broken flag. Every call is recorded unless records are turned
// off (which keeps long runs from allocating).
class ScriptedSocket final : public ISocket {
 public:
  struct ConnectCall {
    std::string ip;
    unsigned short port;
  };
  struct ReceiveCall {
    int maxLength;
    int timeout;
  };

  ScriptedSocket(unsigned short localPort, int tcp) : localPort_(localPort), tcp_(tcp) {}

  int Connect(const char* ip, unsigned short port) override;
  int IsBroken() override;
  int Receive(unsigned char* buffer, int maxLength, int timeoutMilliseconds) override;
  int GetAdapterInfo(unsigned int ip, unsigned int* address, unsigned int* mask,
                     unsigned int* index) override;
  int Send(const unsigned char* data, int length) override;

  // Script.
  void AddDatagram(const std::string& bytes);
  void AddStream(const std::string& bytes);
  // The bytes, received times times in a row.
  void AddRepeatedStream(const std::string& bytes, std::size_t times);
  void AddAction(std::function<void()> action);
  void AddTimeout();
  void AddError();
  void AddConnectResults(int result, int count = 1);
  void SetBroken(bool broken);
  // The adapter the look-up answers for any address; failing when not set.
  void SetAdapter(unsigned int address, unsigned int mask);
  void KeepRecords(bool keep);
  // How many script steps are left.
  std::size_t Pending() const;

  // Records.
  unsigned short LocalPort() const { return localPort_; }
  int Tcp() const { return tcp_; }
  std::vector<ConnectCall> Connects() const;
  std::vector<std::string> Sends() const;
  // For each send, how many of FakeMultiTask's mutexes the sending thread
  // held while it sent.
  std::vector<int> LocksHeldAtSends() const;
  std::vector<ReceiveCall> Receives() const;
  std::vector<unsigned int> AdapterQueries() const;

 private:
  struct Step {
    enum Kind { Datagram, Stream, Timeout, Error, Action } kind;
    std::string bytes;
    std::size_t times = 1;
    std::size_t offset = 0;
    std::function<void()> action;
  };

  // Serves the front step under the lock; an action step is handed back to
  // run outside it.
  int Serve(unsigned char* buffer, int maxLength, std::function<void()>& action);

  mutable std::mutex lock_;
  unsigned short localPort_;
  int tcp_;
  std::deque<Step> script_;
  std::deque<int> connectResults_;
  bool broken_ = false;
  bool keepRecords_ = true;
  bool hasAdapter_ = false;
  unsigned int adapterAddress_ = 0;
  unsigned int adapterMask_ = 0;
  std::vector<ConnectCall> connects_;
  std::vector<std::string> sends_;
  std::vector<int> locksHeldAtSends_;
  std::vector<ReceiveCall> receives_;
  std::vector<unsigned int> adapterQueries_;
};
