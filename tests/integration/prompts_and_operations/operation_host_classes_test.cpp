#include "OperationTest.h"

#include <algorithm>
#include <vector>

namespace
{

/// An entry of the host's own class: the base class does not see its flags.
class HostEntry final : public OrvixFileEntry
{
public:
    explicit HostEntry(const wchar_t* name, unsigned long flagsOut) : m_name(name), m_out(flagsOut) {}

    const wchar_t* GetFile() override { return m_name; }
    unsigned long GetFlagsIn() override { return m_in; }
    void SetFlagsIn(unsigned long flags) override { m_in = flags; }
    unsigned long GetFlagsOut() override { return m_out; }
    void SetFlagsOut(unsigned long flags) override { m_out = flags; }

private:
    const wchar_t* m_name;
    unsigned long m_in = 0;
    unsigned long m_out;
};

/// A list of the host's own class, which may hold null: the active list of the base class stays empty.
class HostList final : public OrvixFileList
{
public:
    unsigned int AddActiveEntry(OrvixFileEntry* entry) override
    {
        m_entries.push_back(entry);
        return NumActiveEntries();
    }
    bool RemoveActiveEntry(OrvixFileEntry* entry) override
    {
        const auto found = std::find(m_entries.begin(), m_entries.end(), entry);
        if (found == m_entries.end())
        {
            return false;
        }
        m_entries.erase(found);
        return true;
    }
    unsigned int NumActiveEntries() override { return static_cast<unsigned int>(m_entries.size()); }
    OrvixFileEntry* GetActiveFileEntry(unsigned int index) override
    {
        return index < m_entries.size() ? m_entries[index] : nullptr;
    }

private:
    std::vector<OrvixFileEntry*> m_entries;
};

/// A record of the host's own class: the fields of the base class keep their defaults.
class HostParams final : public OrvixFileListDialogParams
{
public:
    explicit HostParams(OrvixFileList& list) : m_list(list) {}

    void SetOptions(std::uint32_t options) override { m_options = options; }
    std::uint32_t GetOptions() override { return m_options; }
    OrvixFileList* GetOrvixFileList() override { return &m_list; }
    const wchar_t* GetComment() override { return L"own"; }
    std::int32_t GetDialogPromptID() override { return dialogPrompt; }
    std::int32_t GetOptionPromptID() override { return optionPrompt; }

    std::int32_t dialogPrompt = OrvixPromptID::Unset;
    std::int32_t optionPrompt = OrvixPromptID::Unset;

private:
    OrvixFileList& m_list;
    std::uint32_t m_options = 0;
};

/// The library uses only the virtual operations of records that a host passes.
class HostClasses : public OperationTest
{
protected:
    HostClasses()
    {
        for (OrvixFileEntry* entry : std::initializer_list<OrvixFileEntry*>{nullptr, &m_a, &m_b, nullptr, &m_c})
        {
            m_own.AddActiveEntry(entry);
        }
    }

    std::int32_t RunOwn(std::uint32_t operations)
    {
        return m_services->RunFileListOperation(nullptr, &m_record, false, &m_provider, operations, State::Controlled);
    }

    HostEntry m_a{L"a", State::Controlled};
    HostEntry m_b{L"b", State::OutOfDate};
    HostEntry m_c{L"c", State::Controlled};
    HostList m_own;
    HostParams m_record{m_own};
};

TEST_F(HostClasses, RunAnOperationThroughTheDialog)
{
    m_cleared = {"c"};
    m_record.SetOptions(DialogOption::OptionChecked | DialogOption::OfferKeepCheckedOut);
    EXPECT_EQ(RunOwn(Operation::Notify | Operation::CheckIn), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"Notify BeforeCheckIn [null a null c]",
                            "Dialog [null a null c] EntriesCanBeCleared OfferKeepCheckedOut OptionChecked",
                            "Notify FilesConfirmed [null a null]", "CheckIn [null a null] own KeepCheckedOut",
                            "Notify AfterCheckIn [null a null]"}));
    EXPECT_EQ(m_a.GetFlagsIn(), OrvixFileSelection::Selected);
    EXPECT_EQ(m_b.GetFlagsIn(), 0U);
    EXPECT_EQ(m_record.OrvixFileListDialogParams::GetOptions(), 0U);
    EXPECT_EQ(m_a.OrvixFileEntry::GetFlagsIn(), 0U);
}

TEST_F(HostClasses, RunAnOperationFromStoredAnswers)
{
    AddPrompt(DialogPrompt, Action::Yes);
    AddPrompt(OptionPrompt, Action::OptionChecked);
    m_record.dialogPrompt = DialogPrompt;
    m_record.optionPrompt = OptionPrompt;
    m_record.SetOptions(DialogOption::OfferGetLatest);
    EXPECT_EQ(RunOwn(Operation::CheckOut), OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"CheckOut [null a null c] own GetLatest NoDialog"}));
}

TEST_F(HostClasses, StoreTheAnswersOfTheirOwnPrompts)
{
    AddPrompt(DialogPrompt, Action::Ask);
    AddPrompt(OptionPrompt, Action::Ask);
    m_record.dialogPrompt = DialogPrompt;
    m_record.optionPrompt = OptionPrompt;
    m_record.SetOptions(DialogOption::RememberChecked);
    EXPECT_EQ(RunOwn(Operation::CheckOut), OperationResult::Done);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Action::Yes);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), Action::OptionCleared);
}

TEST_F(HostClasses, AreDoneAtOnceWhenOnlyNullEntriesAreActive)
{
    for (OrvixFileEntry* entry : {&m_a, &m_b, &m_c})
    {
        m_own.RemoveActiveEntry(entry);
    }
    EXPECT_EQ(RunOwn(Operation::Notify | Operation::CheckIn), OperationResult::Done);
    EXPECT_TRUE(m_log.empty());
    EXPECT_EQ(ActiveNames(&m_own), "[null null]");
}

} // namespace
