#include "DialogTest.h"

#include "OrvixPromptTable.h"

#include <utility>

namespace
{

/// Runs `work` on the prompt table of the services object and leaves the script as it was.
template <typename Work>
void EditTable(IOrvixServices& services, CoreUIScript& script, const Work& work)
{
    auto dialog = std::exchange(script.onEditor, [&work](const CoreUIScript::Editor& call) {
        work(*call.prompts);
        return OrvixPromptEditorResult::Unchanged;
    });
    services.EditPrompts(nullptr, nullptr);
    script.onEditor = std::move(dialog);
    script.editors.pop_back();
}

} // namespace

void DialogTest::AddPrompt(std::uint32_t id, std::uint32_t action, bool locked)
{
    EditTable(*m_services, m_script,
              [&](OrvixPromptTable& table) { table.AddPrompt(static_cast<int>(id), L"text", 0, action, locked); });
}

std::uint32_t DialogTest::LastAction(std::uint32_t id)
{
    std::uint32_t action = 0;
    EditTable(*m_services, m_script, [&](OrvixPromptTable& table) {
        for (unsigned int i = 0; i < static_cast<unsigned int>(table.NumPrompts()); ++i)
        {
            if (table.GetPromptID(i) == static_cast<int>(id))
            {
                action = table.GetPrompt(i);
            }
        }
    });
    return action;
}
