#include "ValidationScc.h"

#include "CStr.h"
#include "WStr.h"

#include <utility>

ValidationScc::~ValidationScc()
{
    try
    {
        End();
    }
    catch (const std::exception&) // a rule that calls these functions itself reports it
    {
    }
}

void ValidationScc::Initialize()
{
    LONG checkoutCommentLength = 0;
    LONG commentLength = 0;
    const SCCRTN result = Call(SccFunctions::Initialize, &m_context, nullptr, "orvix", m_name.Get(), &m_capabilities,
                               m_auxPathLabel.Get(), &checkoutCommentLength, &commentLength);
    if (result != SCC_OK)
    {
        throw RuleSkipped("SccInitialize returns " + std::to_string(result));
    }
    m_initialized = true;
}

void ValidationScc::Begin(LPTEXTOUTPROC output)
{
    Initialize();
    Open(output);
}

void ValidationScc::End()
{
    if (std::exchange(m_open, false))
    {
        Call(SccFunctions::CloseProject, m_context);
    }
    if (std::exchange(m_initialized, false))
    {
        Call(SccFunctions::Uninitialize, m_context);
    }
}

void ValidationScc::Open(LPTEXTOUTPROC output)
{
    m_localPath.Set(Narrow(m_subject.Project()));
    SCCRTN result = TryToOpen(output);
    if (result == SCC_E_PROJSYNTAXERR && m_library.Has(SccFunctions::GetProjPath.name))
    {
        BOOL isNew = TRUE;
        result = Call(SccFunctions::GetProjPath, m_context, nullptr, m_user.Get(), m_projectName.Get(),
                      m_localPath.Get(), m_auxPath.Get(), FALSE, &isNew);
        result = result == SCC_OK ? TryToOpen(output) : result;
    }
    if (result != SCC_OK)
    {
        throw RuleSkipped("SccOpenProject returns " + std::to_string(result) + " for the scratch project");
    }
    m_open = true;
}

SCCRTN ValidationScc::TryToOpen(LPTEXTOUTPROC output)
{
    const auto localPath = m_localPath;
    const SCCRTN result = Call(SccFunctions::OpenProject, m_context, nullptr, m_user.Get(), m_projectName.Get(),
                               m_localPath.Get(), m_auxPath.Get(), "validation", output, SCC_OP_CREATEIFNEW);
    m_inputTextsUnchanged = m_inputTextsUnchanged && m_localPath == localPath; // the project name may be written
    return result;
}

void ValidationScc::CheckInputTexts() const
{
    if (!m_inputTextsUnchanged)
    {
        throw RuleBroken("SccOpenProject writes to the local path");
    }
}

void ValidationScc::CheckCodes() const
{
    if (!m_firstInvalidCode.empty())
    {
        throw RuleBroken(m_firstInvalidCode);
    }
}

void ValidationScc::CheckTexts() const
{
    m_name.Check("the library's name");
    m_auxPathLabel.Check("the label of the auxiliary path");
    m_user.Check("the user");
    m_projectName.Check("the project name");
    m_localPath.Check("the local path");
    m_auxPath.Check("the auxiliary path");
}

std::string ValidationScc::Narrow(const std::wstring& path)
{
    const CStr narrow(path.c_str());
    const WStr back(narrow.Get());
    if (narrow.Get() == nullptr || back.Get() == nullptr || back.Get() != path)
    {
        throw RuleSkipped("the ANSI code page does not have a character of the scratch project's path");
    }
    return narrow.Get();
}
