// Fuzzes the XML memory stream's reader over arbitrary text: processing instructions, element
// starts with their attributes (each read through every typed getter), values, and element
// ends, in the order the text offers them, until the text ends or a format error is raised.
//
// Every read either succeeds and moves forward, or raises TEException and leaves the offset
// where it was; nothing else may be thrown, and the walk ends (each step moves the offset or
// closes an element).
#include "tekit/errors/TEException.h"
#include "tekit/streams/OVXmlAttributeList.h"
#include "tekit/streams/OVXmlMemoryStream.h"
#include "tekit/strings/DynamicString.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace {

using namespace tekit;

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

/// Every typed reading of every attribute; bad values raise, which is fine.
void ReadAll(OVXmlAttributeList& list) {
    for (int i = 0; i < list.GetCount(); ++i) {
        OVXmlAttribute const& a = list.GetAt(i);
        DynamicString text;
        a.GetAsString(text);
        try {
            a.GetAsBool();
        } catch (TEException const&) {
        }
        try {
            a.GetAsInt64();
        } catch (TEException const&) {
        }
        try {
            a.GetAsDouble();
        } catch (TEException const&) {
        }
        Check(list.Find(a.GetTagName().GetBufferReadPtr(), true) != nullptr);
    }
}

/// One step of the walk; false when there is nothing left to read.
/// `mark` receives the offset before each operation, for the check of a failed one.
bool Step(OVXmlMemoryStream& xml, std::vector<std::string>& open, std::uint32_t& mark) {
    DynamicString name, target;
    OVXmlAttributeList list;
    if (xml.ReadProcessingInstructionIfAny(target, list)) {
        ReadAll(list);
        return true;
    }
    if (xml.GetNextElementName(name, true)) {
        std::string const element(name.GetBufferReadPtr());
        if (open.size() % 3 == 2) { // now and then as a value, named in the code page
            DynamicString value;
            xml.GetNextElementName(name, false);
            xml.ReadString(name.GetBufferReadPtr(), value);
            return true;
        }
        xml.ReadElementStart(element.c_str(), list, true, "fuzz.xml", "an element");
        ReadAll(list);
        open.push_back(element);
        return true;
    }
    if (open.empty())
        return false;
    DynamicString text;
    xml.ReadString("", text);
    mark = xml.GetOffset();
    xml.ReadElementEnd(open.back().c_str(), true);
    open.pop_back();
    return true;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    OVXmlMemoryStream xml;
    xml.WriteBytes(data, static_cast<unsigned>(size));
    xml.SetOffset(0);
    std::vector<std::string> open;
    for (std::size_t steps = 0;; ++steps) {
        Check(steps <= 2 * size + 2); // every step moves forward or closes an element
        std::uint32_t const before = xml.GetOffset();
        std::uint32_t mark = before;
        std::size_t const depth = open.size();
        try {
            if (!Step(xml, open, mark))
                break;
        } catch (TEException const&) {
            Check(xml.GetOffset() == mark);
            break;
        }
        Check(xml.GetOffset() >= before);
        Check(xml.GetOffset() > before || open.size() != depth);
        Check(xml.GetNumLinesSoFar() <= size);
    }
    return 0;
}
