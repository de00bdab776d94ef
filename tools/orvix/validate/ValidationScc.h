#pragma once

#include "MSSCCI.h"
#include "ValidationLibrary.h"

#include <algorithm>
#include <array>
#include <string>

/// A text that an MSSCCI library may read and overwrite up to `Size` bytes, with guard bytes behind it and room enough
/// for what some libraries write too much.
template <std::size_t Size>
class GuardedText
{
public:
    GuardedText()
    {
        m_bytes.fill(Guard);
        Set("");
    }

    bool operator==(const GuardedText&) const = default;

    char* Get() { return m_bytes.data(); }

    /// Replaces the text, cut to what fits; the rest of its bytes are zeros.
    void Set(const std::string& text)
    {
        std::fill_n(m_bytes.begin(), Size, '\0');
        std::copy_n(text.begin(), std::min(text.size(), Size - 1), m_bytes.begin());
    }

    /// Throws `RuleBroken`, naming the text, when bytes behind it were written or it has lost its terminator.
    void Check(const std::string& name) const
    {
        const auto end = m_bytes.begin() + Size;
        if (std::any_of(end, m_bytes.end(), [](char byte) { return byte != Guard; }))
        {
            throw RuleBroken(name + " is written beyond its " + std::to_string(Size) + " bytes");
        }
        if (std::find(m_bytes.begin(), end, '\0') == end)
        {
            throw RuleBroken(name + " has no terminator in its " + std::to_string(Size) + " bytes");
        }
    }

private:
    static constexpr char Guard = '\x5A';
    static constexpr std::size_t Slack = 4096;

    std::array<char, Size + Slack> m_bytes;
};

/// The MSSCCI library under validation, called by its own functions. At the end it is closed and freed.
class ValidationScc
{
public:
    /// Throws `RuleSkipped` when the library does not load.
    explicit ValidationScc(ValidationSubject& subject) : m_subject(subject), m_library(subject) {}
    ValidationScc(const ValidationScc&) = delete;
    ValidationScc& operator=(const ValidationScc&) = delete;
    ~ValidationScc();

    const ValidationLibrary& Library() const { return m_library; }

    /// The result of a function. Throws `RuleSkipped` when the library lacks it, `RuleBroken` when the result is no
    /// code of the interface.
    template <typename Function, typename... Arguments>
    SCCRTN Call(const char* name, Arguments... arguments)
    {
        auto* const function = m_library.Need<Function>(name);
        const SCCRTN result = m_subject.Call(name, [&] { return function(arguments...); });
        if (m_noCode.empty() && (result < LowestCode || result > HighestCode))
        {
            m_noCode = std::string(name) + " gives " + std::to_string(result);
        }
        return result;
    }

    /// Starts the library. Throws `RuleSkipped` when it refuses.
    void Initialize();

    /// Opens the scratch project, a new one, in a started library; `output` may be null. Throws `RuleSkipped` when it
    /// refuses.
    void Open(LPTEXTOUTPROC output);

    /// `Initialize` and `Open`.
    void Begin(LPTEXTOUTPROC output);

    /// Closes what is open and ends what is started.
    void End();

    LPVOID Context() const { return m_context; }
    LONG Capabilities() const { return m_capabilities; }

    /// Throws `RuleBroken` when a result so far was no code of the interface.
    void CheckCodes() const;

    /// Throws `RuleBroken` when one of the texts so far went beyond its limit.
    void CheckTexts() const;

    /// Throws `RuleBroken` when SccOpenProject has written to a text that it only reads.
    void CheckInputTexts() const;

    /// The path of a project's file. Throws `RuleSkipped` when the ANSI code page does not carry it.
    static std::string Narrow(const std::wstring& path);

private:
    static constexpr SCCRTN LowestCode = -31; // SCC_E_BACKGROUNDGETINPROGRESS
    static constexpr SCCRTN HighestCode = SCC_I_SHARESUBPROJOK;

    SCCRTN TryToOpen(LPTEXTOUTPROC output);

    ValidationSubject& m_subject;
    ValidationLibrary m_library;
    LPVOID m_context = nullptr;
    LONG m_capabilities = 0;
    bool m_initialized = false;
    bool m_open = false;
    bool m_inputTextsKept = true;
    std::string m_noCode; ///< the first such result, in words
    GuardedText<SCC_NAME_SIZE> m_name;
    GuardedText<SCC_AUXLABEL_SIZE> m_auxPathLabel;
    GuardedText<SCC_USER_SIZE> m_user;
    GuardedText<SCC_PRJPATH_SIZE> m_projectName;
    GuardedText<MAX_PATH> m_localPath;
    GuardedText<SCC_PRJPATH_SIZE> m_auxPath;
};
