#include "OrvixUserEntry.h"
#include "OrvixUserList.h"
#include "RandomModel.h"

#include <array>
#include <vector>

namespace
{

constexpr unsigned int NumTexts = 4;
constexpr unsigned int MostUsers = 40;

using Getter = const wchar_t* (OrvixUserEntry::*)();
using Setter = void (OrvixUserEntry::*)(const wchar_t*);

constexpr std::array<Getter, NumTexts> Getters = {&OrvixUserEntry::GetUserNameW, &OrvixUserEntry::GetFirstName,
                                                  &OrvixUserEntry::GetLastName, &OrvixUserEntry::GetEmail};
constexpr std::array<Setter, NumTexts> Setters = {&OrvixUserEntry::SetUserName, &OrvixUserEntry::SetFirstName,
                                                  &OrvixUserEntry::SetLastName, &OrvixUserEntry::SetEmail};

const std::array<std::wstring, 6> Texts = {L"",       L"ann",         L"a name longer than any short text is",
                                           L"\u5009", L"ann@example", std::wstring(300, L'x')};

class UserListModel : public RandomModel
{
public:
    explicit UserListModel(RandomNumbers& random) : RandomModel(random) {}

    void Step()
    {
        switch (m_random.Below(8))
        {
        case 0:
        case 1:
            CreateFromName();
            break;
        case 2:
            CreateFromUser();
            break;
        case 3:
            RemoveByIndex();
            break;
        case 4:
            RemoveByPointer();
            break;
        case 5:
            if (m_random.OneIn(20) || m_users.size() > MostUsers)
            {
                Expect(m_list.RemoveAll(), "RemoveAll");
                m_users.clear();
            }
            break;
        default:
            SetText();
        }
        Compare();
    }

private:
    struct User
    {
        OrvixUserEntry* entry = nullptr;
        std::array<std::wstring, NumTexts> texts;
    };

    void CreateFromName()
    {
        const bool isNull = m_random.OneIn(10);
        const std::wstring& name = m_random.From(Texts);
        OrvixUserEntry* entry = m_list.CreateEntry(isNull ? nullptr : name.c_str());
        Expect((entry == nullptr) == isNull, "CreateEntry from a name");
        if (entry != nullptr)
        {
            m_users.push_back({entry, {name}});
        }
    }

    /// Copies a user of the list or one of the host's own.
    void CreateFromUser()
    {
        OrvixUserEntry foreign;
        foreign.SetLastName(Texts[1].c_str());
        User source = {&foreign, {L"", L"", Texts[1]}};
        if (!m_users.empty() && !m_random.OneIn(4))
        {
            source = m_random.From(m_users);
        }
        source.entry = m_list.CreateEntry(*source.entry);
        Expect(source.entry != nullptr, "CreateEntry from a user");
        m_users.push_back(source);
    }

    void RemoveByIndex()
    {
        const unsigned int index = m_random.Below(static_cast<unsigned int>(m_users.size()) + 2);
        Expect(m_list.RemoveEntry(index) == (index < m_users.size()), "RemoveEntry by index");
        if (index < m_users.size())
        {
            m_users.erase(m_users.begin() + index);
        }
    }

    void RemoveByPointer()
    {
        OrvixUserEntry foreign;
        if (m_users.empty() || m_random.OneIn(4))
        {
            Expect(!m_list.RemoveEntry(m_random.OneIn(2) ? &foreign : nullptr), "RemoveEntry of a stranger");
            return;
        }
        const unsigned int index = m_random.Below(static_cast<unsigned int>(m_users.size()));
        Expect(m_list.RemoveEntry(m_users[index].entry), "RemoveEntry by pointer");
        m_users.erase(m_users.begin() + index);
    }

    void SetText()
    {
        if (m_users.empty())
        {
            return;
        }
        User& user = m_random.From(m_users);
        const unsigned int field = m_random.Below(NumTexts);
        if (m_random.OneIn(6))
        {
            (user.entry->*Setters[field])(nullptr);
            return;
        }
        user.texts[field] = m_random.From(Texts);
        (user.entry->*Setters[field])(user.texts[field].c_str());
    }

    void Compare()
    {
        const auto count = static_cast<unsigned int>(m_users.size());
        Expect(m_list.NumEntries() == count, "NumEntries");
        Expect(m_list.GetUserEntry(count) == nullptr, "GetUserEntry after the last");
        for (unsigned int i = 0; i < count; ++i)
        {
            Expect(m_list.GetUserEntry(i) == m_users[i].entry, "GetUserEntry");
            for (unsigned int field = 0; field < NumTexts; ++field)
            {
                Expect((m_users[i].entry->*Getters[field])() == m_users[i].texts[field], "text of a user");
            }
        }
    }

    OrvixUserList m_list;
    std::vector<User> m_users;
};

} // namespace

TEST(RandomSteps, OfUsersKeepTheListLikeItsModel)
{
    RunModel<UserListModel>();
}
