#pragma once

#include "IOrvixClientAccess.h"
#include "IOrvixServices.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixPrompt.h"
#include "OrvixServicesPointer.h"
#include "PrivateUserKey.h"
#include "TempFolder.h"
#include "User.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <map>
#include <string>
#include <vector>

using Texts = std::vector<std::wstring>;

/// A host that replaces some of the system's colours.
class ColourfulHost final : public IOrvixClientAccess
{
public:
    std::map<std::int32_t, std::uint32_t> colors;

    void OutputText(const wchar_t*, int) override {}
    std::intptr_t RelayA(void*, void*, void*, void*) override { return 0; }
    std::uint32_t GetColor(std::int32_t index) override
    {
        const auto own = colors.find(index);
        return own == colors.end() ? GetSysColor(index) : own->second;
    }
    bool IsUnattended() override { return false; }
    std::intptr_t RelayB(void*, void*, void*, void*) override { return 0; }
};

/// A services object with the reference dialogs, and a user. Each test has an empty registry for what dialogs remember.
/// Skipped without a display.
class DialogsTest : public testing::Test
{
protected:
    static constexpr const wchar_t* Title = L"Sesame";

    DialogsTest();
    void SetUp() override;

    /// Makes a new services object, which reads the answers that the last one stored.
    void Restart();

    /// What the user does at a dialog.
    using Handler = std::function<void(const DialogWindow&)>;

    std::int32_t ShowPrompt(std::uint32_t options, const Handler& handle, std::uint32_t promptID = OrvixPromptID::None,
                            bool* dontAskAgain = nullptr, const std::wstring& message = L"Open?");

    /// Adds an active entry, which the dialog shows checked or not.
    OrvixFileEntry& AddFile(const wchar_t* path, unsigned long flagsOut = OrvixFileState::Controlled,
                            bool checked = true);
    std::int32_t ShowFileList(std::uint32_t options, const Handler& handle);

    /// The same with `OrvixDialogOption::EntriesCanBeCleared` alone.
    std::int32_t ShowFileList(const Handler& handle);
    std::int32_t ShowEditor(const Handler& handle);

    /// The bytes of the file that stores the answers.
    std::string PromptFile() const;

    PrivateUserKey m_userKey;
    TempFolder m_config;
    ColourfulHost m_host;
    OrvixServicesPointer m_services;
    OrvixFileList m_list;
    OrvixFileListDialogParams m_params;
};
