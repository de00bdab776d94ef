#include "DoctorReport.h"

#include "Text.h"

#include <nlohmann/json.hpp>

#include <algorithm>

namespace
{

using Json = nlohmann::ordered_json; // in the order in which the guide names the members

std::size_t CountProblems(const DoctorReport::Place& place)
{
    return static_cast<std::size_t>(std::count_if(place.findings.begin(), place.findings.end(),
                                                  [](const auto& finding) { return finding.isProblem; }));
}

void PrintFindings(std::ostream& stream, const DoctorReport::Place& place, const OutputStyle& style)
{
    for (const DoctorReport::Finding& finding : place.findings)
    {
        const std::string severity = finding.isProblem ? style.Painted("problem", Listing::Tone::Bad)
                                                       : style.Painted("note", Listing::Tone::Quiet);
        style.PrintLine(stream, "  " + severity + ": " + Printable(finding.text) + " [" + finding.code + "]");
    }
}

Json ToJson(const DoctorReport::Place& place)
{
    Json findings = Json::array();
    for (const DoctorReport::Finding& finding : place.findings)
    {
        findings.push_back({{"code", finding.code},
                            {"severity", finding.isProblem ? "problem" : "note"},
                            {"text", Utf8(finding.text)}});
    }
    return {{"kind", place.kind}, {"location", Utf8(place.location)}, {"findings", std::move(findings)}};
}

Json ToJson(const DoctorReport::Candidate& candidate)
{
    Json json = ToJson(static_cast<const DoctorReport::Place&>(candidate));
    json["name"] = candidate.name ? Json(Utf8(*candidate.name)) : Json();
    json["listed"] = candidate.listed;
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
    for (const Place& place : places)
    {
        count += CountProblems(place);
    }
    for (const Candidate& candidate : candidates)
    {
        count += CountProblems(candidate);
    }
    return count;
}

void DoctorReport::PrintText(std::ostream& stream, const OutputStyle& style) const
{
    for (const Place& place : places)
    {
        style.PrintLine(stream, place.kind + ": " + Printable(place.location));
        PrintFindings(stream, place, style);
    }
    for (const Candidate& candidate : candidates)
    {
        const std::string name = candidate.name ? '"' + Printable(*candidate.name) + '"' : "";
        style.PrintLine(stream, candidate.kind + ": " + Printable(candidate.location));
        style.PrintLine(stream, candidate.listed ? "  " + style.Painted("listed", Listing::Tone::Good) + " as " + name
                                                 : "  not listed" + (name.empty() ? "" : " (" + name + ")"));
        if (candidate.contractVersion)
        {
            style.PrintLine(stream, "  contract version " + std::to_string(*candidate.contractVersion));
        }
        PrintFindings(stream, candidate, style);
    }
    style.PrintLine(stream, Counted(candidates.size(), "candidate") + ", " + std::to_string(NumListed()) + " listed, " +
                                Counted(NumProblems(), "problem"));
}

void DoctorReport::PrintJson(std::ostream& stream) const
{
    Json report = {{"places", Json::array()}, {"candidates", Json::array()}};
    for (const Place& place : places)
    {
        report["places"].push_back(ToJson(place));
    }
    for (const Candidate& candidate : candidates)
    {
        report["candidates"].push_back(ToJson(candidate));
    }
    report["summary"] = {{"candidates", candidates.size()}, {"listed", NumListed()}, {"problems", NumProblems()}};
    stream << report.dump(2) << '\n';
}
