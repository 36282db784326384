// The element tree under the request reader: the line of each element (LF, CR LF and a CR
// alone each end a line), and one thread reading document after document, good and bad,
// small and large, each on its own.
#include <gtest/gtest.h>

#include <string>
#include <thread>
#include <vector>

#include "orv/cimxml/xml_tree.hpp"

namespace orv::cimxml {
namespace {

TEST(XmlTree, ElementsKnowTheirLineWhateverTheLineBreaks) {
    const auto root = parseXmlDocument("<?xml version=\"1.0\"?>\n<A>\r\n<B/>\r<C>\n\n  <D x=\"1\"\ny=\"2\"/>text\r\n</C><E/></A>");
    ASSERT_EQ(root->children.size(), 3U);
    EXPECT_EQ(root->line, 2);
    EXPECT_EQ(root->children[0]->name, "B");
    EXPECT_EQ(root->children[0]->line, 3);
    EXPECT_EQ(root->children[1]->line, 4);
    EXPECT_EQ(root->children[1]->children[0]->name, "D");
    EXPECT_EQ(root->children[1]->children[0]->line, 6);
    EXPECT_EQ(root->children[2]->name, "E");
    EXPECT_EQ(root->children[2]->line, 8);
}

TEST(XmlTree, SyntaxErrorNamesItsLine) {
    try {
        parseXmlDocument("<A>\n<B>\n</A>");
        FAIL() << "accepted";
    } catch (const XmlSyntaxError& error) {
        EXPECT_EQ(std::string(error.what()), "line 3: mismatched tag");
    }
}

TEST(XmlTree, OneThreadReadsDocumentAfterDocumentEachOnItsOwn) {
    std::string large = "<L>";
    for (int i = 0; i < 5000; ++i) {
        large += "<I n=\"" + std::to_string(i) + "\">value " + std::to_string(i) + "</I>";
    }
    large += "</L>";
    ASSERT_GT(large.size(), 64U << 10U);
    for (int round = 0; round < 3; ++round) {
        EXPECT_THROW(parseXmlDocument("<A><B></A>"), XmlSyntaxError);
        EXPECT_THROW(parseXmlDocument("<!DOCTYPE A [<!ENTITY e \"x\">]><A>&e;</A>"), XmlSyntaxError);
        const auto small = parseXmlDocument("<A k=\"v\">text</A>");
        EXPECT_EQ(small->name, "A");
        EXPECT_EQ(*small->attribute("k"), "v");
        EXPECT_EQ(small->text, "text");
        EXPECT_EQ(small->line, 1);
        const auto big = parseXmlDocument(large);
        ASSERT_EQ(big->children.size(), 5000U);
        EXPECT_EQ(big->children[4999]->text, "value 4999");
        XmlLimits shallow;
        shallow.maxDepth = 2;
        EXPECT_THROW(parseXmlDocument("<A><B><C/></B></A>", shallow), XmlSyntaxError);
    }
}

TEST(XmlTree, ThreadsReadAtTheSameTime) {
    std::vector<std::thread> readers;
    std::vector<int> good(4, 0);
    for (int t = 0; t < 4; ++t) {
        readers.emplace_back([t, &good] {
            for (int i = 0; i < 200; ++i) {
                const std::string value = std::to_string(t) + "-" + std::to_string(i);
                const auto root = parseXmlDocument("<A v=\"" + value + "\"><B>" + value + "</B></A>");
                if (*root->attribute("v") == value && root->children.size() == 1 && root->children[0]->text == value) {
                    ++good[static_cast<std::size_t>(t)];
                }
            }
        });
    }
    for (auto& reader : readers) {
        reader.join();
    }
    EXPECT_EQ(good, std::vector<int>(4, 200));
}

}  // namespace
}  // namespace orv::cimxml
