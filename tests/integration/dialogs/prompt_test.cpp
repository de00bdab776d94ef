#include "DialogsTest.h"

#include <bit>

namespace
{

class PromptDialog : public DialogsTest
{
protected:
    static constexpr std::uint32_t YesToAll = 0x2;
    static constexpr std::uint32_t NoToAll = 0x4;
    static constexpr std::uint32_t OnlyOk = 0x1;
    static constexpr std::uint32_t DoNotAsk = 0x100;
};

TEST_F(PromptDialog, GivesTheAnswerOfItsButtons)
{
    const std::pair<const wchar_t*, std::int32_t> answers[] = {
        {L"Yes", 1}, {L"No", 0}, {L"Yes to all", 2}, {L"No to all", 3}};
    for (const auto& [button, answer] : answers)
    {
        const auto click = [&](const DialogWindow& dialog) { dialog.Click(button); };
        EXPECT_EQ(ShowPrompt(YesToAll | NoToAll, click), answer) << button;
    }
}

TEST_F(PromptDialog, IsAnsweredByKeys)
{
    const auto press = [](WORD key) { return [key](const DialogWindow& dialog) { dialog.Press(key); }; };
    const auto alt = [](wchar_t key) { return [key](const DialogWindow& dialog) { dialog.PressAlt(key); }; };
    constexpr std::uint32_t All = YesToAll | NoToAll;
    EXPECT_EQ(ShowPrompt(All, press(VK_RETURN)), 1);
    EXPECT_EQ(ShowPrompt(All, press(VK_ESCAPE)), 0);
    EXPECT_EQ(ShowPrompt(OnlyOk, press(VK_ESCAPE)), 1);
    EXPECT_EQ(ShowPrompt(All, alt(L'y')), 1);
    EXPECT_EQ(ShowPrompt(All, alt(L'n')), 0);
    EXPECT_EQ(ShowPrompt(All, alt(L'a')), 2);
    EXPECT_EQ(ShowPrompt(All, alt(L'o')), 3);
}

TEST_F(PromptDialog, AnswersNoWhenItIsClosed)
{
    EXPECT_EQ(ShowPrompt(0, [](const DialogWindow& dialog) { dialog.Close(); }), 0);
}

TEST_F(PromptDialog, OffersTheButtonsThatItsOptionsName)
{
    const std::pair<std::uint32_t, Texts> offers[] = {
        {0, {L"Yes", L"No"}},
        {YesToAll, {L"Yes", L"Yes to all", L"No"}},
        {NoToAll, {L"Yes", L"No", L"No to all"}},
        {YesToAll | NoToAll, {L"Yes", L"Yes to all", L"No", L"No to all"}},
        {OnlyOk | YesToAll | NoToAll, {L"OK"}}};
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
    for (const bool ticked : {false, true})
    {
        bool dontAskAgain = !ticked;
        const auto answer = ShowPrompt(
            DoNotAsk,
            [ticked](const DialogWindow& dialog) {
                if (ticked)
                {
                    dialog.PressAlt(L'd');
                }
                dialog.Click(L"No");
            },
            NoPrompt, &dontAskAgain);
        EXPECT_EQ(answer, 0);
        EXPECT_EQ(dontAskAgain, ticked);
    }
}

TEST_F(PromptDialog, LetsTheAnswerBeStored)
{
    m_services->RegisterPrompt(7, L"Open?", 0x1, 0, true);
    const auto answer = ShowPrompt(
        DoNotAsk | YesToAll,
        [](const DialogWindow& dialog) {
            dialog.Click(L"Do not ask again");
            dialog.Click(L"Yes to all");
        },
        7);
    EXPECT_EQ(answer, 2);
    Restart();
    EXPECT_EQ(m_services->GetPromptAction(7), 0x8U);
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
    EXPECT_EQ(iconOf(0x00), LoadIconW(nullptr, IDI_QUESTION));
    EXPECT_EQ(iconOf(OnlyOk), LoadIconW(nullptr, IDI_INFORMATION));
    EXPECT_EQ(iconOf(0x10), LoadIconW(nullptr, IDI_INFORMATION));
    EXPECT_EQ(iconOf(0x20), LoadIconW(nullptr, IDI_WARNING));
    EXPECT_EQ(iconOf(0x30), LoadIconW(nullptr, IDI_ERROR));
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
            NoPrompt, nullptr, message);
        return height;
    };
    const LONG ten = heightOf(L"1\n2\n3\n4\n5\n6\n7\n8\n9\n10");
    const LONG twenty = heightOf(L"1\n2\n3\n4\n5\n6\n7\n8\n9\n10\n11\n12\n13\n14\n15\n16\n17\n18\n19\n20");
    EXPECT_NEAR(twenty, 2 * ten, 2);
}

} // namespace
