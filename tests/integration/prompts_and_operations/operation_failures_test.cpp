#include "OperationTest.h"

#include <windows.h>

#include <comdef.h>

#include <functional>
#include <stdexcept>
#include <vector>

namespace
{

/// Nothing that a host, a plug-in or a dialog does wrong reaches the host as an exception.
class OperationFailures : public OperationTest
{
protected:
    OperationFailures() { AddFile(L"a"); }

    std::int32_t RunAll()
    {
        return m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider, Notify | CheckIn, 0xFFFFFFFF);
    }

    /// The object still does its work.
    void ExpectUsable()
    {
        m_provider.onCall = nullptr;
        m_listener.onNotify = nullptr;
        m_onDialog = nullptr;
        m_host.onUnattended = nullptr;
        m_params.SetDialogPromptID(-1);
        m_params.SetOptions(0);
        m_log.clear();
        EXPECT_EQ(RunAll(), 1);
        EXPECT_EQ(m_log, (Lines{"QueryStatus [a] 0", "Notify 13 [a]", "Dialog [a] 1", "Notify 27 [a]",
                                "CheckIn [a] comment 0", "Notify 14 [a]"}));
    }

    const std::vector<std::function<void()>> m_exceptions = {[] { throw std::runtime_error("foreign"); },
                                                             [] { throw 1; }, [] { throw std::bad_alloc(); },
                                                             [] { throw _com_error(E_FAIL); }};
};

TEST_F(OperationFailures, AProviderThatThrowsEndsTheOperationWithZero)
{
    for (const auto& fail : m_exceptions)
    {
        for (const char* failing : {"QueryStatus", "CheckIn"})
        {
            m_provider.onCall = [&](const std::string& operation, OrvixFileList&) {
                if (operation == failing)
                {
                    fail();
                }
            };
            EXPECT_EQ(RunAll(), 0) << failing;
            ExpectUsable();
        }
    }
}

TEST_F(OperationFailures, AListenerThatThrowsEndsTheOperationWithZero)
{
    for (const auto& fail : m_exceptions)
    {
        for (const std::uint32_t id : {13U, 27U, 14U})
        {
            m_listener.onNotify = [&](OrvixNotifyParams& params) {
                if (params.GetID() == id)
                {
                    fail();
                }
                return 0;
            };
            EXPECT_EQ(RunAll(), 0) << id;
            ExpectUsable();
        }
    }
}

TEST_F(OperationFailures, ADialogThatThrowsEndsTheOperationWithZero)
{
    for (const auto& fail : m_exceptions)
    {
        m_onDialog = [&](OrvixFileListDialogParams&) { fail(); };
        EXPECT_EQ(RunAll(), 0);
        ExpectUsable();
    }
}

TEST_F(OperationFailures, ADialogThatThrowsIsNoAnswerToRemember)
{
    m_params.SetDialogPromptID(DialogPrompt);
    AddPrompt(DialogPrompt, Ask);
    m_params.SetOptions(Remember);
    m_onDialog = [](OrvixFileListDialogParams&) { throw std::runtime_error("dialog"); };
    EXPECT_EQ(Run(CheckIn), 0);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Ask);
}

TEST_F(OperationFailures, AHostThatThrowsEndsTheOperationWithZero)
{
    AddPrompt(DialogPrompt, Ask | AnswerOne);
    for (const auto& fail : m_exceptions)
    {
        m_params.SetDialogPromptID(DialogPrompt);
        m_host.onUnattended = fail;
        EXPECT_EQ(RunAll(), 0);
        EXPECT_EQ(m_services->ShowPrompt(nullptr, nullptr, nullptr, 0, DialogPrompt, nullptr), 0);
        ExpectUsable();
    }
}

TEST_F(OperationFailures, ARecordThatIsMissingIsCancelledAtOnce)
{
    for (const bool callProviderFirst : {false, true})
    {
        EXPECT_EQ(m_services->RunFileListOperation(nullptr, nullptr, callProviderFirst, &m_provider, Notify | CheckIn,
                                                   Controlled),
                  0);
    }
    EXPECT_TRUE(m_log.empty());
}

TEST_F(OperationFailures, ARecordWithoutAListIsCancelledAtOnce)
{
    m_params.SetOrvixFileList(nullptr);
    EXPECT_EQ(RunAll(), 0);
    EXPECT_TRUE(m_log.empty());
}

TEST_F(OperationFailures, AProviderThatIsMissingIsCancelledAtOnceWhereItWouldBeCalled)
{
    EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, true, nullptr, 0, Controlled), 0);
    for (const std::uint32_t operation : {CheckIn, Add, GetLatest, CheckOut, UndoCheckOut})
    {
        EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, false, nullptr, Notify | operation, Controlled),
                  0);
    }
    EXPECT_TRUE(m_log.empty());
    EXPECT_EQ(ActiveNames(&m_list), "[a]");
}

TEST_F(OperationFailures, AProviderThatIsMissingDoesNoHarmWhereNothingIsAskedOfIt)
{
    EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, false, nullptr, 0, Controlled), 1);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] 1"}));
}

} // namespace
