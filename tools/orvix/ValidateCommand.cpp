#include "ValidateCommand.h"

#include "FilePath.h"
#include "ValidationProcess.h"

#include <nlohmann/json.hpp>

#include <array>
#include <chrono>
#include <iomanip>
#include <iostream>

namespace
{
using Verdict = ValidationResult::Verdict;

const char* InWords(Verdict verdict)
{
    return verdict == Verdict::Pass ? "pass" : verdict == Verdict::Fail ? "fail" : "skip";
}

/// One after the other as they come: a rule may take its time.
class Lines
{
public:
    void Add(const ValidationRule& rule, const ValidationResult& result)
    {
        std::cout << std::left << std::setw(6) << InWords(result.verdict) << std::setw(16) << rule.name
                  << (result.reason.empty() ? rule.demand : result.reason) << std::endl;
    }

    void End(int passed, int failed, int skipped)
    {
        std::cout << passed + failed + skipped << " rules, " << passed << " passed, " << failed << " failed, "
                  << skipped << " skipped\n";
    }
};

/// One document at the end.
class Document
{
public:
    Document(const std::wstring& library, bool isMSSCCI)
        : m_document{{"library", Utf8(library)}, {"kind", isMSSCCI ? "mssccci" : "plugin"}}
    {
        m_document["rules"] = nlohmann::ordered_json::array();
    }

    void Add(const ValidationRule& rule, const ValidationResult& result)
    {
        m_document["rules"].push_back({{"name", rule.name},
                                       {"demand", rule.demand},
                                       {"result", InWords(result.verdict)},
                                       {"reason", result.reason}});
    }

    void End(int passed, int failed, int skipped)
    {
        m_document["passed"] = passed;
        m_document["failed"] = failed;
        m_document["skipped"] = skipped;
        std::cout << m_document.dump(2) << '\n';
    }

private:
    nlohmann::ordered_json m_document;
};
} // namespace

ExitCode ValidateCommand::Run()
{
    const std::wstring library = FullPath(m_commandLine.paths.front());
    if (!PathExists(library) || IsFolder(library))
    {
        throw ToolError(ExitCode::NoProject, L"no such library: " + library);
    }
    return m_commandLine.json ? Run(library, Document(library, m_commandLine.mssccci)) : Run(library, Lines());
}

template <class Report>
ExitCode ValidateCommand::Run(const std::wstring& library, Report report)
{
    const unsigned int kind = m_commandLine.mssccci ? ValidationRule::MSSCCI : ValidationRule::Plugin;
    const ValidationProcess process(library, m_commandLine.mssccci, std::chrono::seconds(m_commandLine.timeout));
    std::array<int, 3> counts{};
    for (const ValidationRule& rule : ValidationRule::All())
    {
        if ((rule.kinds & kind) == 0)
        {
            continue;
        }
        const ValidationResult result =
            rule.showsDialogs && !m_commandLine.dialogs
                ? ValidationResult{Verdict::Skip, "it may show windows: checked with --dialogs"}
                : process.Check(rule);
        ++counts.at(static_cast<std::size_t>(result.verdict));
        report.Add(rule, result);
    }
    report.End(counts[0], counts[1], counts[2]);
    return counts[1] == 0 ? ExitCode::Success : ExitCode::Failed;
}
