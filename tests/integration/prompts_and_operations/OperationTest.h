#pragma once

#include "DialogTest.h"
#include "Log.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "RecordingListener.h"
#include "RecordingProvider.h"

#include <functional>
#include <set>
#include <string>

/// Bits of the operations.
constexpr std::uint32_t Notify = 0x1;
constexpr std::uint32_t CheckIn = 0x2;
constexpr std::uint32_t Add = 0x4;
constexpr std::uint32_t GetLatest = 0x8;
constexpr std::uint32_t CheckOut = 0x10;
constexpr std::uint32_t UndoCheckOut = 0x20;

/// Bits of the dialog's options.
constexpr std::uint32_t DialogShown = 0x1;
constexpr std::uint32_t KeepOption = 0x4;
constexpr std::uint32_t LatestOption = 0x8;
constexpr std::uint32_t OptionTicked = 0x10;
constexpr std::uint32_t OfferRemember = 0x40;
constexpr std::uint32_t Remember = 0x80;

/// State of a file in FlagsOut.
constexpr unsigned long Controlled = 0x2;

/// A record with a file list, a provider, a listener and a user at the dialog, all writing one log.
class OperationTest : public DialogTest
{
protected:
    static constexpr std::uint32_t DialogPrompt = 100;
    static constexpr std::uint32_t OptionPrompt = 200;

    OperationTest();

    /// Appends an entry to the list and to its active list.
    OrvixFileEntry& AddFile(const wchar_t* name, unsigned long flagsOut = Controlled);

    /// Lets the record name both prompts.
    void UsePrompts();

    std::int32_t Run(std::uint32_t operations, std::uint32_t flagsOutMask = 0xFFFFFFFF);

    /// The user at the dialog: writes "Dialog [a b] 1" with the options, leaves every entry ticked save those
    /// named here, does what `onDialog` says and answers.
    std::set<std::string> m_unticked;
    std::function<void(OrvixFileListDialogParams&)> m_onDialog;
    std::int32_t m_dialogResult = 1;

    Lines m_log;
    RecordingProvider m_provider{m_log};
    RecordingListener m_listener{m_log};
    OrvixFileList m_list;
    OrvixFileListDialogParams m_params;
};
