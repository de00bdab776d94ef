#include "FileLists.h"
#include "Measure.h"

#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace
{

constexpr unsigned long Mask = SelectedInTree;

/// An entry as a program would write it for itself, with the standard library's members.
struct PlainEntry
{
    virtual ~PlainEntry() = default;

    std::wstring path;
    unsigned long flagsIn = Mask;
    unsigned long flagsOut = 0;
    long long clientPtr = 0;
    PlainEntry* parent = nullptr;
    std::vector<PlainEntry*> children;
    std::vector<PlainEntry*> attachments;
};

/// What `MakeTree` does, with such entries.
std::vector<std::unique_ptr<PlainEntry>> MakePlainTree(unsigned int count)
{
    std::vector<std::unique_ptr<PlainEntry>> list;
    PlainEntry* root = nullptr;
    for (unsigned int i = 0; i < count; ++i)
    {
        auto entry = std::make_unique<PlainEntry>();
        entry->path = FileName(i);
        if (i % 11 == 0)
        {
            root = entry.get();
        }
        else
        {
            entry->parent = root;
            root->children.push_back(entry.get());
        }
        list.push_back(std::move(entry));
    }
    return list;
}

/// The calls that any implementation makes, in the order of the flat form.
void FloorFlat(OrvixFileList& list, std::vector<OrvixFileEntry*>& active)
{
    active.clear();
    for (unsigned int i = 0; i < list.NumEntries(); ++i)
    {
        OrvixFileEntry* entry = list.GetFileEntry(i);
        if (entry != nullptr && (entry->GetFlagsIn() & Mask))
        {
            active.push_back(entry);
        }
    }
}

void FloorVisit(OrvixFileEntry* entry, std::vector<OrvixFileEntry*>& active)
{
    for (unsigned int i = 0; i < entry->NumChildren(); ++i)
    {
        if (OrvixFileEntry* child = entry->GetChild(i))
        {
            FloorVisit(child, active);
        }
    }
    if (entry->GetFlagsIn() & Mask)
    {
        active.push_back(entry);
    }
}

void FloorTree(OrvixFileList& list, std::vector<OrvixFileEntry*>& active)
{
    active.clear();
    for (unsigned int i = 0; i < list.NumRootEntries(); ++i)
    {
        if (OrvixFileEntry* root = list.GetRootEntry(i))
        {
            FloorVisit(root, active);
        }
    }
}

} // namespace

void BenchLists(MeasureTable& table)
{
    constexpr unsigned int Million = 1000000;
    table.Print(Compare(
        "making and deleting 1,000,000 entries in trees", 1.3, [] { MakeTree(Million); },
        [] { MakePlainTree(Million); }));
    table.Print(
        {"size of an entry in bytes, without its texts and links", sizeof(OrvixFileEntry), sizeof(PlainEntry), 1.0});
    for (const unsigned int count : {10000U, 100000U, Million})
    {
        const auto list = MakeTree(count);
        std::vector<OrvixFileEntry*> active;
        active.reserve(count);
        const std::string name = "BuildActiveList, " + std::to_string(count) + " entries ";
        table.Print(Compare(
            name + "in order of creation", 1.3, [&] { list->BuildActiveList(Mask, false); },
            [&] { FloorFlat(*list, active); }));
        table.Print(Compare(
            name + "from the roots", 1.1, [&] { list->BuildActiveList(Mask, true); },
            [&] { FloorTree(*list, active); }));
    }
}
