// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "MiniXml.h"

#include <stdexcept>

namespace {

bool IsBlank(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r'; }

bool IsAsciiLetter(char c) { return (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z'); }

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

// Every byte of a multi-byte UTF-8 sequence counts as a name character; the
// sequences themselves are checked once, before reading.
bool IsNameStart(char c) {
  return IsAsciiLetter(c) || c == '_' || c == ':' || static_cast<unsigned char>(c) >= 0x80;
}

bool IsNameChar(char c) { return IsNameStart(c) || IsDigit(c) || c == '-' || c == '.'; }

// The Char production of XML 1.0.
bool IsXmlChar(unsigned long code) {
  return code == 0x9 || code == 0xA || code == 0xD || (code >= 0x20 && code <= 0xD7FF) ||
         (code >= 0xE000 && code <= 0xFFFD) || (code >= 0x10000 && code <= 0x10FFFF);
}

void AppendUtf8(std::string& out, unsigned long code) {
  if (code < 0x80) {
    out += static_cast<char>(code);
  } else if (code < 0x800) {
    out += static_cast<char>(0xC0 | (code >> 6));
    out += static_cast<char>(0x80 | (code & 0x3F));
  } else if (code < 0x10000) {
    out += static_cast<char>(0xE0 | (code >> 12));
    out += static_cast<char>(0x80 | ((code >> 6) & 0x3F));
    out += static_cast<char>(0x80 | (code & 0x3F));
  } else {
    out += static_cast<char>(0xF0 | (code >> 18));
    out += static_cast<char>(0x80 | ((code >> 12) & 0x3F));
    out += static_cast<char>(0x80 | ((code >> 6) & 0x3F));
    out += static_cast<char>(0x80 | (code & 0x3F));
  }
}

// Decodes one UTF-8 sequence at offset; returns its length, or 0 when the
// bytes there are not a shortest-form encoding of a code point.
std::size_t DecodeUtf8(std::string_view text, std::size_t offset, unsigned long& code) {
  const auto lead = static_cast<unsigned char>(text[offset]);
  std::size_t length = 0;
  unsigned long minimum = 0;
  if (lead < 0x80) {
    code = lead;
    return 1;
  }
  if (lead >= 0xC2 && lead <= 0xDF) {
    length = 2;
    minimum = 0x80;
    code = lead & 0x1FU;
  } else if (lead >= 0xE0 && lead <= 0xEF) {
    length = 3;
    minimum = 0x800;
    code = lead & 0x0FU;
  } else if (lead >= 0xF0 && lead <= 0xF4) {
    length = 4;
    minimum = 0x10000;
    code = lead & 0x07U;
  } else {
    return 0;
  }
  if (offset + length > text.size()) {
    return 0;
  }
  for (std::size_t i = 1; i < length; ++i) {
    const auto next = static_cast<unsigned char>(text[offset + i]);
    if ((next & 0xC0U) != 0x80) {
      return 0;
    }
    code = (code << 6) | (next & 0x3FU);
  }
  if (code < minimum || code > 0x10FFFF || (code >= 0xD800 && code <= 0xDFFF)) {
    return 0;
  }
  return length;
}

// Line ends become "\n" as XML prescribes: "\r\n" and a lone "\r" alike.
std::string NormaliseLineEnds(std::string_view text) {
  std::string out;
  out.reserve(text.size());
  for (std::size_t i = 0; i < text.size(); ++i) {
    if (text[i] == '\r') {
      out += '\n';
      if (i + 1 < text.size() && text[i + 1] == '\n') {
        ++i;
      }
    } else {
      out += text[i];
    }
  }
  return out;
}

std::string Quoted(std::string_view text) { return "'" + std::string(text) + "'"; }

}  // namespace

bool MiniXml::parse(std::string_view document) {
  reset();
  input = NormaliseLineEnds(document);
  try {
    readDocument();
  } catch (const std::runtime_error& problem) {
    failure = problem.what();
    rootElement = XmlElement();
    declarationElement = XmlElement();
    hasDeclaration = false;
    return false;
  }
  return true;
}

const XmlElement* MiniXml::find(std::string_view path) const {
  const std::vector<const XmlElement*> found = findAll(path);
  return found.empty() ? nullptr : found.front();
}

std::vector<const XmlElement*> MiniXml::findAll(std::string_view path) const {
  const std::size_t slash = path.find('/');
  const std::string_view first = path.substr(0, slash);
  if (rootElement.name().empty() || first != rootElement.name()) {
    return {};
  }
  return slash == std::string_view::npos ? std::vector<const XmlElement*>{&rootElement}
                                         : rootElement.findAll(path.substr(slash + 1));
}

void MiniXml::reset() {
  input.clear();
  cursor = 0;
  failure.clear();
  rootElement = XmlElement();
  declarationElement = XmlElement();
  hasDeclaration = false;
}

void MiniXml::readDocument() {
  for (std::size_t offset = 0; offset < input.size();) {
    unsigned long code = 0;
    const std::size_t length = DecodeUtf8(input, offset, code);
    if (length == 0) {
      failAt(offset, "invalid UTF-8");
    }
    if (!IsXmlChar(code)) {
      failAt(offset, "character not allowed in XML");
    }
    offset += length;
  }
  if (startsWith("\xEF\xBB\xBF")) {
    cursor += 3;
  }
  if (startsWith("<?xml") && cursor + 5 < input.size() &&
      (IsBlank(input[cursor + 5]) || input[cursor + 5] == '?')) {
    readDeclaration();
  }
  readMisc();
  if (atEnd()) {
    fail("no root element");
  }
  if (input[cursor] != '<') {
    fail("text before the root element");
  }
  readElementTree();
  readMisc();
  if (!atEnd()) {
    fail(input[cursor] == '<' ? "a second root element" : "text after the root element");
  }
}

void MiniXml::readDeclaration() {
  cursor += 5;
  declarationElement = XmlElement("xml");
  readAttributes(declarationElement, "?>");
  const std::vector<std::string> names = declarationElement.attributeNames();
  const std::vector<std::vector<std::string>> allowed = {{"version"},
                                                         {"version", "encoding"},
                                                         {"version", "standalone"},
                                                         {"version", "encoding", "standalone"}};
  bool known = false;
  for (const auto& order : allowed) {
    known = known || names == order;
  }
  if (!known) {
    fail("the XML declaration takes version, then optionally encoding and standalone");
  }
  const std::string version = *declarationElement.attribute("version");
  if (version.size() < 3 || version.compare(0, 2, "1.") != 0 ||
      version.find_first_not_of("0123456789", 2) != std::string::npos) {
    fail("unsupported XML version " + Quoted(version));
  }
  const std::string encoding = declarationElement.attribute("encoding").value_or("UTF-8");
  if (encoding != "UTF-8" && encoding != "utf-8") {
    fail("unsupported encoding " + Quoted(encoding) + " (only UTF-8 is read)");
  }
  const std::string standalone = declarationElement.attribute("standalone").value_or("yes");
  if (standalone != "yes" && standalone != "no") {
    fail("standalone must be yes or no");
  }
  hasDeclaration = true;
}

void MiniXml::readMisc() {
  for (;;) {
    skipBlanks();
    if (startsWith("<!--")) {
      readComment();
    } else if (startsWith("<?")) {
      readProcessingInstruction();
    } else if (startsWith("<!DOCTYPE")) {
      fail("document type declarations are not supported");
    } else {
      return;
    }
  }
}

void MiniXml::readElementTree() {
  bool empty = false;
  std::vector<XmlElement> open;
  open.push_back(readStartTag(empty));
  if (empty) {
    rootElement = std::move(open.back());
    return;
  }
  while (!open.empty()) {
    if (atEnd()) {
      fail("element <" + open.back().name() + "> is not closed");
    }
    if (startsWith("</")) {
      readEndTag(open.back());
      XmlElement closed = std::move(open.back());
      open.pop_back();
      if (open.empty()) {
        rootElement = std::move(closed);
      } else {
        open.back().addChild(std::move(closed));
      }
    } else if (startsWith("<!--")) {
      readComment();
    } else if (startsWith("<![CDATA[")) {
      open.back().appendText(readCdata());
    } else if (startsWith("<?")) {
      readProcessingInstruction();
    } else if (startsWith("<!")) {
      fail("markup declarations are not allowed inside an element");
    } else if (startsWith("<")) {
      const std::size_t tagStart = cursor;
      XmlElement child = readStartTag(empty);
      if (empty) {
        open.back().addChild(std::move(child));
      } else if (open.size() >= kMaxDepth) {
        failAt(tagStart, "elements nested deeper than " + std::to_string(kMaxDepth) + " levels");
      } else {
        open.push_back(std::move(child));
      }
    } else {
      open.back().appendText(readText());
    }
  }
}

XmlElement MiniXml::readStartTag(bool& empty) {
  expect("<");
  XmlElement element(readName());
  empty = readAttributes(element, ">");
  return element;
}

void MiniXml::readEndTag(const XmlElement& open) {
  const std::size_t start = cursor;
  expect("</");
  const std::string name = readName();
  if (name != open.name()) {
    failAt(start, "end tag </" + name + "> does not match <" + open.name() + ">");
  }
  skipBlanks();
  expect(">");
}

bool MiniXml::readAttributes(XmlElement& element, std::string_view end) {
  for (;;) {
    const bool blank = skipBlanks();
    if (startsWith(end)) {
      cursor += end.size();
      return false;
    }
    if (end == ">" && startsWith("/>")) {
      cursor += 2;
      return true;
    }
    if (atEnd()) {
      fail("tag <" + element.name() + "> is not closed");
    }
    if (!blank) {
      fail("blank expected before an attribute of <" + element.name() + ">");
    }
    const std::size_t start = cursor;
    std::string name = readName();
    skipBlanks();
    expect("=");
    skipBlanks();
    std::string value = readAttributeValue();
    if (!element.addAttribute(name, std::move(value))) {
      failAt(start, "attribute " + Quoted(name) + " repeated in <" + element.name() + ">");
    }
  }
}

std::string MiniXml::readAttributeValue() {
  if (atEnd() || (input[cursor] != '"' && input[cursor] != '\'')) {
    fail("attribute value must be quoted");
  }
  const char quote = input[cursor++];
  std::string value;
  for (;;) {
    if (atEnd()) {
      fail("attribute value is not closed");
    }
    const char c = input[cursor];
    if (c == quote) {
      ++cursor;
      return value;
    }
    if (c == '<') {
      fail("'<' inside an attribute value");
    }
    if (c == '&') {
      value += readReference();
      continue;
    }
    // Literal tabs and line ends in a value read as blanks.
    value += (c == '\t' || c == '\n') ? ' ' : c;
    ++cursor;
  }
}

void MiniXml::readComment() {
  const std::size_t start = cursor;
  cursor += 4;
  const std::size_t dashes = input.find("--", cursor);
  if (dashes == std::string::npos) {
    failAt(start, "comment is not closed");
  }
  if (dashes + 2 >= input.size() || input[dashes + 2] != '>') {
    failAt(dashes, "'--' inside a comment");
  }
  cursor = dashes + 3;
}

void MiniXml::readProcessingInstruction() {
  const std::size_t start = cursor;
  cursor += 2;
  const std::string target = readName();
  std::string lower;
  for (const char c : target) {
    lower += (c >= 'A' && c <= 'Z') ? static_cast<char>(c - 'A' + 'a') : c;
  }
  if (lower == "xml") {
    failAt(start, "the XML declaration must open the document");
  }
  if (startsWith("?>")) {
    cursor += 2;
    return;
  }
  if (!skipBlanks()) {
    fail("blank expected after the processing instruction's target");
  }
  const std::size_t close = input.find("?>", cursor);
  if (close == std::string::npos) {
    failAt(start, "processing instruction is not closed");
  }
  cursor = close + 2;
}

std::string MiniXml::readCdata() {
  const std::size_t start = cursor;
  cursor += 9;
  const std::size_t close = input.find("]]>", cursor);
  if (close == std::string::npos) {
    failAt(start, "CDATA section is not closed");
  }
  std::string data = input.substr(cursor, close - cursor);
  cursor = close + 3;
  return data;
}

std::string MiniXml::readText() {
  std::string text;
  while (!atEnd() && input[cursor] != '<') {
    if (input[cursor] == '&') {
      text += readReference();
    } else if (startsWith("]]>")) {
      fail("']]>' in character data");
    } else {
      text += input[cursor++];
    }
  }
  return text;
}

std::string MiniXml::readReference() {
  const std::size_t start = cursor;
  expect("&");
  std::string out;
  if (startsWith("#")) {
    ++cursor;
    const bool hex = startsWith("x");
    cursor += hex ? 1 : 0;
    unsigned long code = 0;
    std::size_t digits = 0;
    for (; !atEnd() && input[cursor] != ';'; ++cursor, ++digits) {
      const char c = input[cursor];
      unsigned long digit = 0;
      if (IsDigit(c)) {
        digit = static_cast<unsigned long>(c - '0');
      } else if (hex && c >= 'a' && c <= 'f') {
        digit = static_cast<unsigned long>(c - 'a') + 10;
      } else if (hex && c >= 'A' && c <= 'F') {
        digit = static_cast<unsigned long>(c - 'A') + 10;
      } else {
        failAt(start, "malformed character reference");
      }
      code = code * (hex ? 16 : 10) + digit;
      if (code > 0x10FFFF) {
        failAt(start, "character reference out of range");
      }
    }
    if (atEnd() || digits == 0) {
      failAt(start, "malformed character reference");
    }
    if (!IsXmlChar(code)) {
      failAt(start, "character reference to a character not allowed in XML");
    }
    ++cursor;
    AppendUtf8(out, code);
    return out;
  }
  const std::string name = readName();
  expect(";");
  if (name == "lt") {
    return "<";
  }
  if (name == "gt") {
    return ">";
  }
  if (name == "amp") {
    return "&";
  }
  if (name == "apos") {
    return "'";
  }
  if (name == "quot") {
    return "\"";
  }
  failAt(start, "unknown entity &" + name + ";");
}

std::string MiniXml::readName() {
  const std::size_t start = cursor;
  if (atEnd() || !IsNameStart(input[cursor])) {
    fail("name expected");
  }
  while (!atEnd() && IsNameChar(input[cursor])) {
    ++cursor;
  }
  return input.substr(start, cursor - start);
}

bool MiniXml::skipBlanks() {
  const std::size_t start = cursor;
  while (!atEnd() && IsBlank(input[cursor])) {
    ++cursor;
  }
  return cursor != start;
}

void MiniXml::expect(std::string_view literal) {
  if (!startsWith(literal)) {
    fail(Quoted(literal) + " expected");
  }
  cursor += literal.size();
}

bool MiniXml::startsWith(std::string_view literal) const {
  return cursor <= input.size() && input.size() - cursor >= literal.size() &&
         input.compare(cursor, literal.size(), literal) == 0;
}

void MiniXml::fail(const std::string& reason) const { failAt(cursor, reason); }

void MiniXml::failAt(std::size_t offset, const std::string& reason) const {
  std::size_t line = 1;
  std::size_t column = 1;
  for (std::size_t i = 0; i < offset && i < input.size(); ++i) {
    if (input[i] == '\n') {
      ++line;
      column = 1;
    } else {
      ++column;
    }
  }
  // parse turns this into error().
  throw std::runtime_error("line " + std::to_string(line) + ", column " + std::to_string(column) +
                           ": " + reason);
}
