// CIM-XML output: escaping, the response envelope and class encoding from MOF.
#include <gtest/gtest.h>

#include <map>

#include "orv/cimxml/class_encoder.hpp"
#include "orv/cimxml/cmpi_value.hpp"
#include "orv/cimxml/response_writer.hpp"
#include "orv/cimxml/xml_tree.hpp"
#include "orv/repository/class_repository.hpp"

namespace orv::cimxml {
namespace {

TEST(XmlWriter, EscapesMarkupAndControlCharacters) {
    XmlWriter out;
    out.open("V").attr("A", "<\"&'>").text("a\tb\x01").close();
    EXPECT_EQ(out.take(), "<V A=\"&lt;&quot;&amp;&apos;&gt;\">a&#9;b\u2401</V>");
}

// XML 1.0 cannot carry U+0001..U+001F (but tab, line feed, carriage return), not even
// as references: each goes out as its control picture, never dropped.
TEST(XmlWriter, ControlCharactersXmlCannotCarryAreWrittenAsControlPictures) {
    XmlWriter out;
    out.open("V").attr("A", "k\x1f").text("\x01\x08\x0b\x0c\x1b\x7f").close();
    const std::string doc = out.take();
    EXPECT_EQ(doc, "<V A=\"k\u241f\">\u2401\u2408\u240b\u240c\u241b\x7f</V>");
    EXPECT_NO_THROW(parseXmlDocument(doc));
}

// The reader applies the same rule backwards, so a value survives the round trip.
TEST(XmlTree, ControlPicturesAreReadAsTheControlCharacters) {
    XmlWriter out;
    const std::string value = "eth\x01""0 \x1b[1m\tend";
    out.open("V").attr("A", value).text(value).close();
    const auto root = parseXmlDocument(out.take());
    EXPECT_EQ(root->text, value);
    ASSERT_EQ(root->attributes.size(), 1u);
    EXPECT_EQ(root->attributes.front().value, value);
}

// Pictures of characters XML does carry (tab, line feed, carriage return, NUL) and
// other symbols near them stay as they are.
TEST(XmlTree, OtherPicturesAndNeighboursStayAsTheyAre) {
    const std::string text = "\u2400\u2409\u240a\u240d\u2420\u2424\u2380\xe2";
    const auto root = parseXmlDocument("<V>" + text.substr(0, text.size() - 1) + "</V>");
    EXPECT_EQ(root->text, text.substr(0, text.size() - 1));
}

TEST(XmlWriter, KeepsPlainRunsAroundEscapedCharactersAndControlPictures) {
    XmlWriter out;
    out.open("OUTER").open("V").attr("A", "x\ny\rz").text("plain <mid> end\x1f").close().leaf("L", "a&b").close();
    EXPECT_EQ(out.take(), "<OUTER><V A=\"x&#10;y&#13;z\">plain &lt;mid&gt; end\xE2\x90\x9F</V><L>a&amp;b</L></OUTER>");
    EXPECT_EQ(out.depth(), 0U);
}

// What one byte becomes, written out by hand: NUL dropped, markup and white space as
// references, other control characters as their pictures.
std::string escapedByte(unsigned char c) {
    static const std::map<unsigned char, std::string> kReferences = {
        {'&', "&amp;"}, {'<', "&lt;"}, {'>', "&gt;"},  {'"', "&quot;"},
        {'\'', "&apos;"}, {'\t', "&#9;"}, {'\n', "&#10;"}, {'\r', "&#13;"}};
    if (const auto found = kReferences.find(c); found != kReferences.end()) {
        return found->second;
    }
    if (c == 0) {
        return "";
    }
    if (c < 0x20) {
        return std::string{'\xE2', '\x90', static_cast<char>(0x80 + c)};
    }
    return std::string(1, static_cast<char>(c));
}

// Every byte value at every place of texts longer and shorter than the blocks the
// escaping reads at once, alone and in runs, among plain text of every length.
TEST(XmlWriter, EveryByteIsEscapedAlikeWhereverItStands) {
    for (unsigned value = 0; value < 256; ++value) {
        const auto c = static_cast<unsigned char>(value);
        for (std::size_t length : {1U, 2U, 3U, 4U, 5U, 7U, 8U, 9U, 12U, 15U, 16U, 17U, 20U, 24U, 31U, 33U, 70U}) {
            for (std::size_t at = 0; at < length; ++at) {
                std::string text(length, 'a');
                text[at] = static_cast<char>(c);
                if (at + 2 < length) {
                    text[at + 2] = static_cast<char>(c);
                }
                std::string expected;
                for (char t : text) {
                    expected += escapedByte(static_cast<unsigned char>(t));
                }
                ASSERT_EQ(escapeXml(text), expected) << "byte " << value << " at " << at << " of " << length;
            }
        }
    }
}

TEST(XmlWriter, LongTextWithManyEscapesIsWrittenWhole) {
    std::string text;
    std::string expected;
    for (int i = 0; i < 5000; ++i) {
        text += "\"x<";
        expected += "&quot;x&lt;";
    }
    XmlWriter out;
    out.open("V").text(text).close();
    EXPECT_EQ(out.take(), "<V>" + expected + "</V>");
    std::string appended = "head";
    appendEscapedXml(appended, text);
    EXPECT_EQ(appended, "head" + expected);
}

TEST(XmlWriter, DrainHandsOverTheTextAndStaysInsideTheOpenElements) {
    XmlWriter out;
    out.open("A").open("B").text("one");
    EXPECT_EQ(out.size(), 9U);
    EXPECT_EQ(out.drain(), "<A><B>one");
    EXPECT_EQ(out.size(), 0U);
    EXPECT_EQ(out.str(), "");
    out.close().raw("<C></C>").close();
    EXPECT_EQ(out.str(), "</B><C></C></A>");
    EXPECT_EQ(out.take(), "</B><C></C></A>");
    EXPECT_EQ(out.depth(), 0U);
    EXPECT_EQ(out.take(), "");
}

TEST(ResponseWriter, ErrorResponseCarriesCodeAndDescription) {
    const std::string doc = errorResponse("9", "GetInstance", true, 7, "not here");
    EXPECT_NE(doc.find("<IMETHODRESPONSE NAME=\"GetInstance\"><ERROR CODE=\"7\" DESCRIPTION=\"not here\"></ERROR>"),
              std::string::npos) << doc;
    EXPECT_NO_THROW(parseXmlDocument(doc));
}

TEST(CmpiValue, ScalarsUseCimXmlText) {
    CMPIData data{};
    data.type = CMPI_boolean;
    data.value.boolean = 1;
    EXPECT_EQ(scalarText(data), "TRUE");
    data.type = CMPI_sint8;
    data.value.sint8 = -5;
    EXPECT_EQ(scalarText(data), "-5");
    data.type = CMPI_real64;
    data.value.real64 = 0.1;
    EXPECT_EQ(scalarText(data), "0.1");
    data.type = CMPI_char16;
    data.value.char16 = 0x20AC;
    EXPECT_EQ(scalarText(data), "\xE2\x82\xAC");
    data.state = CMPI_nullValue;
    EXPECT_EQ(scalarText(data), std::nullopt);
}

TEST(CmpiValue, KeyValueTypes) {
    EXPECT_EQ(keyValueType(CMPI_uint16), "numeric");
    EXPECT_EQ(keyValueType(CMPI_boolean), "boolean");
    EXPECT_EQ(keyValueType(CMPI_string), "string");
    EXPECT_EQ(keyValueType(CMPI_char16), "string");
    EXPECT_EQ(keyValueType(CMPI_dateTime), "string");
}

class ClassEncoderTest : public ::testing::Test {
protected:
    void SetUp() override {
        classes.loadText(
            "Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride, ToSubclass);\n"
            "Qualifier In : boolean = true, Scope(parameter), Flavor(DisableOverride, ToSubclass);\n"
            "class Base { [Key] string Name; uint16 Codes[] = {1, 2}; };\n"
            "class Child : Base { Base REF Other; boolean Flag = true; uint32 Go([In] string Why); };\n",
            "test.mof");
    }
    std::string encode(const ClassEncoding& encoding) {
        XmlWriter out;
        writeClass(out, *classes.getClass("root/cimv2", "Child"), encoding);
        return out.take();
    }
    repository::ClassRepository classes;
};

TEST_F(ClassEncoderTest, LocalOnlyLeavesInheritedPropertiesOut) {
    ClassEncoding encoding;
    encoding.localOnly = true;
    const std::string xml = encode(encoding);
    EXPECT_EQ(xml.find("NAME=\"Name\""), std::string::npos) << xml;
    EXPECT_NE(xml.find("<PROPERTY.REFERENCE NAME=\"Other\" REFERENCECLASS=\"Base\">"), std::string::npos) << xml;
    EXPECT_NE(xml.find("<PROPERTY NAME=\"Flag\" TYPE=\"boolean\"><VALUE>TRUE</VALUE></PROPERTY>"), std::string::npos);
    EXPECT_NE(xml.find("<METHOD NAME=\"Go\" TYPE=\"uint32\"><PARAMETER NAME=\"Why\" TYPE=\"string\">"), std::string::npos)
        << xml;
}

TEST_F(ClassEncoderTest, FullClassCarriesInheritedArraysOriginsAndQualifiers) {
    ClassEncoding encoding;
    encoding.localOnly = false;
    encoding.includeClassOrigin = true;
    const std::string xml = encode(encoding);
    EXPECT_NE(xml.find("<CLASS NAME=\"Child\" SUPERCLASS=\"Base\">"), std::string::npos) << xml;
    EXPECT_NE(xml.find("<PROPERTY.ARRAY NAME=\"Codes\" TYPE=\"uint16\" CLASSORIGIN=\"Base\" PROPAGATED=\"true\">"
                       "<VALUE.ARRAY><VALUE>1</VALUE><VALUE>2</VALUE></VALUE.ARRAY>"),
              std::string::npos) << xml;
    EXPECT_NE(xml.find("<QUALIFIER NAME=\"Key\" TYPE=\"boolean\""), std::string::npos) << xml;
}

TEST_F(ClassEncoderTest, PropertyListKeepsOnlyNamedProperties) {
    ClassEncoding encoding;
    encoding.localOnly = false;
    encoding.propertyList = std::vector<std::string>{"flag"};
    const std::string xml = encode(encoding);
    EXPECT_EQ(xml.find("NAME=\"Name\""), std::string::npos);
    EXPECT_NE(xml.find("NAME=\"Flag\""), std::string::npos);
}

}  // namespace
}  // namespace orv::cimxml
