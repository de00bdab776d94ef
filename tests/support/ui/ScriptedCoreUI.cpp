#include "ScriptedCoreUI.h"

#include "OrvixDialogOption.h"
#include "OrvixPrompt.h"

namespace
{

/// Notes the call and runs the script's dialog; without one the answer is `unset`.
template <typename Dialog, typename Call>
std::int32_t Answer(const Dialog& dialog, std::vector<Call>& calls, const Call& call, std::int32_t unset)
{
    calls.push_back(call);
    return dialog ? dialog(call) : unset;
}

class ScriptedCoreUI final : public IOrvixCoreUI
{
public:
    void SetClientAccess(IOrvixCoreUIClientAccess* access) override { GetCoreUIScript().accesses.push_back(access); }

    std::int32_t ShowPrompt(void* a, void* b, void* c, std::uint32_t options, bool* dontAskAgain) override
    {
        CoreUIScript& script = GetCoreUIScript();
        return Answer(script.onPrompt, script.prompts, {a, b, c, options, dontAskAgain}, OrvixPromptAnswer::No);
    }

    std::int32_t ShowFileListDialog(void* a, OrvixFileListDialogParams* params) override
    {
        CoreUIScript& script = GetCoreUIScript();
        return Answer(script.onFileList, script.fileLists, {a, params}, OrvixDialogResult::Cancelled);
    }

    std::int32_t EditPrompts(void* a, void* b, OrvixPromptTable* prompts) override
    {
        CoreUIScript& script = GetCoreUIScript();
        return Answer(script.onEditor, script.editors, {a, b, prompts}, OrvixPromptEditorResult::Unchanged);
    }
};

} // namespace

CoreUIScript& GetCoreUIScript()
{
    static CoreUIScript script;
    return script;
}

IOrvixCoreUI* GetIOrvixCoreUI()
{
    auto* coreUI = new ScriptedCoreUI;
    GetCoreUIScript().obtained.push_back(coreUI);
    return coreUI;
}

void ReleaseIOrvixCoreUI(IOrvixCoreUI* coreUI)
{
    GetCoreUIScript().released.push_back(coreUI);
    delete static_cast<ScriptedCoreUI*>(coreUI);
}
