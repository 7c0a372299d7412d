// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "MiniXml.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

std::string ParseError(const std::string& document) {
  MiniXml xml;
  if (xml.parse(document)) {
    return "(parsed)";
  }
  return xml.error();
}

// --------------------------------------------------------------- accepted

TEST(MiniXml, ReadsElementsAttributesAndText) {
  MiniXml xml;
  ASSERT_TRUE(
      xml.parse("<?xml version=\"1.0\" encoding=\"utf-8\"?>\n"
                "<root a=\"1\" b='two'>\n"
                "  <item id=\"x\">first</item>\n"
                "  <item id=\"y\"/>\n"
                "  <group><item id=\"z\">deep</item></group>\n"
                "</root>\n"))
      << xml.error();
  const XmlElement& root = xml.root();
  EXPECT_EQ(root.name(), "root");
  EXPECT_EQ(root.attributeNames(), (std::vector<std::string>{"a", "b"}));
  EXPECT_EQ(root.attribute("a"), "1");
  EXPECT_EQ(root.attribute("b"), "two");
  EXPECT_EQ(root.attribute("c"), std::nullopt);
  EXPECT_EQ(root.childNames(), (std::vector<std::string>{"item", "item", "group"}));
  EXPECT_EQ(root.children()[0].text(), "first");
  EXPECT_EQ(root.children()[1].text(), "");
  EXPECT_TRUE(root.children()[1].children().empty());
  EXPECT_EQ(root.text(), "\n  \n  \n  \n");
  EXPECT_EQ(root.trimmedText(), "");
}

TEST(MiniXml, DeclarationIsOptionalAndReadAsPseudoAttributes) {
  MiniXml xml;
  ASSERT_TRUE(xml.parse("<r/>")) << xml.error();
  EXPECT_EQ(xml.declaration(), nullptr);
  ASSERT_TRUE(xml.parse("<?xml version='1.0' encoding='UTF-8' standalone='yes'?><r/>"))
      << xml.error();
  ASSERT_NE(xml.declaration(), nullptr);
  EXPECT_EQ(xml.declaration()->name(), "xml");
  EXPECT_EQ(xml.declaration()->attributeNames(),
            (std::vector<std::string>{"version", "encoding", "standalone"}));
  EXPECT_EQ(xml.declaration()->attribute("encoding"), "UTF-8");
}

TEST(MiniXml, MixedContentKeepsDirectTextOnly) {
  MiniXml xml;
  ASSERT_TRUE(xml.parse("<p a=\"1\">key\n  <c>inner</c>\n  <c/>\n</p>")) << xml.error();
  EXPECT_EQ(xml.root().text(), "key\n  \n  \n");
  EXPECT_EQ(xml.root().trimmedText(), "key");
  EXPECT_EQ(xml.root().children()[0].text(), "inner");
}

TEST(MiniXml, ResolvesEntityAndCharacterReferences) {
  MiniXml xml;
  ASSERT_TRUE(
      xml.parse("<r v=\"&lt;&amp;&gt;&quot;&apos;\">&#65;&#x42;&#xe9;&#x20AC;&#x1F600;"
                "&lt;x&gt;</r>"))
      << xml.error();
  EXPECT_EQ(xml.root().attribute("v"), "<&>\"'");
  EXPECT_EQ(xml.root().text(), "AB\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80<x>");
}

TEST(MiniXml, CdataCommentsAndProcessingInstructions) {
  MiniXml xml;
  ASSERT_TRUE(
      xml.parse("<!-- before --><?tool run?>\n<r>a<![CDATA[<b>&amp;]]>c<!-- in -->d"
                "<?pi?></r>\n<!-- after -->\n"))
      << xml.error();
  EXPECT_EQ(xml.root().text(), "a<b>&amp;cd");
  EXPECT_TRUE(xml.root().children().empty());
}

TEST(MiniXml, LineEndsAndWhitespaceInAttributeValues) {
  MiniXml xml;
  ASSERT_TRUE(xml.parse("<r v=\"a\tb\r\nc\">x\r\ny\rz</r>")) << xml.error();
  EXPECT_EQ(xml.root().attribute("v"), "a b c");
  EXPECT_EQ(xml.root().text(), "x\ny\nz");
}

TEST(MiniXml, AcceptsAByteOrderMarkAndUtf8Names) {
  MiniXml xml;
  ASSERT_TRUE(xml.parse("\xEF\xBB\xBF<r\xC3\xA9 \xC3\xA9t\xC3\xA9=\"\xE2\x82\xAC\"/>"))
      << xml.error();
  EXPECT_EQ(xml.root().name(), "r\xC3\xA9");
  EXPECT_EQ(xml.root().attribute("\xC3\xA9t\xC3\xA9"), "\xE2\x82\xAC");
}

TEST(MiniXml, EmptyAttributeValueIsAValue) {
  MiniXml xml;
  ASSERT_TRUE(xml.parse("<r a=\"\" />")) << xml.error();
  EXPECT_TRUE(xml.root().hasAttribute("a"));
  EXPECT_EQ(xml.root().attribute("a"), "");
  EXPECT_FALSE(xml.root().hasAttribute("b"));
}

TEST(MiniXml, ANewParseReplacesTheOldDocument) {
  MiniXml xml;
  ASSERT_TRUE(xml.parse("<?xml version=\"1.0\"?><first/>"));
  ASSERT_TRUE(xml.parse("<second/>"));
  EXPECT_EQ(xml.root().name(), "second");
  EXPECT_EQ(xml.declaration(), nullptr);
  EXPECT_EQ(xml.error(), "");
  ASSERT_FALSE(xml.parse("<third>"));
  EXPECT_EQ(xml.root().name(), "");
  ASSERT_TRUE(xml.parse("<fourth/>"));
  EXPECT_EQ(xml.error(), "");
}

// ----------------------------------------------------------------- lookups

class MiniXmlLookup : public ::testing::Test {
 protected:
  void SetUp() override {
    ASSERT_TRUE(
        xml.parse("<cfg>"
                  "<params><param kind=\"a\">one</param><param kind=\"b\"> two </param>"
                  "</params>"
                  "<params><param kind=\"c\">three</param></params>"
                  "<models><model>1<ref>x</ref><ref>y</ref></model></models>"
                  "</cfg>"))
        << xml.error();
  }
  MiniXml xml;
};

TEST_F(MiniXmlLookup, FindAllFollowsEveryBranchInDocumentOrder) {
  std::vector<std::string> texts;
  for (const XmlElement* param : xml.root().findAll("params/param")) {
    texts.push_back(param->trimmedText());
  }
  EXPECT_EQ(texts, (std::vector<std::string>{"one", "two", "three"}));
  EXPECT_EQ(xml.findAll("cfg/params/param").size(), 3U);
}

TEST_F(MiniXmlLookup, FindReturnsTheFirstMatchOrNull) {
  ASSERT_NE(xml.root().find("params/param"), nullptr);
  EXPECT_EQ(xml.root().find("params/param")->text(), "one");
  EXPECT_EQ(xml.root().find("params/nothing"), nullptr);
  EXPECT_EQ(xml.root().find("nothing/param"), nullptr);
  EXPECT_EQ(xml.root().find(""), &xml.root());
}

TEST_F(MiniXmlLookup, DocumentPathsBeginWithTheRootName) {
  ASSERT_NE(xml.find("cfg"), nullptr);
  EXPECT_EQ(xml.find("cfg"), &xml.root());
  ASSERT_NE(xml.find("cfg/models/model/ref"), nullptr);
  EXPECT_EQ(xml.find("cfg/models/model/ref")->text(), "x");
  EXPECT_EQ(xml.find("models/model"), nullptr);
  EXPECT_EQ(xml.find("other/models"), nullptr);
  EXPECT_TRUE(xml.findAll("").empty());
}

TEST_F(MiniXmlLookup, FindByTextComparesTrimmedText) {
  const XmlElement* two = xml.root().findByText("params/param", "two");
  ASSERT_NE(two, nullptr);
  EXPECT_EQ(two->attribute("kind"), "b");
  EXPECT_EQ(xml.root().findByText("params/param", "Two"), nullptr);
  EXPECT_EQ(xml.root().findByText("models/model", "1"), xml.find("cfg/models/model"));
}

TEST_F(MiniXmlLookup, FindByAttributeComparesExactly) {
  const XmlElement* c = xml.root().findByAttribute("params/param", "kind", "c");
  ASSERT_NE(c, nullptr);
  EXPECT_EQ(c->text(), "three");
  EXPECT_EQ(xml.root().findByAttribute("params/param", "kind", "C"), nullptr);
  EXPECT_EQ(xml.root().findByAttribute("params/param", "other", "a"), nullptr);
}

// ----------------------------------------------------------------- refused

TEST(MiniXmlRejects, MismatchedEndTag) {
  EXPECT_EQ(ParseError("<a>\n  <b></c>\n</a>"),
            "line 2, column 6: end tag </c> does not match <b>");
}

TEST(MiniXmlRejects, UnclosedElement) {
  EXPECT_EQ(ParseError("<a><b></b>"), "line 1, column 11: element <a> is not closed");
  EXPECT_EQ(ParseError("<a"), "line 1, column 3: tag <a> is not closed");
}

TEST(MiniXmlRejects, MissingOrSecondRoot) {
  EXPECT_EQ(ParseError(""), "line 1, column 1: no root element");
  EXPECT_EQ(ParseError("  <!-- only a comment -->\n"), "line 2, column 1: no root element");
  EXPECT_EQ(ParseError("<a/><b/>"), "line 1, column 5: a second root element");
}

TEST(MiniXmlRejects, TextOutsideTheRoot) {
  EXPECT_EQ(ParseError("x<a/>"), "line 1, column 1: text before the root element");
  EXPECT_EQ(ParseError("<a/>x"), "line 1, column 5: text after the root element");
}

TEST(MiniXmlRejects, RepeatedAttribute) {
  EXPECT_EQ(ParseError("<a x=\"1\" x=\"2\"/>"), "line 1, column 10: attribute 'x' repeated in <a>");
}

TEST(MiniXmlRejects, UnquotedOrUnclosedAttributeValue) {
  EXPECT_EQ(ParseError("<a x=1/>"), "line 1, column 6: attribute value must be quoted");
  EXPECT_EQ(ParseError("<a x=\"1/>"), "line 1, column 10: attribute value is not closed");
  EXPECT_EQ(ParseError("<a x=\"1'/>"), "line 1, column 11: attribute value is not closed");
}

TEST(MiniXmlRejects, AttributeWithoutValueOrBlank) {
  EXPECT_EQ(ParseError("<a x/>"), "line 1, column 5: '=' expected");
  EXPECT_EQ(ParseError("<a x=\"1\"y=\"2\"/>"),
            "line 1, column 9: blank expected before an attribute of <a>");
}

TEST(MiniXmlRejects, LessThanInsideAnAttributeValue) {
  EXPECT_EQ(ParseError("<a x=\"<\"/>"), "line 1, column 7: '<' inside an attribute value");
}

TEST(MiniXmlRejects, UnknownOrMalformedReferences) {
  EXPECT_EQ(ParseError("<a>&nbsp;</a>"), "line 1, column 4: unknown entity &nbsp;");
  EXPECT_EQ(ParseError("<a>& b</a>"), "line 1, column 5: name expected");
  EXPECT_EQ(ParseError("<a>&amp</a>"), "line 1, column 8: ';' expected");
  EXPECT_EQ(ParseError("<a>&#;</a>"), "line 1, column 4: malformed character reference");
  EXPECT_EQ(ParseError("<a>&#x;</a>"), "line 1, column 4: malformed character reference");
  EXPECT_EQ(ParseError("<a>&#12a;</a>"), "line 1, column 4: malformed character reference");
  EXPECT_EQ(ParseError("<a>&#0;</a>"),
            "line 1, column 4: character reference to a character not allowed in XML");
  EXPECT_EQ(ParseError("<a>&#xD800;</a>"),
            "line 1, column 4: character reference to a character not allowed in XML");
  EXPECT_EQ(ParseError("<a>&#x110000;</a>"), "line 1, column 4: character reference out of range");
  EXPECT_EQ(ParseError("<a>&#99999999999999999999;</a>"),
            "line 1, column 4: character reference out of range");
}

TEST(MiniXmlRejects, InvalidUtf8AndForbiddenCharacters) {
  EXPECT_EQ(ParseError("<a>\xC3</a>"), "line 1, column 4: invalid UTF-8");
  EXPECT_EQ(ParseError("<a>\xC0\xAF</a>"), "line 1, column 4: invalid UTF-8");
  EXPECT_EQ(ParseError("<a>\xED\xA0\x80</a>"), "line 1, column 4: invalid UTF-8");
  EXPECT_EQ(ParseError("<a>\xF4\x90\x80\x80</a>"), "line 1, column 4: invalid UTF-8");
  EXPECT_EQ(ParseError("<a>\xFF</a>"), "line 1, column 4: invalid UTF-8");
  EXPECT_EQ(ParseError(std::string("<a>\0</a>", 8)),
            "line 1, column 4: character not allowed in XML");
  EXPECT_EQ(ParseError("<a>\x01</a>"), "line 1, column 4: character not allowed in XML");
  EXPECT_EQ(ParseError("<a>\xEF\xBF\xBF</a>"), "line 1, column 4: character not allowed in XML");
}

TEST(MiniXmlRejects, MisplacedOrBadDeclaration) {
  EXPECT_EQ(ParseError(" <?xml version=\"1.0\"?><a/>"),
            "line 1, column 2: the XML declaration must open the document");
  EXPECT_EQ(ParseError("<a><?xml version=\"1.0\"?></a>"),
            "line 1, column 4: the XML declaration must open the document");
  EXPECT_EQ(ParseError("<?xml encoding=\"utf-8\"?><a/>"),
            "line 1, column 25: the XML declaration takes version, then optionally encoding and "
            "standalone");
  EXPECT_EQ(ParseError("<?xml version=\"2.0\"?><a/>"),
            "line 1, column 22: unsupported XML version '2.0'");
  EXPECT_EQ(ParseError("<?xml version=\"1.0\" encoding=\"latin1\"?><a/>"),
            "line 1, column 40: unsupported encoding 'latin1' (only UTF-8 is read)");
  EXPECT_EQ(ParseError("<?xml version=\"1.0\" standalone=\"maybe\"?><a/>"),
            "line 1, column 41: standalone must be yes or no");
}

TEST(MiniXmlRejects, DocumentTypeDeclarations) {
  EXPECT_EQ(ParseError("<!DOCTYPE a><a/>"),
            "line 1, column 1: document type declarations are not supported");
  EXPECT_EQ(ParseError("<a><!ENTITY x \"y\"></a>"),
            "line 1, column 4: markup declarations are not allowed inside an element");
}

TEST(MiniXmlRejects, BadCommentsCdataAndInstructions) {
  EXPECT_EQ(ParseError("<a><!-- x -- y --></a>"), "line 1, column 11: '--' inside a comment");
  EXPECT_EQ(ParseError("<a><!-- x ---></a>"), "line 1, column 11: '--' inside a comment");
  EXPECT_EQ(ParseError("<a><!-- x </a>"), "line 1, column 4: comment is not closed");
  EXPECT_EQ(ParseError("<a><![CDATA[x</a>"), "line 1, column 4: CDATA section is not closed");
  EXPECT_EQ(ParseError("<a><?pi x</a>"), "line 1, column 4: processing instruction is not closed");
  EXPECT_EQ(ParseError("<a>x]]>y</a>"), "line 1, column 5: ']]>' in character data");
}

TEST(MiniXmlRejects, BadNames) {
  EXPECT_EQ(ParseError("<1a/>"), "line 1, column 2: name expected");
  EXPECT_EQ(ParseError("< a/>"), "line 1, column 2: name expected");
  EXPECT_EQ(ParseError("<a></ a>"), "line 1, column 6: name expected");
}

TEST(MiniXmlRejects, NestingBeyondTheLimit) {
  std::string deep;
  for (std::size_t i = 0; i < MiniXml::kMaxDepth; ++i) {
    deep += "<e>";
  }
  std::string closing;
  for (std::size_t i = 0; i < MiniXml::kMaxDepth; ++i) {
    closing += "</e>";
  }
  MiniXml xml;
  EXPECT_TRUE(xml.parse(deep + closing)) << xml.error();
  EXPECT_EQ(ParseError(deep + "<e>" + "</e>" + closing),
            "line 1, column " + std::to_string(3 * MiniXml::kMaxDepth + 1) +
                ": elements nested deeper than 256 levels");
}

}  // namespace
