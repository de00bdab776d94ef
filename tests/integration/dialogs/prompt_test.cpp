#include "DialogsTest.h"
#include "OrvixPrompt.h"

#include <bit>

namespace
{

using OrvixPromptOption::OfferNoToAll;
using OrvixPromptOption::OfferStopAsking;
using OrvixPromptOption::OfferYesToAll;
using OrvixPromptOption::OnlyOK;

using PromptDialog = DialogsTest;

TEST_F(PromptDialog, GivesTheAnswerOfItsButtons)
{
    const std::pair<const wchar_t*, std::int32_t> answers[] = {{L"Yes", OrvixPromptAnswer::Yes},
                                                               {L"No", OrvixPromptAnswer::No},
                                                               {L"Yes to all", OrvixPromptAnswer::YesToAll},
                                                               {L"No to all", OrvixPromptAnswer::NoToAll}};
    for (const auto& [button, answer] : answers)
    {
        const auto click = [&](const DialogWindow& dialog) { dialog.Click(button); };
        EXPECT_EQ(ShowPrompt(OfferYesToAll | OfferNoToAll, click), answer) << button;
    }
}

TEST_F(PromptDialog, IsAnsweredByKeys)
{
    const auto press = [](WORD key) { return [key](const DialogWindow& dialog) { dialog.Press(key); }; };
    const auto alt = [](wchar_t key) { return [key](const DialogWindow& dialog) { dialog.PressAlt(key); }; };
    constexpr std::uint32_t All = OfferYesToAll | OfferNoToAll;
    EXPECT_EQ(ShowPrompt(All, press(VK_RETURN)), OrvixPromptAnswer::Yes);
    EXPECT_EQ(ShowPrompt(All, press(VK_ESCAPE)), OrvixPromptAnswer::No);
    EXPECT_EQ(ShowPrompt(OnlyOK, press(VK_ESCAPE)), OrvixPromptAnswer::Yes);
    EXPECT_EQ(ShowPrompt(All, alt(L'y')), OrvixPromptAnswer::Yes);
    EXPECT_EQ(ShowPrompt(All, alt(L'n')), OrvixPromptAnswer::No);
    EXPECT_EQ(ShowPrompt(All, alt(L'a')), OrvixPromptAnswer::YesToAll);
    EXPECT_EQ(ShowPrompt(All, alt(L'o')), OrvixPromptAnswer::NoToAll);
}

TEST_F(PromptDialog, AnswersNoWhenItIsClosed)
{
    EXPECT_EQ(ShowPrompt(0, [](const DialogWindow& dialog) { dialog.Close(); }), OrvixPromptAnswer::No);
}

TEST_F(PromptDialog, OffersTheButtonsThatItsOptionsName)
{
    const std::pair<std::uint32_t, Texts> offers[] = {
        {0, {L"Yes", L"No"}},
        {OfferYesToAll, {L"Yes", L"Yes to all", L"No"}},
        {OfferNoToAll, {L"Yes", L"No", L"No to all"}},
        {OfferYesToAll | OfferNoToAll, {L"Yes", L"Yes to all", L"No", L"No to all"}},
        {OnlyOK | OfferYesToAll | OfferNoToAll, {L"OK"}}};
    for (const auto& [options, buttons] : offers)
    {
        ShowPrompt(options, [&, expected = buttons](const DialogWindow& dialog) {
            EXPECT_EQ(dialog.Focused(), expected.front());
            EXPECT_EQ(dialog.Buttons(), expected);
            EXPECT_TRUE(dialog.Has(L"Open?"));
            EXPECT_FALSE(dialog.Has(L"Do not ask again"));
            dialog.Press(VK_ESCAPE);
        });
    }
}

TEST_F(PromptDialog, ReportsWhetherTheUserDoesNotWantToBeAskedAgain)
{
    for (const bool checked : {false, true})
    {
        bool dontAskAgain = !checked;
        const auto answer = ShowPrompt(
            OfferStopAsking,
            [checked](const DialogWindow& dialog) {
                if (checked)
                {
                    dialog.PressAlt(L'd');
                }
                dialog.Click(L"No");
            },
            OrvixPromptID::None, &dontAskAgain);
        EXPECT_EQ(answer, OrvixPromptAnswer::No);
        EXPECT_EQ(dontAskAgain, checked);
    }
}

TEST_F(PromptDialog, LetsTheAnswerBeStored)
{
    m_services->RegisterPrompt(7, L"Open?", OrvixPromptAction::Ask, 0, true);
    const auto answer = ShowPrompt(
        OfferStopAsking | OfferYesToAll,
        [](const DialogWindow& dialog) {
            dialog.Click(L"Do not ask again");
            dialog.Click(L"Yes to all");
        },
        7);
    EXPECT_EQ(answer, OrvixPromptAnswer::YesToAll);
    Restart();
    EXPECT_EQ(m_services->GetPromptAction(7), OrvixPromptAction::YesToAll);
}

TEST_F(PromptDialog, ShowsAnIconAndTheOneThatItsOptionsName)
{
    const auto iconOf = [this](std::uint32_t options) {
        LRESULT icon = 0;
        ShowPrompt(options, [&icon](const DialogWindow& dialog) {
            for (HWND control = GetWindow(dialog.Handle(), GW_CHILD); control != nullptr;
                 control = GetWindow(control, GW_HWNDNEXT))
            {
                if ((GetWindowLongW(control, GWL_STYLE) & SS_TYPEMASK) == SS_ICON && IsWindowVisible(control))
                {
                    icon = SendMessageW(control, STM_GETICON, 0, 0);
                }
            }
            dialog.Press(VK_ESCAPE);
        });
        return std::bit_cast<HICON>(icon);
    };
    EXPECT_EQ(iconOf(0), LoadIconW(nullptr, IDI_QUESTION));
    EXPECT_EQ(iconOf(OnlyOK), LoadIconW(nullptr, IDI_INFORMATION));
    EXPECT_EQ(iconOf(OrvixPromptOption::InformationIcon), LoadIconW(nullptr, IDI_INFORMATION));
    EXPECT_EQ(iconOf(OrvixPromptOption::WarningIcon), LoadIconW(nullptr, IDI_WARNING));
    EXPECT_EQ(iconOf(OrvixPromptOption::ErrorIcon), LoadIconW(nullptr, IDI_ERROR));
}

TEST_F(PromptDialog, IsHighEnoughForItsMessage)
{
    const auto heightOf = [this](const std::wstring& message) {
        LONG height = 0;
        ShowPrompt(
            0,
            [&](const DialogWindow& dialog) {
                const RECT place = dialog.Place(message);
                height = place.bottom - place.top;
                EXPECT_LE(place.bottom, dialog.Place(L"Yes").top);
                dialog.Press(VK_ESCAPE);
            },
            OrvixPromptID::None, nullptr, message);
        return height;
    };
    const LONG ten = heightOf(L"1\n2\n3\n4\n5\n6\n7\n8\n9\n10");
    const LONG twenty = heightOf(L"1\n2\n3\n4\n5\n6\n7\n8\n9\n10\n11\n12\n13\n14\n15\n16\n17\n18\n19\n20");
    EXPECT_NEAR(twenty, 2 * ten, 2);

    std::wstring lines;
    for (int i = 0; i < 300; ++i)
    {
        lines += L"line\n";
    }
    ShowPrompt(
        0,
        [](const DialogWindow& dialog) {
            EXPECT_EQ(dialog.Focused(), L"Yes") << "not the field that scrolls";
            dialog.Focus(L"Message:");
            dialog.Press(VK_NEXT);
            EXPECT_GT(SendMessageW(dialog.Control(L"Message:"), EM_GETFIRSTVISIBLELINE, 0, 0), 10);
            EXPECT_LE(dialog.Place(L"Message:").bottom, dialog.Place(L"Yes").top);
            dialog.Press(VK_RETURN);
        },
        OrvixPromptID::None, nullptr, lines);
}

} // namespace
