#pragma once

#include "MSSCCI.h"
#include "SccFunctions.h"
#include "ValidationLibrary.h"

#include <algorithm>
#include <array>
#include <string>

/// A text that an MSSCCI library may read, and overwrite up to `Size` bytes. Guard bytes follow it, enough for
/// libraries that write too much.
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

    /// Replaces the text, cut to what fits. The rest of its bytes are zeros.
    void Set(const std::string& text)
    {
        std::fill_n(m_bytes.begin(), Size, '\0');
        std::copy_n(text.begin(), std::min(text.size(), Size - 1), m_bytes.begin());
    }

    /// Throws `RuleBroken` with the name of the text when a guard byte was written, or when the text has no terminator.
    void Check(const std::string& name) const
    {
        const auto end = m_bytes.begin() + Size;
        if (std::any_of(end, m_bytes.end(), [](char guard) { return guard != Guard; }))
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
    static constexpr std::size_t GuardBytes = 4096;

    std::array<char, Size + GuardBytes> m_bytes;
};

/// The MSSCCI library under validation, called by its own functions. At the end its project is closed and it is ended
/// and unloaded.
class ValidationScc
{
public:
    /// `subject` must outlive this object. Throws `RuleSkipped` when the library does not load.
    explicit ValidationScc(ValidationSubject& subject) : m_subject(subject), m_library(subject) {}
    ValidationScc(const ValidationScc&) = delete;
    ValidationScc& operator=(const ValidationScc&) = delete;
    ~ValidationScc();

    const ValidationLibrary& Library() const { return m_library; }

    /// Calls a function and returns its result. Throws `RuleSkipped` when the library does not export it, and
    /// `RuleBroken` for an exception.
    template <typename Function, typename... Arguments>
    SCCRTN Call(const SccFunction<Function>& function, Arguments... arguments)
    {
        auto* const exported = m_library.Need<Function>(function.name);
        const SCCRTN result = m_subject.Call(function.name, [&] { return exported(arguments...); });
        if (m_firstInvalidCode.empty() && (result < LowestCode || result > HighestCode))
        {
            m_firstInvalidCode = std::string(function.name) + " returns " + std::to_string(result);
        }
        return result;
    }

    /// Starts the library. Throws `RuleSkipped` when it fails.
    void Initialize();

    /// Opens the scratch project as a new project; the library is started. `output` may be null. Throws `RuleSkipped`
    /// when it fails.
    void Open(LPTEXTOUTPROC output);

    /// `Initialize` and `Open`.
    void Begin(LPTEXTOUTPROC output);

    /// Closes the project and ends the library, as far as they are open and started.
    void End();

    LPVOID Context() const { return m_context; }
    LONG Capabilities() const { return m_capabilities; }

    /// Throws `RuleBroken` when a function has returned what is no code of the interface.
    void CheckCodes() const;

    /// Throws `RuleBroken` when the library has written a text beyond its limit.
    void CheckTexts() const;

    /// Throws `RuleBroken` when SccOpenProject has written to a text that it may only read.
    void CheckInputTexts() const;

    /// A path of the project in the ANSI code page. Throws `RuleSkipped` when the code page does not have one of its
    /// characters.
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
    bool m_inputTextsUnchanged = true;
    std::string m_firstInvalidCode; // as a message; empty for none
    GuardedText<SCC_NAME_SIZE> m_name;
    GuardedText<SCC_AUXLABEL_SIZE> m_auxPathLabel;
    GuardedText<SCC_USER_SIZE> m_user;
    GuardedText<SCC_PRJPATH_SIZE> m_projectName;
    GuardedText<MAX_PATH> m_localPath;
    GuardedText<SCC_PRJPATH_SIZE> m_auxPath;
};
