// XML attributes: the strict typed getters, and the attribute list as a stream read by name.
#include "tekit/streams/OVXmlAttributeList.h"

#include "support/Raises.h"
#include "tekit/streams/OVMemoryStream.h"
#include "tekit/streams/OVXmlAttribute.h"

#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <string>

namespace {

using namespace tekit;
using namespace tekit::testing;

OVXmlAttribute Attribute(char const* value) {
    return OVXmlAttribute(DynamicString("n"), DynamicString(value), 4, 9, "f.xml");
}

TEST(XmlAttribute, TypedGettersReadWholeValuesOnly) {
    OVXmlAttribute const a = Attribute("12");
    EXPECT_EQ(a.GetAsInt(), 12);
    EXPECT_EQ(a.GetAsUInt(), 12u);
    EXPECT_EQ(a.GetAsInt64(), 12);
    EXPECT_EQ(a.GetAsUInt64(), 12u);
    EXPECT_EQ(a.GetAsDouble(), 12.0);
    EXPECT_EQ(Attribute("+7").GetAsInt(), 7);
    EXPECT_EQ(Attribute("-2147483648").GetAsInt(), -2147483647 - 1);
    EXPECT_EQ(Attribute("18446744073709551615").GetAsUInt64(), ~0ull);
    EXPECT_EQ(Attribute("-1.5e-3").GetAsDouble(), -1.5e-3);
    EXPECT_TRUE(std::isinf(Attribute("-INF").GetAsDouble()));
    EXPECT_TRUE(Attribute("true").GetAsBool());
    EXPECT_FALSE(Attribute("0").GetAsBool());
    EXPECT_EQ(Attribute("caf\xC3\xA9").GetAsString(), "caf\xE9");
    // clang-format off
    struct { char const* value; std::function<void(OVXmlAttribute const&)> get; char const* problem; } const bad[] = {
        {"2147483648", [](auto& a) { a.GetAsInt(); }, "is not a whole number in the range of its type."},
        {"-1", [](auto& a) { a.GetAsUInt(); }, "is not a whole number in the range of its type."},
        {"1 ", [](auto& a) { a.GetAsInt64(); }, "is not a whole number in the range of its type."},
        {"", [](auto& a) { a.GetAsUInt64(); }, "is not a whole number in the range of its type."},
        {"1.5", [](auto& a) { a.GetAsInt(); }, "is not a whole number in the range of its type."},
        {"1,5", [](auto& a) { a.GetAsDouble(); }, "is not a number."},
        {"1e999", [](auto& a) { a.GetAsDouble(); }, "is not a number."},
        {"+-1", [](auto& a) { a.GetAsDouble(); }, "is not a number."},
        {"yes", [](auto& a) { a.GetAsBool(); }, "is not a boolean: 'true' or 'false' expected."},
    };
    // clang-format on
    for (auto const& c : bad) {
        OVXmlAttribute const attribute = Attribute(c.value);
        EXPECT_RAISES_IN(c.get(attribute), TE_BAD_FILE_FORMAT,
                         "ThrowFileFormatErrorWithLocationInfo",
                         ("The value '" + std::string(c.value) + "' of 'n' " + c.problem +
                          " (f.xml, line 4, column 9)")
                             .c_str());
    }
}

TEST(XmlAttributeList, ReadsByNameInOrderOrIfPresent) {
    OVXmlAttributeList list;
    list.SetElementName(DynamicString("step"));
    list.SetLocationInfoForErrors(0, 3, 2, "seq.xml");
    list.PushBack(OVXmlAttribute(DynamicString("count"), DynamicString("3"), 3, 8));
    list.PushBack(OVXmlAttribute(DynamicString("name"), DynamicString("Init")));
    EXPECT_EQ(list.GetSize(), 2u);
    EXPECT_EQ(list.ReadInt("count"), 3);
    DynamicString text("stale");
    list.ReadString("name", text);
    EXPECT_EQ(text, "Init");
    bool flag = true;
    EXPECT_FALSE(list.ReadBoolIfExists("skip", flag));
    EXPECT_TRUE(flag);
    EXPECT_FALSE(list.ReadStringIfExists("Name", text)); // names match with case
    EXPECT_EQ(list.ReadInt(""), 3);                      // without a name: in order
    list.ReadString(nullptr, text);
    EXPECT_EQ(text, "Init");
    EXPECT_RAISES_IN(list.ReadInt(""), TE_BAD_FILE_FORMAT, "ThrowFileFormatErrorWithLocationInfo",
                     "The element 'step' has no further attribute to read. (seq.xml, line 3, "
                     "column 2)");
    EXPECT_RAISES_IN(list.ReadInt("size"), TE_BAD_FILE_FORMAT,
                     "ThrowFileFormatErrorWithLocationInfo",
                     "The element 'step' has no attribute 'size'. (seq.xml, line 3, column 2)");
    // A bad value is reported at its own place, or at the tag's, with the list's error code.
    list.SetLocationInfoForErrors(TE_UNRECOGNIZED_VALUE, 5, 1, nullptr);
    EXPECT_RAISES_IN(list.ReadBool("count"), TE_UNRECOGNIZED_VALUE,
                     "ThrowFileFormatErrorWithLocationInfo",
                     "The value '3' of 'count' is not a boolean: 'true' or 'false' expected. "
                     "(line 3, column 8)");
    EXPECT_RAISES_IN(list.ReadBool("name"), TE_UNRECOGNIZED_VALUE, nullptr,
                     "The value 'Init' of 'name' is not a boolean: 'true' or 'false' expected. "
                     "(line 5, column 1)");
    EXPECT_RAISES(list.GetAt(2), TE_INDEX_OUT_OF_RANGE);
    list.Clear();
    EXPECT_EQ(list.GetCount(), 0);
    EXPECT_EQ(list.GetOffset(), 0u);
}

TEST(XmlAttributeList, ByteLevelOperationsAreNotSupported) {
    OVXmlAttributeList list;
    OVMemoryStream source;
    char byte = 0;
    // clang-format off
    struct { std::function<void()> call; char const* function; } const cases[] = {
        {[&] { list.WriteBytes("x", 1); }, "OVXmlAttributeList::WriteBytes"},
        {[&] { list.WriteInt("n", 1); }, "OVXmlAttributeList::WriteBytes"},
        {[&] { list.WriteString("n", DynamicString("x")); }, "OVXmlAttributeList::WriteString"},
        {[&] { list.TruncateAtCurrentOffset(); }, "OVXmlAttributeList::TruncateAtCurrentOffset"},
        {[&] { list.WriteStream(source, 0, 0); }, "OVXmlAttributeList::WriteStream"},
        {[&] { list.ReadBytes(&byte, 1, TE_BAD_FILE_FORMAT); }, "OVXmlAttributeList::ReadBytes"},
    };
    // clang-format on
    for (auto const& c : cases)
        EXPECT_RAISES_IN(c.call(), TE_OPERATION_FAILED, c.function);
}

} // namespace
