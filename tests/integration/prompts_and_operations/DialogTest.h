#pragma once

#include "OrvixClientInfo.h"
#include "RecordingHost.h"
#include "ScriptedCoreUI.h"
#include "ServicesPointer.h"
#include "TempFolder.h"

#include <gtest/gtest.h>

#include <bit>

/// Prompt IDs and action bits of the tests.
constexpr std::uint32_t NoPrompt = 0xFFFFFFFF;
constexpr std::uint32_t Ask = 0x1;
constexpr std::uint32_t AnswerOne = 0x2;
constexpr std::uint32_t AnswerZero = 0x4;
constexpr std::uint32_t AnswerTwo = 0x8;
constexpr std::uint32_t AnswerThree = 0x10;

/// A pass-through argument: a value that nobody may look behind.
inline void* Token(std::uintptr_t value)
{
    return std::bit_cast<void*>(value);
}

/// A services object with a host behind it, an empty configuration folder and a fresh script of dialogs.
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

    /// Appends a row to the prompt table. It goes through the prompt editor, since only there rows are locked.
    void AddPrompt(std::uint32_t id, std::uint32_t action, bool locked = false);

    /// The last row's action, which is the one that is written.
    std::uint32_t LastAction(std::uint32_t id);

    CoreUIScript& m_script = GetCoreUIScript();
    TempFolder m_config;
    RecordingHost m_host;
    ServicesPointer m_services{GetIOrvixServices()};
};
