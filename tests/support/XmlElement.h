// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

// One element of a document read by MiniXml: its name, its attributes in
// document order, the character data directly inside it and its child
// elements. Paths are child element names separated by "/", taken relative
// to this element ("parameters/parameter" from the root); every step takes
// all children of that name, in document order.
class XmlElement {
 public:
  using Attribute = std::pair<std::string, std::string>;

  XmlElement() = default;
  explicit XmlElement(std::string name) : elementName(std::move(name)) {}

  const std::string& name() const { return elementName; }

  // Attributes as written, in document order, entity references resolved.
  const std::vector<Attribute>& attributes() const { return attributeList; }
  // Just the attribute names, in document order.
  std::vector<std::string> attributeNames() const;
  bool hasAttribute(std::string_view attributeName) const;
  // The value of the attribute, or no value when the element has none of
  // that name (an empty value is a value).
  std::optional<std::string> attribute(std::string_view attributeName) const;

  // The character data directly inside this element (not inside its
  // children), with entity references and CDATA sections resolved, joined
  // in document order. For "<p>key\n  <c/>\n</p>" that is "key\n  \n".
  const std::string& text() const { return characterData; }
  // text() without leading and trailing blanks, tabs and line ends.
  std::string trimmedText() const;

  const std::vector<XmlElement>& children() const { return childList; }
  // The names of the child elements, in document order.
  std::vector<std::string> childNames() const;

  // The first element reached by the path, or null.
  const XmlElement* find(std::string_view path) const;
  // Every element reached by the path, in document order.
  std::vector<const XmlElement*> findAll(std::string_view path) const;
  // The first element reached by the path whose trimmed text equals text.
  const XmlElement* findByText(std::string_view path, std::string_view wanted) const;
  // The first element reached by the path with that attribute value.
  const XmlElement* findByAttribute(std::string_view path, std::string_view attributeName,
                                    std::string_view value) const;

  // Building, as the parser does it. addAttribute refuses (returns false) a
  // second attribute of the same name.
  bool addAttribute(std::string attributeName, std::string value);
  void appendText(std::string_view data) { characterData.append(data); }
  void addChild(XmlElement child) { childList.push_back(std::move(child)); }

 private:
  std::string elementName;
  std::vector<Attribute> attributeList;
  std::string characterData;
  std::vector<XmlElement> childList;
};
