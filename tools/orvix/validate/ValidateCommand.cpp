#include "ValidateCommand.h"

#include "FilePath.h"
#include "Terminal.h"
#include "TextOutput.h"
#include "ValidationProcess.h"

#include <nlohmann/json.hpp>

#include <array>
#include <chrono>
#include <iomanip>
#include <iostream>
#include <vector>

namespace
{

using Verdict = ValidationResult::Verdict;

const char* InWords(Verdict verdict)
{
    return verdict == Verdict::Pass ? "pass" : verdict == Verdict::Fail ? "fail" : "skip";
}

Listing::Tone ToneOf(Verdict verdict)
{
    return verdict == Verdict::Pass   ? Listing::Tone::Good
           : verdict == Verdict::Fail ? Listing::Tone::Bad
                                      : Listing::Tone::Quiet;
}

/// One after the other as they come: a rule may take its time.
class Lines
{
public:
    explicit Lines(const OutputStyle& style) : m_style(style), m_output(std::cout, style) {}

    void Begin(const ValidationRule& rule, std::size_t number, std::size_t count)
    {
        m_output.Progress(L"checking " + Wide(rule.name) + L", " + std::to_wstring(number) + L" of " +
                          std::to_wstring(count));
    }

    void Add(const ValidationRule& rule, const ValidationResult& result)
    {
        m_output.Progress({});
        std::cout << m_style.Painted(InWords(result.verdict), ToneOf(result.verdict)) << "  " << std::left
                  << std::setw(16) << rule.name << (result.reason.empty() ? rule.demand : result.reason) << std::endl;
    }

    void End(int passed, int failed, int skipped)
    {
        std::cout << passed + failed + skipped << " rules, " << passed << " passed, " << failed << " failed, "
                  << skipped << " skipped\n";
    }

private:
    OutputStyle m_style;
    TextOutput m_output; ///< of the progress
};

/// One document at the end.
class Document
{
public:
    Document(const std::wstring& library, bool isMSSCCI)
        : m_document{{"library", Utf8(library)}, {"kind", isMSSCCI ? "msscci" : "plugin"}}
    {
        m_document["rules"] = nlohmann::ordered_json::array();
    }

    void Begin(const ValidationRule&, std::size_t, std::size_t) {}

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
    if (m_commandLine.json)
    {
        Document document(library, m_commandLine.msscci);
        return Run(library, document);
    }
    const Terminal terminal;
    Lines lines(terminal.Style(m_commandLine.noColor));
    return Run(library, lines);
}

template <typename Report>
ExitCode ValidateCommand::Run(const std::wstring& library, Report& report)
{
    const unsigned int kind = m_commandLine.msscci ? ValidationRule::MSSCCI : ValidationRule::Plugin;
    const ValidationProcess process(library, m_commandLine.msscci, std::chrono::seconds(m_commandLine.timeout));
    std::vector<const ValidationRule*> rules;
    for (const ValidationRule& rule : ValidationRule::All())
    {
        if ((rule.kinds & kind) != 0)
        {
            rules.push_back(&rule);
        }
    }
    std::array<int, 3> counts{};
    for (std::size_t i = 0; i < rules.size(); ++i)
    {
        const ValidationRule& rule = *rules[i];
        report.Begin(rule, i + 1, rules.size());
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
