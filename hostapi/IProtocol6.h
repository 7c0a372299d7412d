// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol5.h"

// Sixth generation: objects, configuration-tool hooks, events, alarms and
// trends. Channels, alarms and trends are opaque handles owned by the
// protocol; a handle is given back through its delete operation. Called on
// the tag threads. What an argument means beyond what is said here is the
// host's. This plug-in offers none of these operations: each answers as
// its comment says for an operation not offered.
class IProtocol6 : public IProtocol5 {
 public:
  // Reads the tag as an object. Not offered: false, error -1 with
  // "read object not supported".
  virtual bool readObject(const ITag* tag, IObjectString* object) = 0;
  // Writes the tag as an object. Not offered: false, error -1 with
  // "write object not supported".
  virtual bool writeObject(const ITag* tag, const IObjectString* object) = 0;
  // Configuration-tool hooks (a capability query, the communication
  // parameters written into out, at most outSize bytes, and interleaved
  // operation); each answers 0 when not offered.
  virtual int vcsGetCapability(int capability) = 0;
  virtual int vcsGetComParams(char* out, int outSize) = 0;
  virtual int vcsActivateInterleaved(int enable) = 0;
  // An event channel holding up to queueSize events. Not offered: null,
  // error -1 with "protocol does not support event channel".
  virtual void* createEventChannel(int queueSize) = 0;
  // An event channel that hands its events to processor. Not offered: null,
  // error -1 with "protocol does not support event channel".
  virtual void* createEventChannel(IEventProcessor* processor) = 0;
  // Deletes a channel made by createEventChannel; null is ignored.
  virtual void deleteEventChannel(void* channel) = 0;
  // Adds the tag's events to the channel. Not offered: false, error -1 with
  // "protocol does not support event channel".
  virtual bool addEventSource(void* channel, const ITag* tag) = 0;
  // Adds the alarm's events to the channel. Not offered: false, error -1
  // with "protocol does not support event channel".
  virtual bool addAlarmEvents(void* channel, void* alarm) = 0;
  // The oldest event of the channel, null when there is none; valid until
  // popEvent.
  virtual const void* frontEvent(void* channel) = 0;
  // Removes the oldest event of the channel, if any.
  virtual void popEvent(void* channel) = 0;
  // An alarm from its definition text. Not offered: null, error -1 with
  // "protocol does not support alarms".
  virtual void* createAlarm(const char* definition) = 0;
  // Deletes an alarm made by createAlarm; null is ignored.
  virtual void deleteAlarm(void* alarm) = 0;
  // Writes the alarm's list into out (at most outSize bytes); 0 when not
  // offered.
  virtual int listAlarms(void* alarm, char* out, int outSize) = 0;
  // Acknowledges entry id of the alarm; 0 when not offered.
  virtual int quitAlarm(void* alarm, int id) = 0;
  // A trend from its definition text. Not offered: null, error -1 with
  // "protocol does not support trends".
  virtual void* createTrend(const char* definition) = 0;
  // Deletes a trend made by createTrend; null is ignored.
  virtual void deleteTrend(void* trend) = 0;
  // Reads the trend's samples between the time stamps from and to
  // (milliseconds since the Unix epoch) into buffer (at most size bytes); 0
  // when not offered.
  virtual int readTrend(void* trend, unsigned long long from, unsigned long long to,
                        unsigned char* buffer, int size) = 0;
};
