// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "XmlElement.h"

namespace {

bool IsBlank(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r'; }

// Splits "a/b/c" into its steps; empty steps (from "a//b" or a leading or
// trailing "/") are dropped.
std::vector<std::string_view> Steps(std::string_view path) {
  std::vector<std::string_view> steps;
  while (!path.empty()) {
    const std::size_t slash = path.find('/');
    const std::string_view step = path.substr(0, slash);
    if (!step.empty()) {
      steps.push_back(step);
    }
    if (slash == std::string_view::npos) {
      break;
    }
    path.remove_prefix(slash + 1);
  }
  return steps;
}

}  // namespace

std::vector<std::string> XmlElement::attributeNames() const {
  std::vector<std::string> names;
  names.reserve(attributeList.size());
  for (const Attribute& item : attributeList) {
    names.push_back(item.first);
  }
  return names;
}

bool XmlElement::hasAttribute(std::string_view attributeName) const {
  return attribute(attributeName).has_value();
}

std::optional<std::string> XmlElement::attribute(std::string_view attributeName) const {
  for (const Attribute& item : attributeList) {
    if (item.first == attributeName) {
      return item.second;
    }
  }
  return std::nullopt;
}

std::string XmlElement::trimmedText() const {
  std::size_t begin = 0;
  std::size_t end = characterData.size();
  while (begin < end && IsBlank(characterData[begin])) {
    ++begin;
  }
  while (end > begin && IsBlank(characterData[end - 1])) {
    --end;
  }
  return characterData.substr(begin, end - begin);
}

std::vector<std::string> XmlElement::childNames() const {
  std::vector<std::string> names;
  names.reserve(childList.size());
  for (const XmlElement& child : childList) {
    names.push_back(child.name());
  }
  return names;
}

const XmlElement* XmlElement::find(std::string_view path) const {
  const std::vector<const XmlElement*> found = findAll(path);
  return found.empty() ? nullptr : found.front();
}

std::vector<const XmlElement*> XmlElement::findAll(std::string_view path) const {
  std::vector<const XmlElement*> level{this};
  for (const std::string_view step : Steps(path)) {
    std::vector<const XmlElement*> next;
    for (const XmlElement* element : level) {
      for (const XmlElement& child : element->childList) {
        if (child.name() == step) {
          next.push_back(&child);
        }
      }
    }
    level = std::move(next);
  }
  return level;
}

const XmlElement* XmlElement::findByText(std::string_view path, std::string_view wanted) const {
  for (const XmlElement* element : findAll(path)) {
    if (element->trimmedText() == wanted) {
      return element;
    }
  }
  return nullptr;
}

const XmlElement* XmlElement::findByAttribute(std::string_view path, std::string_view attributeName,
                                              std::string_view value) const {
  for (const XmlElement* element : findAll(path)) {
    if (element->attribute(attributeName) == value) {
      return element;
    }
  }
  return nullptr;
}

bool XmlElement::addAttribute(std::string attributeName, std::string value) {
  if (hasAttribute(attributeName)) {
    return false;
  }
  attributeList.emplace_back(std::move(attributeName), std::move(value));
  return true;
}
