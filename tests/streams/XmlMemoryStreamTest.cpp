// The XML memory stream: the exact text it writes, typed values through a write and a read,
// the reading grammar, and malformed text reported at its line and column.
#include "tekit/streams/OVXmlMemoryStream.h"

#include "support/DebugCapture.h"
#include "support/FaultInjection.h"
#include "support/Raises.h"
#include "tekit/streams/OVXmlAttributeList.h"
#include "tekit/strings/DynamicString.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <cmath>
#include <functional>
#include <limits>
#include <string>

namespace {

using namespace tekit;
using namespace tekit::testing;
using Xml = OVXmlMemoryStream;

std::string Text(OVMemoryStream const& s) {
    return std::string(reinterpret_cast<char const*>(s.GetDataPtr()), s.GetSize());
}

/// `levels` no-newline starts of "a", each indented one tab more.
std::string Nested(int levels) {
    std::string text;
    for (int i = 0; i < levels; ++i)
        text += std::string(std::size_t(i), '\t') + "<a>";
    return text;
}

void Load(Xml& xml, std::string const& text) {
    xml.SetOffset(0);
    xml.WriteBytes(text.data(), static_cast<unsigned>(text.size()));
    xml.TruncateAtCurrentOffset();
    xml.SetOffset(0);
}

TEST(XmlWriting, WritesTheExactText) {
    // clang-format off
    struct { char const* what; std::function<void(Xml&)> write; std::string expected; } const cases[] = {
        {"typed values", [](Xml& x) {
             x.WriteInt("i", -5); x.WriteUInt("u", 4294967295u);
             x.WriteInt64("l", std::numeric_limits<std::int64_t>::min());
             x.WriteUInt64("ul", 18446744073709551615ull); x.WriteBool("t", true);
             x.WriteBool("f", false); x.WriteDouble("d", 0.1); x.WriteDouble("e", 1e20);
             x.WriteDouble("third", 1.0 / 3); x.WriteDouble("inf", -HUGE_VAL); },
         "<i>-5</i>\r\n<u>4294967295</u>\r\n<l>-9223372036854775808</l>\r\n"
         "<ul>18446744073709551615</ul>\r\n<t>true</t>\r\n<f>false</f>\r\n<d>0.1</d>\r\n"
         "<e>1e+20</e>\r\n<third>0.3333333333333333</third>\r\n<inf>-inf</inf>\r\n"},
        {"escaped value, empty value, value without a name", [](Xml& x) {
             x.WriteString("v", DynamicString("<a&b>'\"")); x.WriteString("e", DynamicString());
             x.WriteString("", DynamicString("x&y")); },
         "<v>&lt;a&amp;b&gt;'\"</v>\r\n<e/>\r\nx&amp;y"},
        {"line ends to CR LF, unescaped text", [](Xml& x) {
             x.WriteString("v", DynamicString("1\n2\r3\r\n4"), true, true);
             x.WriteString("raw", DynamicString("<b/>"), false); },
         "<v>1\r\n2\r\n3\r\n4</v>\r\n<raw><b/></raw>\r\n"},
        {"UTF-8 of names and values", [](Xml& x) {
             x.WriteString("n\xE9", DynamicString("\xE0")); x.WriteElementStart("\xC3\xA9", false, true);
             x.WriteElementEnd("\xC3\xA9", true, true); },
         "<n\xC3\xA9>\xC3\xA0</n\xC3\xA9>\r\n<\xC3\xA9/>\r\n"},
        {"nesting with a tab per level", [](Xml& x) {
             x.WriteElementStart("a"); x.WriteElementStart("b"); x.WriteInt("c", 1);
             x.WriteElementEnd("b"); x.WriteComment("x--y-"); x.WriteElementEnd("a"); },
         "<a>\r\n\t<b>\r\n\t\t<c>1</c>\r\n\t</b>\r\n\t<!--x- -y- -->\r\n</a>\r\n"},
        {"empty elements self-close in both start forms", [](Xml& x) {
             x.WriteElementStart("a"); x.WriteElementEnd("a");
             x.WriteElementStart("b", true); x.WriteElementEnd("b", false);
             x.WriteElementStart("c", true); x.WriteString("", DynamicString("t"));
             x.WriteElementEnd("c", false); },
         "<a/>\r\n<b/>\r\n<c>t</c>\r\n"},
        {"attributes in single quotes, apostrophe escaped", [](Xml& x) {
             x.WriteElementStartWithAttributes("e"); x.WriteString("v", DynamicString("it's \"<\""));
             x.WriteInt("n", 3); x.WriteElementStartWithAttributesEnd(true);
             x.WriteElementStartWithAttributes("o"); x.WriteBool("b", false);
             x.WriteElementStartWithAttributesEnd(false); x.WriteElementEnd("o");
             x.WriteElementStartWithAttributes("p"); x.WriteElementStartWithAttributesEnd(false);
             x.WriteInt("q", 1); x.WriteElementEnd("p"); },
         "<e v='it&apos;s \"&lt;\"' n='3'/>\r\n<o b='false'/>\r\n<p>\r\n\t<q>1</q>\r\n</p>\r\n"},
        {"deeper than 20 levels", [](Xml& x) {
             for (int i = 0; i < 22; ++i) x.WriteElementStart("a", true);
             x.WriteInt("v", 7); },
         Nested(22) + std::string(22, '\t') + "<v>7</v>\r\n"},
    };
    // clang-format on
    for (auto const& c : cases) {
        Xml xml;
        c.write(xml);
        EXPECT_EQ(Text(xml), c.expected) << c.what;
    }
}

TEST(XmlWriting, AnElementEndWithoutItsStartIsAnAssertion) {
    DiagnosticLevelScope verbose(1);
    char const* const message = "Unexpected error in OVXmlMemoryStream::WriteElementEnd";
    Xml xml;
    EXPECT_RAISES_IN(xml.WriteElementEnd("a"), TE_PROGRAM_ERROR,
                     "OVXmlMemoryStream::WriteElementEnd", message);
    xml.WriteElementStart("a", true);
    xml.SetOffset(2);
    xml.WriteBytes("x", 1); // "<ax": no ">" to step back over
    EXPECT_RAISES_IN(xml.WriteElementEnd("a"), TE_PROGRAM_ERROR,
                     "OVXmlMemoryStream::WriteElementEnd", message);
    EXPECT_EQ(xml.GetLevel(), 1);
    EXPECT_EQ(Text(xml), "<ax");
}

TEST(XmlWriting, AFailedAllocationChangesNothing) {
    // clang-format off
    std::function<void(Xml&)> const writes[] = {
        [](Xml& x) { x.WriteElementEnd("b"); },  [](Xml& x) { x.WriteInt("c", 1); },
        [](Xml& x) { x.WriteElementStart("c"); }, [](Xml& x) { x.WriteComment("c"); },
        [](Xml& x) { x.WriteElementStartWithAttributes("c"); },
    };
    // clang-format on
    for (auto const& write : writes) {
        Xml xml; // "<a>", filler and "\t<b>" fill the buffer exactly
        xml.WriteElementStart("a");
        std::string const filler(OVMemoryStream::kInitialCapacity - 11, 'x');
        xml.WriteBytes(filler.data(), static_cast<unsigned>(filler.size()));
        xml.WriteElementStart("b");
        std::string const before = Text(xml);
        {
            ScopedFault const noMemory(FaultKind::Allocate, 1, ENOMEM, true);
            EXPECT_RAISES(write(xml), TE_OUT_OF_MEMORY);
        }
        EXPECT_EQ(Text(xml), before);
        EXPECT_EQ(xml.GetLevel(), 2);
        EXPECT_FALSE(xml.IsInAttributeMode());
        write(xml);
        EXPECT_GT(xml.GetSize(), before.size());
    }
}

TEST(XmlReading, EveryTypedValueReadsBackAsWritten) {
    double const doubles[] = {0.1, -0.0, 1e-300, 123456789012345.6, HUGE_VAL, -HUGE_VAL};
    DynamicString const texts[] = {DynamicString("a<b>&'\"\r\n\t]]> c"), DynamicString(),
                                   DynamicString("caf\xE9 ")};
    Xml xml;
    xml.WriteElementStart("root");
    for (bool const attributes : {false, true}) {
        if (attributes)
            xml.WriteElementStartWithAttributes("values");
        xml.WriteInt("i", std::numeric_limits<int>::min());
        xml.WriteUInt("u", std::numeric_limits<unsigned>::max());
        xml.WriteInt64("l", std::numeric_limits<std::int64_t>::min());
        xml.WriteUInt64("ul", std::numeric_limits<std::uint64_t>::max());
        xml.WriteBool("b", true);
        xml.WriteDouble("nan", std::nan(""));
        for (std::size_t i = 0; i < std::size(doubles); ++i)
            xml.WriteDouble(("d" + std::to_string(i)).c_str(), doubles[i]);
        for (std::size_t i = 0; i < std::size(texts); ++i)
            xml.WriteString(("s" + std::to_string(i)).c_str(), texts[i]);
        if (attributes)
            xml.WriteElementStartWithAttributesEnd(true);
    }
    xml.WriteElementEnd("root");

    xml.SetOffset(0);
    OVXmlAttributeList list;
    xml.ReadElementStart("root");
    OVStream* const sources[] = {&xml, &list};
    for (OVStream* s : sources) {
        if (s == &list)
            xml.ReadElementStart("values", list);
        EXPECT_EQ(s->ReadInt("i"), std::numeric_limits<int>::min());
        EXPECT_EQ(s->ReadUInt("u"), std::numeric_limits<unsigned>::max());
        EXPECT_EQ(s->ReadInt64("l"), std::numeric_limits<std::int64_t>::min());
        EXPECT_EQ(s->ReadUInt64("ul"), std::numeric_limits<std::uint64_t>::max());
        EXPECT_TRUE(s->ReadBool("b"));
        EXPECT_TRUE(std::isnan(s->ReadDouble("nan")));
        for (std::size_t i = 0; i < std::size(doubles); ++i) {
            double const value = s->ReadDouble(("d" + std::to_string(i)).c_str());
            EXPECT_EQ(value, doubles[i]);
            EXPECT_EQ(std::signbit(value), std::signbit(doubles[i]));
        }
        for (std::size_t i = 0; i < std::size(texts); ++i) {
            DynamicString value("stale");
            s->ReadString(("s" + std::to_string(i)).c_str(), value);
            EXPECT_EQ(value, texts[i]) << i;
        }
    }
    xml.ReadElementEnd("values");
    xml.ReadElementEnd("root");
    EXPECT_EQ(xml.GetOffset(), xml.GetSize() - 2); // the end tag's line end stays
}

TEST(XmlReading, ReadsWhatOtherWritersAddAndCountsLines) {
    Xml xml;
    Load(xml, "\xEF\xBB\xBF<?xml version=\"1.0\" encoding='UTF-8'?>\n<!-- c -->\r"
              "<root a = \"1\" >\n <?skip me?><v>x&#65;&#x42;&lt;<![CDATA[<&>]]><!--c-->y</v>"
              "<e b='&quot;'/>\r\n <w></w></root >");
    DynamicString target, name;
    OVXmlAttributeList list;
    ASSERT_TRUE(xml.ReadProcessingInstructionIfAny(target, list));
    EXPECT_EQ(target, "xml");
    list.ReadString("encoding", name);
    EXPECT_EQ(name, "UTF-8");
    EXPECT_FALSE(xml.ReadProcessingInstructionIfAny(target, list));
    EXPECT_TRUE(xml.IsNextElement("root"));
    EXPECT_FALSE(xml.IsNextElement("roo"));
    EXPECT_EQ(xml.GetNumLinesSoFar(), 0u); // nothing moved
    xml.ReadElementStart("root", list);
    EXPECT_EQ(xml.GetNumLinesSoFar(), 2u);
    EXPECT_EQ(list.ReadInt("a"), 1);
    EXPECT_EQ(list.GetAt(0).GetLine(), 3u);
    EXPECT_EQ(list.GetAt(0).GetColumn(), 7u);
    ASSERT_TRUE(xml.GetNextElementName(name));
    EXPECT_EQ(name, "v");
    xml.ReadString("v", name);
    EXPECT_EQ(name, "xAB<<&>y");
    xml.ReadElementStart("e", list);
    EXPECT_FALSE(xml.GetNextElementName(name)); // nothing inside a self-closing element
    EXPECT_RAISES(xml.ReadElementEnd("f"), TE_BAD_FILE_FORMAT);
    xml.ReadElementEnd("e");
    EXPECT_EQ(list.ReadStringIfExists("b", name), true);
    EXPECT_EQ(name, "\"");
    xml.ReadString("w", name);
    EXPECT_TRUE(name.IsEmpty());
    EXPECT_FALSE(xml.GetNextElementName(name));
    xml.ReadElementEnd("root");
    EXPECT_EQ(xml.GetNumLinesSoFar(), 4u);
    EXPECT_FALSE(xml.GetNextElementName(name));
}

TEST(XmlReading, MalformedTextIsAFormatErrorAtItsLineAndColumn) {
    // clang-format off
    struct { std::string text; std::function<void(Xml&)> read; unsigned line, column;
             char const* problem; } const cases[] = {
        {"<a>\r\n  <b>", [](Xml& x) { x.ReadElementStart("a"); x.ReadElementStart("c"); }, 2, 3,
         "The element 'c' was expected, but the element 'b' was found."},
        {"<a></b>", [](Xml& x) { x.ReadElementStart("a"); x.ReadElementEnd("a"); }, 1, 4,
         "The end of the element 'a' was expected, but the end of 'b' was found."},
        {"<a>text", [](Xml& x) { x.ReadInt("a"); }, 1, 1,
         "The XML text ends inside the element 'a'."},
        {"<a>1<b/></a>", [](Xml& x) { x.ReadInt("a"); }, 1, 5,
         "The element 'a' holds the element 'b' where a value was expected."},
        {"<a>x</a>", [](Xml& x) { x.ReadInt("a"); }, 1, 4,
         "The value 'x' of 'a' is not a whole number in the range of its type."},
        {"<a>4294967296</a>", [](Xml& x) { x.ReadUInt("a"); }, 1, 4,
         "The value '4294967296' of 'a' is not a whole number in the range of its type."},
        {"<a>True</a>", [](Xml& x) { x.ReadBool("a"); }, 1, 4,
         "The value 'True' of 'a' is not a boolean: 'true' or 'false' expected."},
        {"<a>&nbsp;</a>", [](Xml& x) { x.ReadInt("a"); }, 1, 4,
         "Unknown entity reference '&nbsp;'. Only &lt; &gt; &amp; &apos; &quot; and character "
         "references are known."},
        {"\n<a>&#0;</a>", [](Xml& x) { x.ReadInt("a"); }, 2, 4, "'&#0;' does not refer to a character."},
        {"<a>&#xD800;</a>", [](Xml& x) { x.ReadInt("a"); }, 1, 4,
         "'&#xD800;' does not refer to a character."},
        {"<a>& b</a>", [](Xml& x) { x.ReadInt("a"); }, 1, 4,
         "A '&' begins no reference; write '&amp;' for the character itself."},
        {"<a b='1", [](Xml& x) { x.ReadElementStart("a"); }, 1, 6,
         "The XML text ends inside the value of the attribute 'b'."},
        {"<a b='<'/>", [](Xml& x) { x.ReadElementStart("a"); }, 1, 7,
         "The value of the attribute 'b' contains '<'; write '&lt;' instead."},
        {"<a b='1' b=\"2\"/>", [](Xml& x) { x.ReadElementStart("a"); }, 1, 10,
         "The attribute 'b' appears twice in one tag."},
        {"<a b='1'c='2'/>", [](Xml& x) { x.ReadElementStart("a"); }, 1, 9, "Unexpected 'c' in a tag."},
        {"<a b/>", [](Xml& x) { x.ReadElementStart("a"); }, 1, 5,
         "The attribute 'b' has no quoted value after '='."},
        {"<a 1='2'/>", [](Xml& x) { x.ReadElementStart("a"); }, 1, 4, "Unexpected '1' in a tag."},
        {"<1a/>", [](Xml& x) { x.ReadElementStart("a"); }, 1, 2,
         "A name is expected here, but '1' cannot begin one."},
        {"<a", [](Xml& x) { x.ReadElementStart("a"); }, 1, 1, "The XML text ends inside a tag."},
        {"<a>\n</a", [](Xml& x) { x.ReadElementStart("a"); x.ReadElementEnd("a"); }, 2, 1,
         "The XML text ends inside a tag."},
        {" <!-- x ", [](Xml& x) { x.ReadElementStart("a"); }, 1, 2,
         "The XML text ends inside a comment."},
        {"<!-- a -- b -->", [](Xml& x) { x.ReadElementStart("a"); }, 1, 8,
         "A comment contains '--' before its end."},
        {"<?pi x", [](Xml& x) { x.ReadElementStart("a"); }, 1, 1,
         "The XML text ends inside a processing instruction."},
        {"<!DOCTYPE a>", [](Xml& x) { x.ReadElementStart("a"); }, 1, 1,
         "Document type declarations and other '<!' markup are not supported."},
        {"<a><![CDATA[x</a>", [](Xml& x) { x.ReadInt("a"); }, 1, 4,
         "The XML text ends inside a CDATA section."},
        {"text", [](Xml& x) { x.ReadElementStart("a"); }, 1, 1,
         "The element 'a' was expected, but text was found."},
        {" ", [](Xml& x) { x.ReadElementStart("a"); }, 1, 2,
         "The element 'a' was expected, but the XML text ends."},
        {"<a/>", [](Xml& x) { x.ReadElementStart("a"); x.ReadInt("b"); }, 1, 5,
         "The element 'a' is empty, but 'b' was expected inside it."},
        {"<a><b/>", [](Xml& x) { x.ReadElementStart("a"); x.ReadElementEnd("a"); }, 1, 4,
         "The end of the element 'a' was expected, but the element 'b' was found."},
        {std::string("<a>\0</a>", 8), [](Xml& x) { x.ReadElementStart("a"); x.ReadElementEnd("a"); },
         1, 4, "The end of the element 'a' was expected, but the XML text ends."},
    };
    // clang-format on
    for (auto const& c : cases) {
        Xml xml;
        Load(xml, c.text);
        xml.SetSourceNameForErrors(c.line == 1 ? nullptr : "f.xml");
        unsigned offset = 0;
        TEException const e = Raised([&] {
            try {
                c.read(xml);
            } catch (...) {
                offset = xml.GetOffset();
                throw;
            }
        });
        std::string const place = (c.line == 1 ? " (line " : " (f.xml, line ") +
                                  std::to_string(c.line) + ", column " + std::to_string(c.column) +
                                  ")";
        EXPECT_EQ(e.GetErrorCode(), TE_BAD_FILE_FORMAT) << c.text;
        EXPECT_STREQ(e.GetFunctionName(), "ThrowFileFormatErrorWithLocationInfo");
        EXPECT_EQ(e.GetDescription(), c.problem + place) << c.text;
        if (c.line == 1) { // a failed read moves nothing past the fault
            EXPECT_LT(offset, c.column) << c.text;
        }
    }
}

TEST(XmlReading, TheScannersMoveOnlyOverWhatTheyExpect) {
    struct Scanner : Xml {
        using Xml::MoveOffsetToNextNonWhitespaceCharacterAndNonComment;
        using Xml::MovePastExpectedString;
        using Xml::ReadStringToChar;
    } s;
    Load(s, " <!-- c -->\n<?p?>abc&amp;d;e");
    s.MoveOffsetToNextNonWhitespaceCharacterAndNonComment();
    EXPECT_EQ(s.GetOffset(), 17u);
    EXPECT_RAISES_IN(s.MovePastExpectedString("abd"), TE_BAD_FILE_FORMAT,
                     "ThrowFileFormatErrorWithLocationInfo",
                     "'abd' was expected here. (line 2, column 6)");
    s.MovePastExpectedString("ab");
    DynamicString text;
    s.ReadStringToChar(';', text);
    EXPECT_EQ(text, "c&d");
    EXPECT_EQ(s.GetOffset(), 26u); // at the ';'
    EXPECT_RAISES(s.ReadStringToChar('x', text), TE_BAD_FILE_FORMAT);
    EXPECT_EQ(s.GetOffset(), 26u);
}

TEST(XmlReading, HugeTagsAndDeepNestingReadInLinearTime) {
    std::string tag = "<a";
    for (int i = 0; i < 50000; ++i)
        tag += " n" + std::to_string(i) + "='" + std::to_string(i) + "'";
    Xml xml;
    Load(xml, tag + " n7='x'/>");
    EXPECT_RAISES(xml.ReadElementStart("a"), TE_BAD_FILE_FORMAT); // repeated attribute
    Load(xml, tag + "/>");
    OVXmlAttributeList list;
    xml.ReadElementStart("a", list);
    EXPECT_EQ(list.ReadInt("n49999"), 49999);
    std::string nested;
    for (int i = 0; i < 300000; ++i)
        nested += "<b>";
    Load(xml, nested);
    int depth = 0;
    for (DynamicString name; xml.GetNextElementName(name); ++depth)
        xml.ReadElementStart("b");
    EXPECT_EQ(depth, 300000);
    EXPECT_EQ(xml.GetNumLinesSoFar(), 0u);
}

} // namespace
