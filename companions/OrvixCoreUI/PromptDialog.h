#pragma once

#include "Dialog.h"

/// A question with up to four answers. The result is an `OrvixPromptAnswer`.
class PromptDialog final : public Dialog
{
public:
    /// Whether a prompt with these options (`OrvixPromptOption`) offers an answer (`OrvixPromptAnswer`).
    static bool Offers(std::uint32_t options, std::int32_t answer);

    /// Both texts may be null and must outlive the dialog. `options` are bits of `OrvixPromptOption`.
    PromptDialog(IOrvixCoreUIClientAccess* access, const wchar_t* title, const wchar_t* message, std::uint32_t options);

    /// Whether the user asked not to be asked again.
    bool DoNotAskAgain() const { return m_doNotAskAgain; }

private:
    std::span<const Layout::Rule> Rules() const override;
    void OnInit() override;
    int FirstFocus() const override { return IDYES; } // also when the message is a field that scrolls
    void OnCommand(int control, int notification) override;
    void ArrangeButtons() const;
    bool Has(std::uint32_t option) const { return (m_options & option) != 0; }
    const wchar_t* Icon() const;

    const wchar_t* m_title;
    const wchar_t* m_message;
    std::uint32_t m_options;
    bool m_doNotAskAgain = false;
};
