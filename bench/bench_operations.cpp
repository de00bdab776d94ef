#include "FileLists.h"
#include "Measure.h"
#include "OrvixFileFlags.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixOperation.h"
#include "OrvixPrompt.h"
#include "OrvixProviderBase.h"
#include "OrvixProviderResult.h"
#include "OrvixServicesPointer.h"

#include <algorithm>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace
{

using Entries = std::vector<OrvixFileEntry*>;

constexpr unsigned long Fits = OrvixFileState::Controlled;

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

void BuildInOrder(OrvixFileList& list)
{
    list.BuildActiveList(SelectedInTree, false);
}

void BuildFromRoots(OrvixFileList& list)
{
    list.BuildActiveList(SelectedInTree, true);
}

void AddEach(OrvixFileList& list)
{
    list.BuildActiveList(0, false);
    for (unsigned int i = 0; i < list.NumEntries(); ++i)
    {
        list.AddActiveEntry(list.GetFileEntry(i));
    }
}

/// One entry that stays is there twice.
void AddEachAndOneAgain(OrvixFileList& list)
{
    AddEach(list);
    list.AddActiveEntry(list.GetFileEntry(1));
}

/// One entry that stays is reached twice: it is a child of two roots.
void LinkOneAgain(OrvixFileList& list)
{
    list.GetFileEntry(0)->AddChild(list.GetFileEntry(13));
}

/// How the active list is made.
struct Form
{
    std::string name;
    std::function<void(OrvixFileList&)> build;
    std::function<void(OrvixFileList&)> change = [](OrvixFileList&) {};
};

/// How the floor removes entries, which are in order, from a copy of the active list.
using Removal = void (*)(Entries& active, const Entries& others);

void FindAndEraseEach(Entries& active, const Entries& others)
{
    for (OrvixFileEntry* entry : others)
    {
        active.erase(std::find(active.begin(), active.end(), entry));
    }
}

void CompactOnce(Entries& active, const Entries& others)
{
    auto next = others.begin();
    std::erase_if(active, [&](OrvixFileEntry* entry) {
        const bool isNext = next != others.end() && *next == entry;
        next += isNext ? 1 : 0;
        return isNext;
    });
}

/// The virtual calls of a run, with the active list beside them.
void RunByHand(OrvixFileList& list, IOrvixProvider& provider, Entries& active, Removal remove)
{
    provider.QueryStatus(&list, 0);
    Entries others;
    for (unsigned int i = 0; i < list.NumActiveEntries(); ++i)
    {
        OrvixFileEntry* entry = list.GetActiveFileEntry(i);
        if (entry == nullptr)
        {
            continue;
        }
        if ((entry->GetFlagsOut() & Fits) != 0)
        {
            entry->SetFlagsIn(entry->GetFlagsIn() | OrvixFileSelection::Selected);
        }
        else
        {
            others.push_back(entry);
        }
    }
    remove(active, others);
    provider.CheckOut(&list, L"", 0);
}

/// Milliseconds of a run on `count` entries of which every second one is dropped. Small lists are run several times, so
/// that the time is well above the clock's step.
Measure RunOperation(const Form& form, unsigned int count, Removal remove, double atMost)
{
    constexpr std::uint32_t Prompt = 1;
    const OrvixServicesPointer services = MakeOrvixServices();
    services->RegisterPrompt(Prompt, L"Check out?", OrvixPromptAction::Yes, 0, true);
    IdleProvider provider;

    std::vector<std::unique_ptr<OrvixFileList>> lists(std::max(1U, 10000 / count));
    std::vector<Entries> copies(lists.size());
    for (auto& list : lists)
    {
        list = MakeTree(count);
        for (unsigned int i = 0; i < count; ++i)
        {
            list->GetFileEntry(i)->SetFlagsOut(i % 2 ? Fits : 0);
        }
        form.change(*list);
    }
    OrvixFileListDialogParams params;
    params.SetDialogPromptID(Prompt);
    Measure measure = Compare(
        "RunFileListOperation, " + std::to_string(count) + " entries, " + form.name, atMost,
        [&] {
            for (const auto& list : lists)
            {
                params.SetOrvixFileList(list.get());
                services->RunFileListOperation(nullptr, &params, true, &provider, OrvixOperation::CheckOut, Fits);
            }
        },
        [&] {
            for (std::size_t i = 0; i < lists.size(); ++i)
            {
                RunByHand(*lists[i], provider, copies[i], remove);
            }
        },
        [&] {
            for (std::size_t i = 0; i < lists.size(); ++i)
            {
                form.build(*lists[i]);
                copies[i].clear();
                for (unsigned int n = 0; n < lists[i]->NumActiveEntries(); ++n)
                {
                    copies[i].push_back(lists[i]->GetActiveFileEntry(n));
                }
            }
        });
    measure.ours /= static_cast<double>(lists.size());
    measure.floor /= static_cast<double>(lists.size());
    return measure;
}

} // namespace

void BenchOperations(MeasureTable& table)
{
    const auto perEntry = [](const Measure& measure, unsigned int count) {
        return Measure{"", measure.ours / count, measure.floor / count, 0};
    };
    const auto rows = [&](const Form& form, double atMost) {
        const Measure small = perEntry(RunOperation(form, 1000, CompactOnce, 0), 1000);
        const Measure medium = RunOperation(form, 10000, CompactOnce, atMost);
        const Measure large = perEntry(RunOperation(form, 100000, CompactOnce, 0), 100000);
        table.Print(medium);
        table.Print({"its growth of the time per entry from 1,000 to 100,000 entries", large.ours / small.ours,
                     large.floor / small.floor, 2.0});
    };
    rows({"in order of creation", BuildInOrder}, 1.5);
    rows({"from the roots", BuildFromRoots}, 2.2);
    rows({"added one by one", AddEach}, 2.2);

    for (const Form& form :
         {Form{"one twice", AddEachAndOneAgain}, Form{"one by two ways", BuildFromRoots, LinkOneAgain}})
    {
        rows(form, 3.0);
        Measure erasing = RunOperation(form, 10000, FindAndEraseEach, 1.0);
        erasing.name += ", find and erase";
        table.Print(erasing);
    }
}
