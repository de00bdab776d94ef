#include "OperationTest.h"

#include <algorithm>
#include <vector>

namespace
{

/// A host's own entry: the base class knows nothing of its flags.
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

/// A host's own list, which may hold null: the base class's active list stays empty.
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

/// A host's own record: the base class's fields keep their defaults.
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

    std::int32_t dialogPrompt = -1;
    std::int32_t optionPrompt = -1;

private:
    OrvixFileList& m_list;
    std::uint32_t m_options = 0;
};

/// The library touches records that come from outside through their virtual operations alone.
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
        return m_services->RunFileListOperation(nullptr, &m_record, false, &m_provider, operations, Controlled);
    }

    HostEntry m_a{L"a", Controlled};
    HostEntry m_b{L"b", 0x10};
    HostEntry m_c{L"c", Controlled};
    HostList m_own;
    HostParams m_record{m_own};
};

TEST_F(HostClasses, RunAnOperationThroughTheDialog)
{
    m_unticked = {"c"};
    m_record.SetOptions(OptionTicked | KeepOption);
    EXPECT_EQ(RunOwn(Notify | CheckIn), 1);
    EXPECT_EQ(m_log, (Lines{"Notify 13 [null a null c]", "Dialog [null a null c] 15", "Notify 27 [null a null]",
                            "CheckIn [null a null] own 1", "Notify 14 [null a null]"}));
    EXPECT_EQ(m_a.GetFlagsIn(), 1U);
    EXPECT_EQ(m_b.GetFlagsIn(), 0U);
    EXPECT_EQ(m_record.OrvixFileListDialogParams::GetOptions(), 0U);
    EXPECT_EQ(m_a.OrvixFileEntry::GetFlagsIn(), 0U);
}

TEST_F(HostClasses, RunAnOperationFromStoredAnswers)
{
    AddPrompt(DialogPrompt, AnswerOne);
    AddPrompt(OptionPrompt, AnswerTwo);
    m_record.dialogPrompt = DialogPrompt;
    m_record.optionPrompt = OptionPrompt;
    m_record.SetOptions(LatestOption);
    EXPECT_EQ(RunOwn(CheckOut), 1);
    EXPECT_EQ(m_log, (Lines{"CheckOut [null a null c] own 6"}));
}

TEST_F(HostClasses, StoreTheAnswersOfTheirOwnPrompts)
{
    AddPrompt(DialogPrompt, Ask);
    AddPrompt(OptionPrompt, Ask);
    m_record.dialogPrompt = DialogPrompt;
    m_record.optionPrompt = OptionPrompt;
    m_record.SetOptions(Remember);
    EXPECT_EQ(RunOwn(CheckOut), 1);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), AnswerOne);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), AnswerThree);
}

TEST_F(HostClasses, AreDoneAtOnceWhereOnlyNullEntriesAreActive)
{
    for (OrvixFileEntry* entry : {&m_a, &m_b, &m_c})
    {
        m_own.RemoveActiveEntry(entry);
    }
    EXPECT_EQ(RunOwn(Notify | CheckIn), 1);
    EXPECT_TRUE(m_log.empty());
    EXPECT_EQ(ActiveNames(&m_own), "[null null]");
}

} // namespace
