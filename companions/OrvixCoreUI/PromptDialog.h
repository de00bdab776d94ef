#pragma once

#include "Dialog.h"

/// A question with up to four answers: 1 yes, 0 no, 2 yes to all, 3 no to all.
class PromptDialog final : public Dialog
{
public:
    /// Bits of the options.
    static constexpr std::uint32_t OnlyOk = 0x1;
    static constexpr std::uint32_t OfferYesToAll = 0x2;
    static constexpr std::uint32_t OfferNoToAll = 0x4;
    static constexpr std::uint32_t OfferDoNotAsk = 0x100;

    /// The bits that choose the icon, and their values.
    static constexpr std::uint32_t Icons = 0x30;
    static constexpr std::uint32_t UsualIcon = 0x00;
    static constexpr std::uint32_t InformationIcon = 0x10;
    static constexpr std::uint32_t WarningIcon = 0x20;
    static constexpr std::uint32_t ErrorIcon = 0x30;

    /// Both texts may be null and must outlive the dialog.
    PromptDialog(IOrvixCoreUIClientAccess* access, const wchar_t* title, const wchar_t* message, std::uint32_t options);

    /// Whether the user asked not to be asked again.
    bool DoNotAskAgain() const { return m_doNotAskAgain; }

private:
    std::span<const Layout::Rule> Rules() const override;
    void OnInit() override;
    void OnCommand(int control, int notification) override;
    bool Has(std::uint32_t option) const { return (m_options & option) != 0; }
    bool Offers(int button) const;
    const wchar_t* Icon() const;

    const wchar_t* m_title;
    const wchar_t* m_message;
    std::uint32_t m_options;
    bool m_doNotAskAgain = false;
};
