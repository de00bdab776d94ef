#pragma once

#include "DialogTest.h"
#include "Log.h"
#include "OrvixDialogOption.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixOperation.h"
#include "RecordingListener.h"
#include "RecordingProvider.h"

#include <functional>
#include <set>
#include <string>

namespace DialogOption = OrvixDialogOption;
namespace DialogResult = OrvixDialogResult;
namespace Operation = OrvixOperation;
namespace OperationResult = OrvixOperationResult;
namespace State = OrvixFileState;

/// A record with a file list, a provider, a listener and a user at the dialog, all writing one log.
class OperationTest : public DialogTest
{
protected:
    static constexpr std::uint32_t DialogPrompt = 100;
    static constexpr std::uint32_t OptionPrompt = 200;

    OperationTest();

    /// Appends an entry to the list and to its active list.
    OrvixFileEntry& AddFile(const wchar_t* name, unsigned long flagsOut = State::Controlled);

    /// Lets the record name both prompts.
    void UsePrompts();

    std::int32_t Run(std::uint32_t operations, std::uint32_t flagsOutMask = AllBits);

    /// The user at the dialog: logs "Dialog [a b] OptionChecked" with the names of the options, clears the entries
    /// named here, leaves every other entry checked, runs `m_onDialog` and answers.
    std::set<std::string> m_cleared;
    std::function<void(OrvixFileListDialogParams&)> m_onDialog;
    std::int32_t m_dialogResult = DialogResult::Confirmed;

    Lines m_log;
    RecordingProvider m_provider{m_log};
    RecordingListener m_listener{m_log};
    OrvixFileList m_list;
    OrvixFileListDialogParams m_params;
};
