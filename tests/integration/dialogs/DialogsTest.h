#pragma once

#include "IOrvixClientAccess.h"
#include "IOrvixServices.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
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

/// A host with colours of its own for some of the system's.
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

/// A services object over the reference dialogs, and a user. What dialogs remember in the registry is the test's own.
/// Skipped without a display.
class DialogsTest : public testing::Test
{
protected:
    static constexpr std::uint32_t NoPrompt = 0xFFFFFFFF;
    static constexpr const wchar_t* Title = L"Sesame";

    DialogsTest();
    void SetUp() override;

    /// Initialises the services object anew, with the stored answers of the last one.
    void Restart();

    std::int32_t ShowPrompt(std::uint32_t options, const std::function<void(const DialogWindow&)>& handle,
                            std::uint32_t promptID = NoPrompt, bool* dontAskAgain = nullptr,
                            const std::wstring& message = L"Open?");

    OrvixFileEntry& AddFile(const wchar_t* path, unsigned long flagsOut = 0x2, bool ticked = true);
    std::int32_t ShowFileList(std::uint32_t options, const std::function<void(const DialogWindow&)>& handle);
    std::int32_t ShowEditor(const std::function<void(const DialogWindow&)>& handle);

    /// The stored answers as they lie on the disk.
    std::string PromptFile() const;

    PrivateUserKey m_userKey;
    TempFolder m_config;
    ColourfulHost m_host;
    OrvixServicesPointer m_services;
    OrvixFileList m_list;
    OrvixFileListDialogParams m_params;
};
