// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ScriptedSocket.h"

#include "FakeMultiTask.h"

#include <algorithm>
#include <cstring>

int ScriptedSocket::Connect(const char* ip, unsigned short port) {
  const std::lock_guard<std::mutex> guard(lock_);
  if (keepRecords_) {
    connects_.push_back({ip == nullptr ? std::string() : std::string(ip), port});
  }
  if (connectResults_.empty()) {
    return 0;
  }
  const int result = connectResults_.front();
  connectResults_.pop_front();
  return result;
}

int ScriptedSocket::IsBroken() {
  const std::lock_guard<std::mutex> guard(lock_);
  return broken_ ? 1 : 0;
}

int ScriptedSocket::Receive(unsigned char* buffer, int maxLength, int timeoutMilliseconds) {
  {
    const std::lock_guard<std::mutex> guard(lock_);
    if (keepRecords_) {
      receives_.push_back({maxLength, timeoutMilliseconds});
    }
  }
  for (;;) {
    std::function<void()> action;
    const int result = Serve(buffer, maxLength, action);
    if (!action) {
      return result;
    }
    action();
  }
}

int ScriptedSocket::Serve(unsigned char* buffer, int maxLength, std::function<void()>& action) {
  const std::lock_guard<std::mutex> guard(lock_);
  if (script_.empty() || maxLength < 1) {
    return 0;
  }
  Step& step = script_.front();
  switch (step.kind) {
    case Step::Timeout:
      script_.pop_front();
      return 0;
    case Step::Error:
      script_.pop_front();
      return -1;
    case Step::Action:
      action = std::move(step.action);
      script_.pop_front();
      return 0;
    case Step::Datagram: {
      const std::size_t n = std::min(step.bytes.size(), static_cast<std::size_t>(maxLength));
      std::memcpy(buffer, step.bytes.data(), n);
      script_.pop_front();
      return static_cast<int>(n);
    }
    case Step::Stream: {
      const std::size_t n =
          std::min(step.bytes.size() - step.offset, static_cast<std::size_t>(maxLength));
      std::memcpy(buffer, step.bytes.data() + step.offset, n);
      step.offset += n;
      if (step.offset == step.bytes.size()) {
        step.offset = 0;
        if (--step.times == 0) {
          script_.pop_front();
        }
      }
      return static_cast<int>(n);
    }
  }
  return -1;
}

int ScriptedSocket::GetAdapterInfo(unsigned int ip, unsigned int* address, unsigned int* mask,
                                   unsigned int* index) {
  const std::lock_guard<std::mutex> guard(lock_);
  adapterQueries_.push_back(ip);
  if (!hasAdapter_) {
    return 0;
  }
  *address = adapterAddress_;
  *mask = adapterMask_;
  *index = 1;
  return 1;
}

int ScriptedSocket::Send(const unsigned char* data, int length) {
  const std::lock_guard<std::mutex> guard(lock_);
  if (keepRecords_) {
    sends_.emplace_back(reinterpret_cast<const char*>(data), static_cast<std::size_t>(length));
    locksHeldAtSends_.push_back(FakeMultiTask::MutexesHeldHere());
  }
  return length;
}

void ScriptedSocket::AddDatagram(const std::string& bytes) {
  const std::lock_guard<std::mutex> guard(lock_);
  script_.push_back({Step::Datagram, bytes, 1, 0, nullptr});
}

void ScriptedSocket::AddStream(const std::string& bytes) { AddRepeatedStream(bytes, 1); }

void ScriptedSocket::AddRepeatedStream(const std::string& bytes, std::size_t times) {
  const std::lock_guard<std::mutex> guard(lock_);
  if (!bytes.empty() && times != 0) {
    script_.push_back({Step::Stream, bytes, times, 0, nullptr});
  }
}

void ScriptedSocket::AddAction(std::function<void()> action) {
  const std::lock_guard<std::mutex> guard(lock_);
  script_.push_back({Step::Action, {}, 1, 0, std::move(action)});
}

void ScriptedSocket::AddTimeout() {
  const std::lock_guard<std::mutex> guard(lock_);
  script_.push_back({Step::Timeout, {}, 1, 0, nullptr});
}

void ScriptedSocket::AddError() {
  const std::lock_guard<std::mutex> guard(lock_);
  script_.push_back({Step::Error, {}, 1, 0, nullptr});
}

void ScriptedSocket::AddConnectResults(int result, int count) {
  const std::lock_guard<std::mutex> guard(lock_);
  for (int i = 0; i < count; ++i) {
    connectResults_.push_back(result);
  }
}

void ScriptedSocket::SetBroken(bool broken) {
  const std::lock_guard<std::mutex> guard(lock_);
  broken_ = broken;
}

void ScriptedSocket::SetAdapter(unsigned int address, unsigned int mask) {
  const std::lock_guard<std::mutex> guard(lock_);
  hasAdapter_ = true;
  adapterAddress_ = address;
  adapterMask_ = mask;
}

void ScriptedSocket::KeepRecords(bool keep) {
  const std::lock_guard<std::mutex> guard(lock_);
  keepRecords_ = keep;
}

std::size_t ScriptedSocket::Pending() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return script_.size();
}

std::vector<ScriptedSocket::ConnectCall> ScriptedSocket::Connects() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return connects_;
}

std::vector<std::string> ScriptedSocket::Sends() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return sends_;
}

std::vector<int> ScriptedSocket::LocksHeldAtSends() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return locksHeldAtSends_;
}

std::vector<ScriptedSocket::ReceiveCall> ScriptedSocket::Receives() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return receives_;
}

std::vector<unsigned int> ScriptedSocket::AdapterQueries() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return adapterQueries_;
}
