// Sections and items: access by name, pointer and position, duplicates, removal and copying,
// sorting and the sorted indexes, checked against a plain model of the object.
#include "ini/IniTestSupport.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>

namespace tekit::testing {
namespace {

TEST(IniSections, AccessByPositionNameAndPrefix) {
    IniObject ini;
    ASSERT_EQ(ReadText(ini, "[Alpha]\nA1=1\nA2=2\n[Beta]\nB Line0005=x\n[Alpine]"), 0);
    EXPECT_EQ(Ini_NumberOfSections(ini), 3);
    char const* name = nullptr;
    EXPECT_EQ(Ini_NthSectionName(ini, 2, &name), 1);
    EXPECT_STREQ(name, "Beta");
    EXPECT_EQ(Ini_NthSectionName(ini, 0, &name), 0);
    EXPECT_EQ(Ini_NthSectionName(ini, 4, &name), 0);
    EXPECT_EQ(Ini_SectionExists(ini, "alpha"), 0);
    EXPECT_EQ(Ini_PartialSectionNameExists(ini, "Alp", &name), 1);
    EXPECT_STREQ(name, "Alpha");
    EXPECT_EQ(Ini_PartialSectionNameExists(ini, "Gamma", &name), 0);
    EXPECT_EQ(Ini_NumberOfItems(ini, "Alpha"), 2);
    EXPECT_EQ(Ini_NumberOfItems(ini, "Missing"), 0);
    char const* tag = nullptr;
    EXPECT_EQ(Ini_NthItemName(ini, "Alpha", 2, &tag), 1);
    EXPECT_STREQ(tag, "A2");
    EXPECT_EQ(Ini_NthItemName(ini, "Alpha", 3, &tag), 0);
    EXPECT_EQ(Ini_PartialItemNameExists(ini, "Alpha", "A", &tag), 1);
    EXPECT_STREQ(tag, "A1");
    // A piece left unjoined counts for the multi-line forms, under its base tag.
    EXPECT_EQ(Ini_ItemExists(ini, "Beta", "B"), 0);
    EXPECT_EQ(Ini_ItemOrMultiLineItemExists(ini, "Beta", "B"), 1);
    EXPECT_EQ(Ini_ItemOrMultiLineItemExists(ini, "Beta", "B Line"), 0);
    EXPECT_EQ(Ini_PartialItemNameExists(ini, "Beta", "B", &tag), 1);
    EXPECT_STREQ(tag, "B Line0005");
    EXPECT_EQ(Ini_PartialItemNameOrMultiLineItemExists(ini, "Beta", "B", &tag), 1);
    EXPECT_STREQ(tag, "B");
}

// After reading, the indexes of an internally sorted object find the new items, and the
// sections keep their file order and their pointers.
TEST(IniSections, SectionPointersAndIndexesSurviveSortingReadingAndRemovals) {
    IniObject ini;
    ASSERT_EQ(ReadText(ini, "[b]\nX=1\n[a]\nY=2"), 0);
    IniSection b = nullptr;
    ASSERT_EQ(Ini_GetSectionPtr(ini, "b", &b), 1);
    ASSERT_EQ(Ini_Sort(ini), 0);
    ASSERT_EQ(Ini_DisableSorting(ini), 0);
    ASSERT_EQ(Ini_SortInternally(ini), 0);
    ASSERT_EQ(ReadText(ini, "[c]\nZ=3\nW=4"), 0);
    ASSERT_EQ(Ini_RemoveSection(ini, "a"), 1);
    ASSERT_EQ(ReadText(ini, "[0]\nV=5"), 0);
    EXPECT_EQ(Raw(ini, "c", "W"), "4");
    EXPECT_EQ(Dump(ini), "[b]\nX=1\n[c]\nZ=3\nW=4\n[0]\nV=5\n");
    int value = 0;
    EXPECT_EQ(Ini_GetIntSP(ini, b, "X", &value), 1);
    EXPECT_EQ(value, 1);
    char const* name = nullptr;
    int line = 0;
    EXPECT_EQ(Ini_SectionInfoSP(ini, b, &name, &line), 1);
    EXPECT_STREQ(name, "b");
    EXPECT_EQ(line, 1);
}

TEST(IniSections, CopySectionReplacesOrMerges) {
    IniObject source, dest;
    ASSERT_EQ(ReadText(source, "[s]\nA=1\nB=\"2\""), 0);
    ASSERT_EQ(ReadText(dest, "[s]\nB=old\nC=3"), 0);
    EXPECT_EQ(Ini_CopySection(source, dest, "s", 0), 1);
    EXPECT_EQ(Dump(dest), "[s]\nB=\"2\nC=3\nA=1\n");
    EXPECT_EQ(Ini_CopySection(source, dest, "s", 1), 1);
    EXPECT_EQ(Dump(dest), "[s]\nA=1\nB=\"2\n");
    EXPECT_EQ(Ini_CopySection(source, dest, "t", 1), 0);
    EXPECT_EQ(Ini_CopySection(source, source, "s", 1), 1);
    EXPECT_EQ(Dump(source), "[s]\nA=1\nB=\"2\n");
    ASSERT_EQ(Ini_RemoveSection(source, "s"), 1); // the copy is the destination's own
    EXPECT_EQ(Raw(dest, "s", "A"), "1");
}

/// A plain model of the object: sections and items in vectors, searched from the front.
struct Model {
    struct Section {
        std::string name;
        std::vector<std::pair<std::string, std::string>> items;
        bool sorted = false;
    };
    std::vector<Section> sections;
    bool sorted = false, duplicateChecking = true;

    static auto Tagged(std::string const& tag) {
        return [&tag](auto const& item) { return item.first == tag; };
    }
    Section* Find(std::string const& name) {
        auto const it = std::find_if(sections.begin(), sections.end(),
                                     [&](Section const& s) { return s.name == name; });
        return it == sections.end() ? nullptr : &*it;
    }
    std::string Lookup(std::string const& name, std::string const& tag) {
        Section* const s = Find(name);
        if (!s)
            return "<absent>";
        auto const it = std::find_if(s->items.begin(), s->items.end(), Tagged(tag));
        return it == s->items.end() ? "<absent>" : it->second;
    }
    void Put(std::string const& name, std::string const& tag, std::string const& value) {
        Section* s = Find(name);
        if (!s) {
            auto const at = !sorted ? sections.end()
                                    : std::upper_bound(sections.begin(), sections.end(), name,
                                                       [](std::string const& n, Section const& x) {
                                                           return n < x.name;
                                                       });
            s = &*sections.insert(at, Section{name, {}, sorted});
        }
        auto& items = s->items;
        auto const first = std::find_if(items.begin(), items.end(), Tagged(tag));
        if (duplicateChecking && first != items.end()) {
            first->second = value;
            items.erase(std::remove_if(first + 1, items.end(), Tagged(tag)), items.end());
            return;
        }
        auto const at =
            !s->sorted
                ? items.end()
                : std::upper_bound(items.begin(), items.end(), tag,
                                   [](std::string const& t, auto const& i) { return t < i.first; });
        items.insert(at, {tag, value});
    }
    int RemoveItem(std::string const& name, std::string const& tag) {
        Section* const s = Find(name);
        return s && std::erase_if(s->items, Tagged(tag)) > 0 ? 1 : 0;
    }
    void Sort(bool on) {
        for (Section& s : sections) {
            if (on)
                std::stable_sort(s.items.begin(), s.items.end(),
                                 [](auto const& a, auto const& b) { return a.first < b.first; });
            s.sorted = on;
        }
        if (on)
            std::stable_sort(sections.begin(), sections.end(),
                             [](Section const& a, Section const& b) { return a.name < b.name; });
        sorted = on;
    }
    std::string Dump() const {
        std::string out;
        for (Section const& s : sections) {
            out += "[" + s.name + "]\n";
            for (auto const& [tag, value] : s.items)
                out += tag + "=" + value + "\n";
        }
        return out;
    }
};

// Puts, removals, duplicate checking, sorting and indexes in random order, every lookup right
// after each step (so through the section cache too): the object must behave as the model.
TEST(IniSections, RandomOperationsMatchAPlainModel) {
    std::mt19937 random(17);
    // Names with long shared beginnings, and names that are beginnings of others.
    char const* const names[] = {"a", "Section", "Section1", "Section10", "Section1000000000z"};
    // clang-format off
    char const* const tags[] = {"k", "Measure", "Measurement001", "Measurement002",
        "Measurement0010", "Measurement00100000000a", "Measurement00100000000b", "MeasurementX"};
    // clang-format on
    for (int run = 0; run < 40; ++run) {
        IniObject ini;
        Model model;
        for (int step = 0; step < 400; ++step) {
            std::string const name = names[random() % std::size(names)];
            std::string const tag = tags[random() % std::size(tags)];
            std::string const value = std::to_string(random() % 1000);
            int const on = static_cast<int>(random() % 2);
            switch (random() % 12) {
            case 0:
                ASSERT_EQ(on ? Ini_Sort(ini) : Ini_DisableSorting(ini), 0);
                model.Sort(on);
                break;
            case 1:
                ASSERT_EQ(on ? Ini_SortInternally(ini) : Ini_DisableInternalSorting(ini), 0);
                break;
            case 2:
                Ini_SetDuplicateChecking(ini, on);
                model.duplicateChecking = on != 0;
                break;
            case 3:
                ASSERT_EQ(Ini_RemoveItem(ini, name.c_str(), tag.c_str()),
                          model.RemoveItem(name, tag));
                break;
            case 4:
                ASSERT_EQ(Ini_RemoveSection(ini, name.c_str()),
                          static_cast<int>(std::erase_if(model.sections,
                                                         [&](auto& s) { return s.name == name; })));
                break;
            default:
                ASSERT_EQ(Ini_PutRawString(ini, name.c_str(), tag.c_str(), value.c_str()), 0);
                model.Put(name, tag, value);
                break;
            }
            // Every lookup finds what the model finds first.
            for (char const* n : names)
                for (char const* t : tags)
                    ASSERT_EQ(Raw(ini, n, t), model.Lookup(n, t))
                        << n << "/" << t << " at step " << step;
            ASSERT_EQ(Dump(ini), model.Dump()) << "step " << step;
        }
    }
}

} // namespace
} // namespace tekit::testing
