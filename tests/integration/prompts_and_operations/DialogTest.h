#pragma once

#include "OrvixClientInfo.h"
#include "OrvixPrompt.h"
#include "OrvixServicesPointer.h"
#include "RecordingHost.h"
#include "ScriptedCoreUI.h"
#include "TempFolder.h"

#include <gtest/gtest.h>

#include <bit>

namespace Action = OrvixPromptAction;
namespace Answer = OrvixPromptAnswer;

/// A bit that no published name has, in any word of options, states or actions.
inline constexpr std::uint32_t UnpublishedBit = 0x80000000;

/// A word with every bit set.
inline constexpr std::uint32_t AllBits = 0xFFFFFFFF;

/// An argument that the library passes on: a pointer that nobody may follow.
inline void* Token(std::uintptr_t value)
{
    return std::bit_cast<void*>(value);
}

/// A services object of a recording host, with an empty configuration folder and a fresh script of dialogs.
class DialogTest : public testing::Test
{
protected:
    DialogTest()
    {
        m_script = {};
        Initialize(&m_host);
    }
    void TearDown() override { m_script = {}; }

    void Initialize(IOrvixClientAccess* host)
    {
        OrvixClientInfo info;
        info.SetConfigFilePath(m_config.Text().c_str());
        info.SetIOrvixClientAccess(host);
        m_services->Initialize(&info, 0);
    }

    /// Appends a row to the prompt table, through the prompt editor: only there rows are locked.
    void AddPrompt(std::uint32_t id, std::uint32_t action, bool locked = false);

    /// The action of the last row with the ID, which is the row that the library writes.
    std::uint32_t LastAction(std::uint32_t id);

    CoreUIScript& m_script = GetCoreUIScript();
    TempFolder m_config;
    RecordingHost m_host;
    OrvixServicesPointer m_services = MakeOrvixServices();
};
