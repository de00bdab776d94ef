#include "FileLists.h"
#include "Measure.h"
#include "OrvixFileFlags.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixOperation.h"
#include "OrvixPrompt.h"
#include "OrvixProviderBase.h"
#include "OrvixProviderResult.h"
#include "OrvixServicesPointer.h"

#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace
{

constexpr unsigned long Mask = 0x4;

/// Every eleventh entry is a root; the ten after it are its children. All are selected.
std::unique_ptr<OrvixFileList> MakeTree(unsigned int count)
{
    std::unique_ptr<OrvixFileList> list(new OrvixFileList);
    OrvixFileEntry* root = nullptr;
    for (unsigned int i = 0; i < count; ++i)
    {
        OrvixFileEntry* entry = list->CreateEntry(FileName(i).c_str(), i % 11 ? root : nullptr, Mask, 0);
        if (i % 11 == 0)
        {
            root = entry;
        }
    }
    return list;
}

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

/// A provider that does nothing and changes no state.
class IdleProvider final : public OrvixProviderBase
{
public:
    const wchar_t* GetName() override { return L"Idle"; }
    bool IsInitialized() override { return true; }
    bool IsProjectOpen() override { return true; }
    int Initialize(OrvixClientInfo*) override { return OrvixProviderResult::Success; }
    int Uninitialize() override { return OrvixProviderResult::Success; }
    int OpenProject(const wchar_t*, const wchar_t*) override { return OrvixProviderResult::Success; }
    int CloseProject() override { return OrvixProviderResult::Success; }
    int CheckOut(OrvixFileList*, const wchar_t*, unsigned long) override { return OrvixProviderResult::Success; }
    int QueryStatus(OrvixFileList*, unsigned long) override { return OrvixProviderResult::Success; }
};

/// Milliseconds per entry of a run on `count` entries of which every second one is dropped. Small lists are
/// run several times, so that the time is well above the clock's step.
double CostPerEntry(unsigned int count, unsigned int lists, bool fromRoots)
{
    constexpr std::uint32_t Prompt = 1;
    constexpr unsigned long Fits = OrvixFileState::Controlled;
    const OrvixServicesPointer services = MakeOrvixServices();
    services->RegisterPrompt(Prompt, L"Check out?", OrvixPromptAction::Yes, 0, true);
    IdleProvider provider;

    std::vector<std::unique_ptr<OrvixFileList>> all;
    for (unsigned int l = 0; l < lists; ++l)
    {
        all.push_back(MakeTree(count));
        for (unsigned int i = 0; i < count; ++i)
        {
            all.back()->GetFileEntry(i)->SetFlagsOut(i % 2 ? Fits : 0);
        }
    }
    OrvixFileListDialogParams params;
    params.SetDialogPromptID(Prompt);
    const double time = BestTime(
        [&] {
            for (const auto& list : all)
            {
                params.SetOrvixFileList(list.get());
                services->RunFileListOperation(nullptr, &params, true, &provider, OrvixOperation::CheckOut, Fits);
            }
        },
        [&] {
            for (const auto& list : all)
            {
                list->BuildActiveList(Mask, fromRoots);
            }
        });
    return time / count / lists;
}

} // namespace

void BenchLists(MeasureTable& table)
{
    {
        constexpr unsigned int Million = 1000000;
        table.Print(Compare(
            "making and deleting 1,000,000 entries in trees", 1.3, [] { MakeTree(Million); },
            [] { MakePlainTree(Million); }));
        table.Print({"size of an entry in bytes, without its texts and links", sizeof(OrvixFileEntry),
                     sizeof(PlainEntry), 1.0});
        const auto list = MakeTree(Million);
        std::vector<OrvixFileEntry*> active;
        active.reserve(Million);
        table.Print(Compare(
            "BuildActiveList, 1,000,000 entries in order of creation", 1.3, [&] { list->BuildActiveList(Mask, false); },
            [&] { FloorFlat(*list, active); }));
        table.Print(Compare(
            "BuildActiveList, 1,000,000 entries from the roots", 1.3, [&] { list->BuildActiveList(Mask, true); },
            [&] { FloorTree(*list, active); }));
    }
    table.Print({"RunFileListOperation, time per entry: 100,000 against 1,000 entries", CostPerEntry(100000, 1, false),
                 CostPerEntry(1000, 10, false), 2.0});
    table.Print({"the same with an active list built from the roots", CostPerEntry(100000, 1, true),
                 CostPerEntry(1000, 10, true), 2.0});
}
