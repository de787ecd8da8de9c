// The XML memory stream against cereal's XML archives, in bench_streams (its main prints the
// ratios against "cereal"):
//
//   XmlWrite/100k-items            100 000 elements with three values each (an int, a double,
//                                  a string): attributes of one self-closing tag each for
//                                  tekit, three named child values of a node for cereal, which
//                                  has no attributes (XMLOutputArchive into a stringstream)
//   XmlRead/100k-items             the same document read back by name (XMLInputArchive parses
//                                  the whole text when it is made; it is made inside the loop)
#include "tekit/streams/OVXmlAttributeList.h"
#include "tekit/streams/OVXmlMemoryStream.h"
#include "tekit/strings/DynamicString.h"

#include <benchmark/benchmark.h>

#if defined(TEKIT_BENCH_HAVE_CEREAL)
#include <cereal/archives/xml.hpp>
#include <cereal/types/string.hpp>
#include <cereal/types/vector.hpp>
#endif

#include <sstream>
#include <string>
#include <vector>

namespace {

using namespace tekit;

constexpr int kItems = 100000;

std::vector<std::string> MakeNames() {
    std::vector<std::string> names;
    for (int i = 0; i < 64; ++i)
        names.push_back("step " + std::to_string(i * 7919) + (i % 3 ? " & check" : ""));
    return names;
}

std::vector<std::string> const gNames = MakeNames();

std::vector<DynamicString> MakeDynamicNames() {
    std::vector<DynamicString> names;
    for (std::string const& name : gNames)
        names.emplace_back(name.c_str());
    return names;
}

std::vector<DynamicString> const gDynamicNames = MakeDynamicNames();

void WriteItems(OVXmlMemoryStream& xml) {
    xml.WriteElementStart("items");
    for (int i = 0; i < kItems; ++i) {
        xml.WriteElementStartWithAttributes("item");
        xml.WriteInt("id", i);
        xml.WriteDouble("value", i * 0.25);
        xml.WriteString("name", gDynamicNames[static_cast<std::size_t>(i) % gDynamicNames.size()]);
        xml.WriteElementStartWithAttributesEnd(true);
    }
    xml.WriteElementEnd("items");
}

void XmlWrite(benchmark::State& state) {
    for (auto _ : state) {
        OVXmlMemoryStream xml;
        WriteItems(xml);
        benchmark::DoNotOptimize(xml.GetDataPtr());
    }
}

void XmlRead(benchmark::State& state) {
    OVXmlMemoryStream xml;
    WriteItems(xml);
    OVXmlAttributeList attributes;
    DynamicString name;
    for (auto _ : state) {
        xml.SetOffset(0);
        double sum = 0;
        xml.ReadElementStart("items");
        for (int i = 0; i < kItems; ++i) {
            xml.ReadElementStart("item", attributes);
            sum += attributes.ReadInt("id") + attributes.ReadDouble("value");
            attributes.ReadString("name", name);
            sum += name.GetNumBytes();
            xml.ReadElementEnd("item");
        }
        xml.ReadElementEnd("items");
        benchmark::DoNotOptimize(sum);
    }
}

#if defined(TEKIT_BENCH_HAVE_CEREAL)
struct Item {
    int id = 0;
    double value = 0;
    std::string name;
    template <class Archive> void serialize(Archive& archive) {
        archive(cereal::make_nvp("id", id), cereal::make_nvp("value", value),
                cereal::make_nvp("name", name));
    }
};

template <class Archive> void WriteItemsCereal(Archive& archive) {
    for (int i = 0; i < kItems; ++i) {
        Item item{i, i * 0.25, gNames[static_cast<std::size_t>(i) % gNames.size()]};
        archive(cereal::make_nvp("item", item));
    }
}

void XmlWriteCereal(benchmark::State& state) {
    for (auto _ : state) {
        std::stringstream out;
        {
            cereal::XMLOutputArchive archive(out);
            WriteItemsCereal(archive);
        }
        benchmark::DoNotOptimize(out.tellp());
    }
}

void XmlReadCereal(benchmark::State& state) {
    std::stringstream written;
    {
        cereal::XMLOutputArchive archive(written);
        WriteItemsCereal(archive);
    }
    std::string const text = written.str();
    for (auto _ : state) {
        std::stringstream in(text);
        cereal::XMLInputArchive archive(in);
        double sum = 0;
        Item item;
        for (int i = 0; i < kItems; ++i) {
            archive(cereal::make_nvp("item", item));
            sum += item.id + item.value + static_cast<double>(item.name.size());
        }
        benchmark::DoNotOptimize(sum);
    }
}

BENCHMARK(XmlWriteCereal)->Name("XmlWrite/100k-items/cereal")->Unit(benchmark::kMillisecond);
BENCHMARK(XmlReadCereal)->Name("XmlRead/100k-items/cereal")->Unit(benchmark::kMillisecond);
#endif

BENCHMARK(XmlWrite)->Name("XmlWrite/100k-items/tekit")->Unit(benchmark::kMillisecond);
BENCHMARK(XmlRead)->Name("XmlRead/100k-items/tekit")->Unit(benchmark::kMillisecond);

} // namespace
