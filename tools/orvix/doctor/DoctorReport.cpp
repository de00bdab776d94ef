#include "DoctorReport.h"

#include "Remedies.h"
#include "Text.h"

#include <nlohmann/json.hpp>

#include <algorithm>

namespace
{

using Json = nlohmann::ordered_json; // the guide shows the members in this order

std::size_t CountProblems(const DoctorReport::Subject& subject)
{
    return static_cast<std::size_t>(std::count_if(subject.findings.begin(), subject.findings.end(),
                                                  [](const auto& finding) { return finding.isProblem; }));
}

void PrintFindings(std::ostream& stream, const DoctorReport::Subject& subject, const OutputStyle& style)
{
    for (const DoctorReport::Finding& finding : subject.findings)
    {
        const std::string severity = finding.isProblem ? style.Coloured("problem", Listing::Tone::Bad)
                                                       : style.Coloured("note", Listing::Tone::Quiet);
        const std::string place = finding.line == 0 ? ""
                                                    : " (line " + std::to_string(finding.line) + ", column " +
                                                          std::to_string(finding.column) + ")";
        style.PrintLine(stream, "  " + severity + place + ": " + Printable(finding.text) + " [" + finding.code + "]");
        const DoctorReport::Finding* const next = &finding + 1;
        const bool isLastOfKind = &finding == &subject.findings.back() || next->code != finding.code;
        if (const std::string_view remedy = RemedyFor(finding.code); isLastOfKind && !remedy.empty())
        {
            style.PrintLine(stream, "    " + std::string(remedy));
        }
    }
}

void PrintCandidate(std::ostream& stream, const DoctorReport::Candidate& candidate, const OutputStyle& style)
{
    const std::string name = candidate.name ? '"' + Printable(*candidate.name) + '"' : "";
    style.PrintLine(stream, candidate.kind + ": " + Printable(candidate.location));
    style.PrintLine(stream, candidate.listed ? "  " + style.Coloured("listed", Listing::Tone::Good) + " as " + name
                                             : "  not listed" + (name.empty() ? "" : " (" + name + ")"));
    if (candidate.contractVersion)
    {
        style.PrintLine(stream, "  contract version " + std::to_string(*candidate.contractVersion));
    }
    if (candidate.library)
    {
        style.PrintLine(stream, "  library " + Printable(*candidate.library));
    }
    PrintFindings(stream, candidate, style);
}

Json ToJson(const DoctorReport::Subject& subject)
{
    Json findings = Json::array();
    for (const DoctorReport::Finding& finding : subject.findings)
    {
        findings.push_back({{"code", finding.code},
                            {"severity", finding.isProblem ? "problem" : "note"},
                            {"text", Utf8(finding.text)},
                            {"remedy", RemedyFor(finding.code)},
                            {"line", finding.line != 0 ? Json(finding.line) : Json()},
                            {"column", finding.line != 0 ? Json(finding.column) : Json()}});
    }
    return {{"kind", subject.kind}, {"location", Utf8(subject.location)}, {"findings", std::move(findings)}};
}

Json ToJson(const DoctorReport::Candidate& candidate)
{
    Json json = ToJson(static_cast<const DoctorReport::Subject&>(candidate));
    json["name"] = candidate.name ? Json(Utf8(*candidate.name)) : Json();
    json["listed"] = candidate.listed;
    json["library"] = candidate.library ? Json(Utf8(*candidate.library)) : Json();
    json["contractVersion"] = candidate.contractVersion ? Json(*candidate.contractVersion) : Json();
    return json;
}

std::string Counted(std::size_t count, const char* what)
{
    return std::to_string(count) + " " + what + (count == 1 ? "" : "s");
}

} // namespace

std::size_t DoctorReport::NumListed() const
{
    return static_cast<std::size_t>(std::count_if(candidates.begin(), candidates.end(),
                                                  [](const Candidate& candidate) { return candidate.listed; }));
}

std::size_t DoctorReport::NumProblems() const
{
    std::size_t count = 0;
    for (const Subject& subject : locations)
    {
        count += CountProblems(subject);
    }
    for (const Candidate& candidate : candidates)
    {
        count += CountProblems(candidate);
    }
    return count;
}

void DoctorReport::PrintText(std::ostream& stream, const OutputStyle& style) const
{
    for (const Subject& subject : locations)
    {
        style.PrintLine(stream, subject.kind + ": " + Printable(subject.location));
        PrintFindings(stream, subject, style);
    }
    for (const Candidate& candidate : candidates)
    {
        PrintCandidate(stream, candidate, style);
    }
    style.PrintLine(stream, Counted(candidates.size(), "candidate") + ", " + std::to_string(NumListed()) + " listed, " +
                                Counted(NumProblems(), "problem"));
}

void DoctorReport::PrintJson(std::ostream& stream) const
{
    Json report = {{"places", Json::array()}, {"candidates", Json::array()}};
    for (const Subject& subject : locations)
    {
        report["places"].push_back(ToJson(subject));
    }
    for (const Candidate& candidate : candidates)
    {
        report["candidates"].push_back(ToJson(candidate));
    }
    report["summary"] = {{"candidates", candidates.size()}, {"listed", NumListed()}, {"problems", NumProblems()}};
    stream << report.dump(2) << '\n';
}
