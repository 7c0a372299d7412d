// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// Root of every interface handed across the plug-in boundary. It declares no
// virtual operation, so an interface that derives from it starts its own slot
// table with its own first operation (IInterfaceFactory has no destructor
// slots in front of CreateInterface). Interfaces are found by ASCII name and
// converted with static_cast; nothing is ever deleted through IInterface.
//
// Conventions of every header in this folder:
// - Names (interfaces, protocols) compare exactly and case-sensitively; an
//   unknown name gives null, silently.
// - Results: a success flag (bool true, or an int that is non-zero; 0 on
//   success only where a header says so) or a pointer (null on failure). A
//   protocol records why it failed as its last error, a code and a text.
//   Nothing is thrown across the boundary except std::bad_alloc.
// - Texts are NUL-terminated byte strings without encoding conversion. A
//   returned text stays valid as its operation states, else for the life of
//   the object that returned it.
// - Threads, as the headers name them: the loading thread (dlopen, module
//   Init and Close, dlclose); the control thread (creating, configuring,
//   starting, stopping and deleting a protocol); one worker thread per started
//   protocol, a host task that the plug-in asks for; the tag threads (any
//   number, creating, reading, writing and freeing tags); the console thread
//   (DoCommand). One protocol is never configured, started, stopped or
//   deleted from two threads at once.
class IInterface {
 protected:
  IInterface() = default;
  IInterface(const IInterface&) = default;
  IInterface& operator=(const IInterface&) = default;
  IInterface(IInterface&&) = default;
  IInterface& operator=(IInterface&&) = default;
  ~IInterface() = default;
};
