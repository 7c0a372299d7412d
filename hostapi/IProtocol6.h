// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol5.h"

// Sixth generation: objects, configuration-tool hooks, events, alarms and
// trends. Channels, alarms and trends are opaque handles owned by the
// protocol.
class IProtocol6 : public IProtocol5 {
 public:
  virtual bool readObject(const ITag* tag, IObjectString* object) = 0;
  virtual bool writeObject(const ITag* tag, const IObjectString* object) = 0;
  virtual int vcsGetCapability(int capability) = 0;
  virtual int vcsGetComParams(char* out, int outSize) = 0;
  virtual int vcsActivateInterleaved(int enable) = 0;
  virtual void* createEventChannel(int queueSize) = 0;
  virtual void* createEventChannel(IEventProcessor* processor) = 0;
  virtual void deleteEventChannel(void* channel) = 0;
  virtual bool addEventSource(void* channel, const ITag* tag) = 0;
  virtual bool addAlarmEvents(void* channel, void* alarm) = 0;
  virtual const void* frontEvent(void* channel) = 0;
  virtual void popEvent(void* channel) = 0;
  virtual void* createAlarm(const char* definition) = 0;
  virtual void deleteAlarm(void* alarm) = 0;
  virtual int listAlarms(void* alarm, char* out, int outSize) = 0;
  virtual int quitAlarm(void* alarm, int id) = 0;
  virtual void* createTrend(const char* definition) = 0;
  virtual void deleteTrend(void* trend) = 0;
  virtual int readTrend(void* trend, unsigned long long from, unsigned long long to,
                        unsigned char* buffer, int size) = 0;
};
