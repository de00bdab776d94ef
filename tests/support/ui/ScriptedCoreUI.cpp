#include "ScriptedCoreUI.h"

namespace
{

template <typename Dialog, typename Call>
std::int32_t Answer(const Dialog& dialog, std::vector<Call>& calls, const Call& call)
{
    calls.push_back(call);
    return dialog ? dialog(call) : 0;
}

class ScriptedCoreUI final : public IOrvixCoreUI
{
public:
    void SetClientAccess(IOrvixCoreUIClientAccess* access) override { GetCoreUIScript().accesses.push_back(access); }

    std::int32_t ShowPrompt(void* a, void* b, void* c, std::uint32_t options, bool* dontAskAgain) override
    {
        CoreUIScript& script = GetCoreUIScript();
        return Answer(script.onPrompt, script.prompts, {a, b, c, options, dontAskAgain});
    }

    std::int32_t ShowFileListDialog(void* a, OrvixFileListDialogParams* params) override
    {
        CoreUIScript& script = GetCoreUIScript();
        return Answer(script.onFileList, script.fileLists, {a, params});
    }

    std::int32_t EditPrompts(void* a, void* b, OrvixPromptTable* prompts) override
    {
        CoreUIScript& script = GetCoreUIScript();
        return Answer(script.onEditor, script.editors, {a, b, prompts});
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
