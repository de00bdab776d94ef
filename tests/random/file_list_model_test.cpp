#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "RandomModel.h"

#include <algorithm>
#include <array>
#include <map>
#include <utility>
#include <vector>

namespace
{

constexpr unsigned int MostEntries = 40;    // of a list
constexpr unsigned int MostActive = 300;    // enough for every way in which the list searches
constexpr unsigned int MostPaths = 300;     // from the roots to the entries
constexpr unsigned int MostAttachments = 5; // of an entry

const std::array<std::wstring, 7> Files = {L"",    L"D:\\Song\\a.wav", L"//server/share/a.wav", L"//",
                                           L"//x", L"D:/\u5009.wav",   std::wstring(300, L'x')};

/// The path as an entry keeps it.
std::wstring Stored(std::wstring file)
{
    if (file.size() > 2 && file[0] == L'/' && file[1] == L'/')
    {
        file[0] = file[1] = L'\\';
    }
    return file;
}

using Entries = std::vector<OrvixFileEntry*>;

/// What an entry is in the model.
struct ModelEntry
{
    std::wstring file;
    unsigned long flagsIn = 0;
    unsigned long flagsOut = 0;
    long long clientPtr = 0;
    OrvixFileEntry* parent = nullptr;
    Entries children;
    std::vector<ModelEntry> attachments;
};

/// A list and its model.
struct ModelList
{
    OrvixFileList real;
    Entries entries;
    Entries roots;
    Entries active;
};

bool Contains(const Entries& entries, const OrvixFileEntry* entry)
{
    return std::find(entries.begin(), entries.end(), entry) != entries.end();
}

bool RemoveFirst(Entries& entries, const OrvixFileEntry* entry)
{
    const auto found = std::find(entries.begin(), entries.end(), entry);
    if (found == entries.end())
    {
        return false;
    }
    entries.erase(found);
    return true;
}

/// Two lists and a few entries of the host's own, linked to each other in any way.
class FileListModel : public RandomModel
{
public:
    explicit FileListModel(RandomNumbers& random) : RandomModel(random)
    {
        for (OrvixFileEntry& entry : m_hostEntries)
        {
            AddModel(&entry, {});
        }
    }

    void Step()
    {
        ModelList& list = m_random.From(m_lists);
        OrvixFileEntry* entry = m_random.From(m_living);
        ChangeSomething(list, entry);
        CompareLinks();
        RepairLinks();
        KeepSmall(list);
        CompareValues(m_random.From(m_living));
        for (ModelList& each : m_lists)
        {
            CompareActive(each);
        }
    }

private:
    void ChangeSomething(ModelList& list, OrvixFileEntry* entry)
    {
        switch (m_random.Below(16))
        {
        case 0:
        case 1:
        case 2:
            CreateFromPath(list, entry);
            break;
        case 3:
            CreateFromEntry(list, entry);
            break;
        case 4:
            RemoveByIndex(list);
            break;
        case 5:
            Remove(list, entry);
            break;
        case 6:
            if (m_random.OneIn(30))
            {
                RemoveAll(list);
            }
            break;
        case 7:
            BuildActiveList(list);
            break;
        case 8:
            AddActive(list);
            break;
        case 9:
        case 10:
            RemoveActive(list);
            break;
        case 11:
            ChangeChildren(entry);
            break;
        case 12:
        case 13:
            ChangeAttachments(entry);
            break;
        default:
            SetValue(entry);
        }
    }

    ModelEntry& Of(OrvixFileEntry* entry) { return m_models[entry]; }

    void AddModel(OrvixFileEntry* entry, const ModelEntry& model)
    {
        m_models[entry] = model;
        m_living.push_back(entry);
    }

    void AddToList(ModelList& list, OrvixFileEntry* entry, const ModelEntry& model)
    {
        AddModel(entry, model);
        list.entries.push_back(entry);
        m_linked = true;
        (model.parent == nullptr ? list.roots : Of(model.parent).children).push_back(entry);
    }

    OrvixFileEntry* AnyParent() { return m_random.OneIn(3) ? nullptr : m_random.From(m_living); }

    void CreateFromPath(ModelList& list, OrvixFileEntry* entry)
    {
        ModelEntry model;
        model.file = m_random.From(Files);
        model.parent = m_random.OneIn(3) ? nullptr : entry;
        model.flagsIn = m_random.Below(8);
        model.clientPtr = -static_cast<long long>(m_random.Below(1000)) << 40;
        const bool isNull = m_random.OneIn(20);
        OrvixFileEntry* created =
            list.real.CreateEntry(isNull ? nullptr : model.file.c_str(), model.parent, model.flagsIn, model.clientPtr);
        Expect((created == nullptr) == isNull, "CreateEntry from a path");
        if (created != nullptr)
        {
            model.file = Stored(model.file);
            AddToList(list, created, model);
        }
    }

    void CreateFromEntry(ModelList& list, OrvixFileEntry* source)
    {
        ModelEntry model = Of(source);
        OrvixFileEntry* created = list.real.CreateEntry(*source);
        Expect(created != nullptr, "CreateEntry from an entry");
        AddToList(list, created, model);
    }

    void RemoveByIndex(ModelList& list)
    {
        const auto count = static_cast<unsigned int>(list.entries.size());
        const unsigned int index = m_random.Below(count + 2);
        OrvixFileEntry* entry = index < count ? list.entries[index] : nullptr;
        Expect(list.real.RemoveEntry(index) == (entry != nullptr), "RemoveEntry by index");
        if (entry != nullptr)
        {
            RemoveModel(list, entry);
        }
    }

    /// Also an entry that the list does not own.
    void Remove(ModelList& list, OrvixFileEntry* entry)
    {
        const bool isOwn = Contains(list.entries, entry);
        Expect(list.real.RemoveEntry(entry) == isOwn, "RemoveEntry by pointer");
        if (isOwn)
        {
            RemoveModel(list, entry);
        }
    }

    void RemoveModel(ModelList& list, OrvixFileEntry* entry)
    {
        RemoveFirst(list.roots, entry);
        for (OrvixFileEntry* root : list.roots)
        {
            Entries path;
            Detach(root, entry, path);
        }
        RemoveFirst(list.active, entry);
        RemoveFirst(list.entries, entry);
        Forget(entry);
    }

    void Detach(OrvixFileEntry* from, OrvixFileEntry* target, Entries& path)
    {
        if (Contains(path, from))
        {
            return;
        }
        path.push_back(from);
        Entries& children = Of(from).children;
        for (std::size_t i = 0; i < children.size(); ++i)
        {
            if (children[i] == target)
            {
                children.erase(children.begin() + static_cast<std::ptrdiff_t>(i));
                break;
            }
            Detach(children[i], target, path);
        }
        path.pop_back();
    }

    void RemoveAll(ModelList& list)
    {
        Expect(list.real.RemoveAll(), "RemoveAll");
        for (OrvixFileEntry* entry : list.entries)
        {
            Forget(entry);
        }
        list.entries.clear();
        list.roots.clear();
        list.active.clear();
    }

    void Forget(OrvixFileEntry* entry)
    {
        m_models.erase(entry);
        RemoveFirst(m_living, entry);
    }

    /// A host looks for the links to entries that are gone, since a list removes only those that it can reach.
    void RepairLinks()
    {
        const auto isGone = [this](OrvixFileEntry* entry) { return entry != nullptr && m_models.count(entry) == 0; };
        for (OrvixFileEntry* entry : m_living)
        {
            ModelEntry& model = Of(entry);
            for (unsigned int i = entry->NumChildren(); i > 0; --i)
            {
                if (isGone(model.children[i - 1]))
                {
                    Expect(entry->RemoveChild(i - 1), "RemoveChild of an entry that is gone");
                    model.children.erase(model.children.begin() + (i - 1));
                }
            }
            if (isGone(model.parent))
            {
                entry->SetParent(nullptr);
                model.parent = nullptr;
            }
        }
    }

    void KeepSmall(ModelList& list)
    {
        if (list.entries.size() > MostEntries)
        {
            RemoveAll(list);
            RepairLinks();
        }
        if (!std::exchange(m_linked, false))
        {
            return;
        }
        unsigned int paths = 0;
        for (OrvixFileEntry* entry : m_living)
        {
            Entries path;
            CountPaths(entry, path, paths);
        }
        if (paths > MostPaths * m_lists.size())
        {
            for (OrvixFileEntry* entry : m_living)
            {
                Expect(entry->RemoveAllChildren(), "RemoveAllChildren");
                Of(entry).children.clear();
            }
        }
    }

    void CountPaths(OrvixFileEntry* entry, Entries& path, unsigned int& count)
    {
        if (Contains(path, entry) || count > MostPaths * m_lists.size())
        {
            return;
        }
        ++count;
        path.push_back(entry);
        for (OrvixFileEntry* child : Of(entry).children)
        {
            CountPaths(child, path, count);
        }
        path.pop_back();
    }

    void BuildActiveList(ModelList& list)
    {
        const unsigned long mask = m_random.Below(8);
        const bool fromRoots = m_random.OneIn(2);
        list.active.clear();
        for (OrvixFileEntry* entry : fromRoots ? list.roots : list.entries)
        {
            Entries path;
            Select(entry, mask, fromRoots, path, list.active);
        }
        Expect(list.real.BuildActiveList(mask, fromRoots) == list.active.size(), "BuildActiveList");
    }

    void Select(OrvixFileEntry* entry, unsigned long mask, bool withChildren, Entries& path, Entries& active)
    {
        if (Contains(path, entry))
        {
            return;
        }
        path.push_back(entry);
        if (withChildren)
        {
            for (OrvixFileEntry* child : Of(entry).children)
            {
                Select(child, mask, withChildren, path, active);
            }
        }
        if ((Of(entry).flagsIn & mask) != 0)
        {
            active.push_back(entry);
        }
        path.pop_back();
    }

    void AddActive(ModelList& list)
    {
        for (unsigned int count = m_random.Below(40); count > 0 && list.active.size() < MostActive; --count)
        {
            OrvixFileEntry* entry = m_random.OneIn(20) ? nullptr : m_random.From(m_living);
            if (entry != nullptr)
            {
                list.active.push_back(entry);
            }
            Expect(list.real.AddActiveEntry(entry) == list.active.size(), "AddActiveEntry");
        }
    }

    /// A few entries, in the order of the active list or in any.
    void RemoveActive(ModelList& list)
    {
        const bool inOrder = m_random.OneIn(2);
        unsigned int place = 0;
        for (unsigned int count = m_random.Below(40); count > 0; --count)
        {
            OrvixFileEntry* entry = m_random.From(m_living);
            if (inOrder && place < list.active.size())
            {
                entry = list.active[place];
                place += m_random.Below(2);
            }
            Expect(list.real.RemoveActiveEntry(entry) == RemoveFirst(list.active, entry), "RemoveActiveEntry");
        }
    }

    void ChangeChildren(OrvixFileEntry* entry)
    {
        Entries& children = Of(entry).children;
        const auto count = static_cast<unsigned int>(children.size());
        if (m_random.OneIn(10))
        {
            Expect(entry->AddChild(nullptr) == 0, "AddChild of null");
            Expect(entry->RemoveAllChildren(), "RemoveAllChildren");
            children.clear();
        }
        else if (m_random.OneIn(2))
        {
            const unsigned int index = m_random.Below(count + 1);
            Expect(entry->RemoveChild(index) == (index < count), "RemoveChild");
            if (index < count)
            {
                children.erase(children.begin() + index);
            }
        }
        else
        {
            children.push_back(m_random.From(m_living)); // which may close a circle
            m_linked = true;
            Expect(entry->AddChild(children.back()) == count + 1, "AddChild");
        }
    }

    void ChangeAttachments(OrvixFileEntry* entry)
    {
        std::vector<ModelEntry>& attachments = Of(entry).attachments;
        const auto count = static_cast<unsigned int>(attachments.size());
        if (count > MostAttachments || m_random.OneIn(10))
        {
            Expect(entry->AddAttachment(nullptr) == 0 && entry->AddAttachment(nullptr, nullptr, 0, 0) == 0,
                   "AddAttachment of null");
            Expect(entry->RemoveAllAttachments(), "RemoveAllAttachments");
            attachments.clear();
        }
        else if (m_random.OneIn(3))
        {
            const unsigned int index = m_random.Below(count + 1);
            Expect(entry->RemoveAttachment(index) == (index < count), "RemoveAttachment");
            if (index < count)
            {
                attachments.erase(attachments.begin() + index);
            }
        }
        else if (m_random.OneIn(2))
        {
            OrvixFileEntry* source = m_random.From(m_living);
            ModelEntry model = Of(source);
            model.children.clear();
            model.attachments.clear();
            attachments.push_back(model);
            Expect(entry->AddAttachment(source) == count + 1, "AddAttachment of an entry");
        }
        else
        {
            ModelEntry model;
            const std::wstring& file = m_random.From(Files);
            model.file = Stored(file);
            model.parent = AnyParent();
            model.flagsIn = m_random.Below(8);
            model.clientPtr = m_random.Below(8);
            attachments.push_back(model);
            Expect(entry->AddAttachment(file.c_str(), model.parent, model.flagsIn, model.clientPtr) == count + 1,
                   "AddAttachment of a path");
        }
    }

    void SetValue(OrvixFileEntry* entry)
    {
        ModelEntry& model = Of(entry);
        const std::wstring& file = m_random.From(Files);
        switch (m_random.Below(6))
        {
        case 0:
            model.file = Stored(file);
            entry->SetFile(file.c_str());
            break;
        case 1:
            model.flagsIn = m_random.Below(8);
            entry->SetFlagsIn(model.flagsIn);
            break;
        case 2:
            model.flagsOut = ~0UL - m_random.Below(8);
            entry->SetFlagsOut(model.flagsOut);
            break;
        case 3:
            model.clientPtr = -1 - static_cast<long long>(m_random.Below(8));
            entry->SetClientPtr(model.clientPtr);
            break;
        case 4:
            model.parent = AnyParent();
            entry->SetParent(model.parent);
            break;
        default:
            entry->SetFile(nullptr);
        }
    }

    void CompareLinks()
    {
        for (ModelList& list : m_lists)
        {
            const auto count = static_cast<unsigned int>(list.entries.size());
            Expect(list.real.NumEntries() == count, "NumEntries");
            for (unsigned int i = 0; i <= count; ++i)
            {
                Expect(list.real.GetFileEntry(i) == (i < count ? list.entries[i] : nullptr), "GetFileEntry");
            }
            const auto rootCount = static_cast<unsigned int>(list.roots.size());
            Expect(list.real.NumRootEntries() == rootCount, "NumRootEntries");
            for (unsigned int i = 0; i <= rootCount; ++i)
            {
                Expect(list.real.GetRootEntry(i) == (i < rootCount ? list.roots[i] : nullptr), "GetRootEntry");
            }
        }
        for (OrvixFileEntry* entry : m_living)
        {
            const ModelEntry& model = Of(entry);
            const auto count = static_cast<unsigned int>(model.children.size());
            Expect(entry->GetParent() == model.parent, "GetParent");
            Expect(entry->NumChildren() == count, "NumChildren");
            for (unsigned int i = 0; i <= count; ++i)
            {
                Expect(entry->GetChild(i) == (i < count ? model.children[i] : nullptr), "GetChild");
            }
        }
    }

    void CompareValues(OrvixFileEntry* entry)
    {
        const ModelEntry& model = Of(entry);
        const auto count = static_cast<unsigned int>(model.attachments.size());
        Expect(HasValues(entry, model), "values of an entry");
        Expect(entry->NumAttachments() == count, "NumAttachments");
        Expect(entry->GetAttachment(count) == nullptr, "GetAttachment after the last");
        for (unsigned int i = 0; i < count; ++i)
        {
            Expect(HasValues(entry->GetAttachment(i), model.attachments[i]), "values of an attachment");
            Expect(entry->GetAttachment(i)->NumChildren() == 0, "children of an attachment");
        }
    }

    static bool HasValues(OrvixFileEntry* entry, const ModelEntry& model)
    {
        return entry->GetFile() == model.file && entry->GetFlagsIn() == model.flagsIn &&
               entry->GetFlagsOut() == model.flagsOut && entry->GetClientPtr() == model.clientPtr &&
               entry->GetParent() == model.parent;
    }

    /// Reads in order, backwards, here and there, or not at all: each leaves the list in another state.
    void CompareActive(ModelList& list)
    {
        const auto count = static_cast<unsigned int>(list.active.size());
        Expect(list.real.NumActiveEntries() == count, "NumActiveEntries");
        Expect(list.real.GetActiveFileEntry(count) == nullptr, "GetActiveFileEntry after the last");
        const unsigned int order = m_random.Below(4);
        for (unsigned int i = 0; i < count && order < 3; ++i)
        {
            const unsigned int place = order == 0 ? i : order == 1 ? count - 1 - i : m_random.Below(count);
            Expect(list.real.GetActiveFileEntry(place) == list.active[place], "GetActiveFileEntry");
        }
    }

    std::array<OrvixFileEntry, 3> m_hostEntries;
    std::array<ModelList, 2> m_lists;
    std::map<OrvixFileEntry*, ModelEntry> m_models; ///< of every living entry
    Entries m_living;                               ///< in order of creation
    bool m_linked = false;                          ///< there are new links to children
};

} // namespace

TEST(RandomSteps, OfFileListsKeepThemLikeTheirModel)
{
    RunModel<FileListModel>();
}
