// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "XmlElement.h"

// A small, strict reader of XML 1.0 documents in UTF-8, for tests: elements,
// attributes, character data, the five predefined entities, character
// references, CDATA sections, comments, processing instructions and the XML
// declaration. A document type declaration is refused, as is everything that
// is not well-formed: mismatched or unclosed tags, repeated attributes,
// unquoted values, "<" in a value, unknown entities, bad UTF-8, characters
// XML does not allow, text outside the root element, a misplaced declaration.
//
//   MiniXml xml;
//   ASSERT_TRUE(xml.parse(text)) << xml.error();
//   const XmlElement* p = xml.root().findByText("parameters/parameter", "gap");
//   EXPECT_EQ(p->attribute("default"), "0");
class MiniXml {
 public:
  // Reads a whole document, replacing what an earlier call read. On false,
  // error() says where and why ("line 3, column 7: ...") and root() is an
  // element without a name.
  bool parse(std::string_view document);
  const std::string& error() const { return failure; }

  const XmlElement& root() const { return rootElement; }
  // The XML declaration's pseudo-attributes (version, encoding, standalone)
  // as an element named "xml"; null when the document has no declaration.
  const XmlElement* declaration() const { return hasDeclaration ? &declarationElement : nullptr; }

  // Paths that begin with the root element's name: "protocol_cfg/models/model".
  const XmlElement* find(std::string_view path) const;
  std::vector<const XmlElement*> findAll(std::string_view path) const;

  // Elements may nest this deep; deeper documents are refused.
  static constexpr std::size_t kMaxDepth = 256;

 private:
  void reset();
  void readDocument();
  void readDeclaration();
  void readMisc();
  void readElementTree();
  // Reads "<name attr='v' ...>" or "<name .../>" at the cursor.
  XmlElement readStartTag(bool& empty);
  void readEndTag(const XmlElement& open);
  // Reads blank-separated name="value" pairs up to the given end ("?>" for
  // the declaration, ">" for a start tag, which may also end in "/>") and
  // leaves the cursor after it; true when the tag ended in "/>".
  bool readAttributes(XmlElement& element, std::string_view end);
  std::string readAttributeValue();
  void readComment();
  void readProcessingInstruction();
  std::string readCdata();
  std::string readText();
  // Reads "&...;" at the cursor and returns the text it stands for.
  std::string readReference();
  std::string readName();
  bool skipBlanks();
  void expect(std::string_view literal);
  bool startsWith(std::string_view literal) const;
  bool atEnd() const { return cursor >= input.size(); }
  [[noreturn]] void fail(const std::string& reason) const;
  [[noreturn]] void failAt(std::size_t offset, const std::string& reason) const;

  std::string input;
  std::size_t cursor = 0;
  std::string failure;
  XmlElement rootElement;
  XmlElement declarationElement;
  bool hasDeclaration = false;
};
