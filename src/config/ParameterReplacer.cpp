// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "config/ParameterReplacer.h"

#include <algorithm>
#include <array>

#include "binding/HostServices.h"

namespace {

// Strings read through the second storage generation land in a buffer of
// this size; a longer stored text fails to read.
constexpr int kTextBufferSize = 256;

bool IsKnownType(std::int32_t type) {
  return type == ParameterReplacer::kBoolean || type == ParameterReplacer::kInteger ||
         type == ParameterReplacer::kString;
}

// Copies the member that value's type names, and the type, into entry.
void AssignTyped(ParameterReplacer::Variant& entry, const ParameterReplacer::Variant& value) {
  entry.type = value.type;
  switch (value.type) {
    case ParameterReplacer::kBoolean:
      entry.boolValue = value.boolValue;
      break;
    case ParameterReplacer::kInteger:
      entry.intValue = value.intValue;
      break;
    default:
      entry.stringValue = value.stringValue;
      break;
  }
}

ParameterReplacer::Variant MakeBoolean(bool value) {
  ParameterReplacer::Variant result;
  result.type = ParameterReplacer::kBoolean;
  result.boolValue = value;
  return result;
}

ParameterReplacer::Variant MakeInteger(int value) {
  ParameterReplacer::Variant result;
  result.type = ParameterReplacer::kInteger;
  result.intValue = value;
  return result;
}

ParameterReplacer::Variant MakeString(const std::string& value) {
  ParameterReplacer::Variant result;
  result.type = ParameterReplacer::kString;
  result.stringValue = value;
  return result;
}

}  // namespace

std::string ParameterReplacer::makeFullName(const std::string& name, int node) {
  if (node == -1) {
    return name;
  }
  return name + std::to_string(node);
}

void ParameterReplacer::setSection(const std::string& newSection) {
  const std::lock_guard<std::mutex> lock(mutex);
  section = newSection;
}

const std::string& ParameterReplacer::getSection() const { return section; }

void ParameterReplacer::get(const std::string& name, int node, const std::string& def,
                            std::string& out) {
  const Variant fallback = MakeString(def);
  const std::lock_guard<std::mutex> lock(mutex);
  out = load(makeFullName(name, node), fallback).stringValue;
}

void ParameterReplacer::get(const std::string& name, int node, int def, int& out) {
  const Variant fallback = MakeInteger(def);
  const std::lock_guard<std::mutex> lock(mutex);
  out = load(makeFullName(name, node), fallback).intValue;
}

void ParameterReplacer::get(const std::string& name, int node, bool def, bool& out) {
  const Variant fallback = MakeBoolean(def);
  const std::lock_guard<std::mutex> lock(mutex);
  out = load(makeFullName(name, node), fallback).boolValue;
}

bool ParameterReplacer::set(const std::string& fullName, const Variant& value) {
  if (!IsKnownType(value.type)) {
    return false;
  }
  const std::lock_guard<std::mutex> lock(mutex);
  AssignTyped(values[fullName], value);
  return true;
}

void ParameterReplacer::persist(const std::string& fullName, const Variant& value) const {
  if (piPermanentStorage == nullptr) {
    return;
  }
  // The storage write may take long (a durable store syncs it to disk), so
  // the set is not held meanwhile: readers of live values go on.
  std::string sectionCopy;
  {
    const std::lock_guard<std::mutex> lock(mutex);
    sectionCopy = section;
  }
  const char* const sectionText = sectionCopy.c_str();
  const char* const nameText = fullName.c_str();
  switch (value.type) {
    case kBoolean:
      piPermanentStorage->SetBoolValue(sectionText, nameText, value.boolValue);
      break;
    case kInteger:
      piPermanentStorage->SetIntValue(sectionText, nameText, value.intValue);
      break;
    case kString:
      piPermanentStorage->SetStringValue(sectionText, nameText, value.stringValue.c_str());
      break;
    default:
      break;
  }
}

bool ParameterReplacer::find(const std::string& fullName, Variant& out) const {
  const std::lock_guard<std::mutex> lock(mutex);
  const auto found = values.find(fullName);
  if (found == values.end()) {
    return false;
  }
  out = found->second;
  return true;
}

std::map<std::string, ParameterReplacer::Variant> ParameterReplacer::entries() const {
  const std::lock_guard<std::mutex> lock(mutex);
  return values;
}

const ParameterReplacer::Variant& ParameterReplacer::load(const std::string& fullName,
                                                          const Variant& def) {
  const auto found = values.find(fullName);
  if (found != values.end()) {
    return found->second;
  }
  return values.emplace(fullName, readStored(fullName, def)).first->second;
}

ParameterReplacer::Variant ParameterReplacer::readStored(const std::string& fullName,
                                                         const Variant& def) const {
  if (piPermanentStorage == nullptr ||
      piPermanentStorage->HasValue(section.c_str(), fullName.c_str()) == 0) {
    return def;
  }
  switch (def.type) {
    case kBoolean:
      return MakeBoolean(piPermanentStorage->GetBoolValue(section.c_str(), fullName.c_str()));
    case kInteger:
      return MakeInteger(piPermanentStorage->GetIntValue(section.c_str(), fullName.c_str()));
    default:
      return MakeString(readStoredText(fullName));
  }
}

// A stored text that cannot be read gives the empty string, not the caller's
// default: the name is known to be stored, so its value is what stands, and
// an unreadable one counts as empty.
std::string ParameterReplacer::readStoredText(const std::string& fullName) const {
  IInterface* const second = piPermanentStorage->ConvertTo("IPermanentStorage2");
  if (second != nullptr) {
    // The storage answered the name "IPermanentStorage2", so it is one: a
    // false positive, as IInterface declares no virtual function and the
    // host interfaces are converted by name, so no checked cast exists.
    // NOLINTNEXTLINE(cppcoreguidelines-pro-type-static-cast-downcast)
    auto* const storage2 = static_cast<IPermanentStorage2*>(second);
    std::array<char, kTextBufferSize> buffer{};
    if (storage2->GetStringValueInto(section.c_str(), fullName.c_str(), buffer.data(),
                                     kTextBufferSize) == 0) {
      return {};
    }
    // A host that fills the whole buffer without a terminator still cannot
    // make the copy run past it.
    return {buffer.begin(), std::find(buffer.begin(), buffer.end(), '\0')};
  }
  const char* const text = piPermanentStorage->GetStringValue(section.c_str(), fullName.c_str());
  if (text == nullptr) {
    return {};
  }
  return text;
}
