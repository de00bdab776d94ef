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

/// In the order of the verdicts.
constexpr struct
{
    const char* words;
    Listing::Tone tone;
} VerdictTexts[] = {
    {"pass", Listing::Tone::Good},
    {"fail", Listing::Tone::Bad},
    {"skip", Listing::Tone::Quiet},
};

const auto& TextOf(const ValidationResult& result)
{
    return VerdictTexts[static_cast<std::size_t>(result.verdict)];
}

/// How many rules have each verdict.
class VerdictCounts
{
public:
    void Add(Verdict verdict) { ++m_counts.at(static_cast<std::size_t>(verdict)); }
    int Get(Verdict verdict) const { return m_counts.at(static_cast<std::size_t>(verdict)); }
    int Total() const { return Get(Verdict::Pass) + Get(Verdict::Fail) + Get(Verdict::Skip); }

private:
    std::array<int, std::size(VerdictTexts)> m_counts{};
};

/// Prints each result when it arrives: a rule may take long.
class TextReport
{
public:
    explicit TextReport(const OutputStyle& style) : m_style(style), m_output(std::cout, style) {}

    void Begin(const ValidationRule& rule, std::size_t number, std::size_t count)
    {
        m_output.Progress(L"checking " + Wide(rule.name) + L", " + std::to_wstring(number) + L" of " +
                          std::to_wstring(count));
    }

    void Add(const ValidationRule& rule, const ValidationResult& result)
    {
        m_output.Progress({});
        std::cout << m_style.Coloured(TextOf(result).words, TextOf(result).tone) << "  " << std::left << std::setw(16)
                  << rule.name << (result.reason.empty() ? rule.requirement : result.reason) << std::endl;
    }

    void End(const VerdictCounts& counts)
    {
        std::cout << counts.Total() << " rules, " << counts.Get(Verdict::Pass) << " passed, "
                  << counts.Get(Verdict::Fail) << " failed, " << counts.Get(Verdict::Skip) << " skipped\n";
    }

private:
    OutputStyle m_style;
    TextOutput m_output; // of the progress
};

/// Prints one JSON document at the end.
class JsonReport
{
public:
    JsonReport(const std::wstring& library, bool isMSSCCI)
        : m_document{{"library", Utf8(library)}, {"kind", isMSSCCI ? "msscci" : "plugin"}}
    {
        m_document["rules"] = nlohmann::ordered_json::array();
    }

    void Begin(const ValidationRule&, std::size_t, std::size_t) {}

    void Add(const ValidationRule& rule, const ValidationResult& result)
    {
        m_document["rules"].push_back({{"name", rule.name},
                                       {"demand", rule.requirement},
                                       {"result", TextOf(result).words},
                                       {"reason", result.reason}});
    }

    void End(const VerdictCounts& counts)
    {
        m_document["passed"] = counts.Get(Verdict::Pass);
        m_document["failed"] = counts.Get(Verdict::Fail);
        m_document["skipped"] = counts.Get(Verdict::Skip);
        std::cout << m_document.dump(2) << '\n';
    }

private:
    nlohmann::ordered_json m_document;
};

std::vector<const ValidationRule*> RulesOf(unsigned int kind)
{
    std::vector<const ValidationRule*> rules;
    for (const ValidationRule& rule : ValidationRule::All())
    {
        if ((rule.kinds & kind) != 0)
        {
            rules.push_back(&rule);
        }
    }
    return rules;
}

template <typename Report>
ExitCode CheckRules(const CommandLine& commandLine, const std::wstring& library, Report& report)
{
    ValidationProcess process(library, commandLine.msscci, *commandLine.timeout, commandLine.project);
    const std::vector<const ValidationRule*> rules =
        RulesOf(commandLine.msscci ? ValidationRule::MSSCCI : ValidationRule::Plugin);
    VerdictCounts counts;
    for (std::size_t i = 0; i < rules.size(); ++i)
    {
        const ValidationRule& rule = *rules[i];
        report.Begin(rule, i + 1, rules.size());
        const ValidationResult result =
            rule.showsDialogs && !commandLine.dialogs
                ? ValidationResult{Verdict::Skip, "it may show windows: checked with --dialogs"}
                : process.Check(rule);
        counts.Add(result.verdict);
        report.Add(rule, result);
    }
    report.End(counts);
    return counts.Get(Verdict::Fail) == 0 ? ExitCode::Success : ExitCode::Failed;
}

} // namespace

ExitCode RunValidate(const CommandLine& commandLine)
{
    const std::wstring library = FullPath(commandLine.paths.front());
    if (!PathExists(library) || IsFolder(library))
    {
        throw ToolError(ExitCode::NotFound, L"no such library: " + library);
    }
    if (!commandLine.project.empty() && !IsFolder(commandLine.project))
    {
        throw ToolError(ExitCode::NotFound, L"no such project folder: " + commandLine.project);
    }
    if (commandLine.json)
    {
        JsonReport report(library, commandLine.msscci);
        return CheckRules(commandLine, library, report);
    }
    const Terminal terminal;
    TextReport report(terminal.Style(commandLine.noColor));
    return CheckRules(commandLine, library, report);
}
