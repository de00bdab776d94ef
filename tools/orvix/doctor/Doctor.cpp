#include "Doctor.h"

#include "CandidateExam.h"
#include "DeadSettings.h"
#include "HostSession.h"
#include "LoadAnnouncer.h"
#include "OrvixPromptTable.h"
#include "OrvixProviderSource.h"
#include "PluginExaminer.h"
#include "PromptFile.h"
#include "RegistrationExaminer.h"
#include "SettingsExaminer.h"
#include "XmlFileFindings.h"

namespace
{

DoctorReport::Subject ExaminePrompts(const std::wstring& path)
{
    DoctorReport::Subject file{.kind = "prompt file", .location = path, .findings = {}};
    OrvixPromptTable table;
    FileDiagnostics diagnostics;
    ReadPromptFile(table, path.c_str(), &diagnostics);
    XmlFileFindings::AddContent(file, diagnostics, PromptFileRoot);
    if (diagnostics.hasRoot && diagnostics.root != PromptFileRoot)
    {
        file.AddNote("other-root", L"the root element is \"" + diagnostics.root + L"\", not \"" + PromptFileRoot +
                                       L"\"; it is read anyway");
    }
    const std::optional<XmlElement> outline =
        diagnostics.hasRoot ? XmlElement::Read(path) : std::optional<XmlElement>();
    XmlFileFindings::AddDiagnostics(file, diagnostics, L"prompt", outline ? &*outline : nullptr);
    if (outline)
    {
        DeadSettings::AddPrompts(file, *outline);
    }
    return file;
}

} // namespace

DoctorReport Doctor::Examine(const CommandLine& commandLine, Output& output)
{
    constexpr std::uint32_t Everywhere = OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI;

    const std::wstring folder = HostSession::ConfigFolder(commandLine) + L'\\';
    const LoadAnnouncer announcer(commandLine.verbose, output);
    DoctorReport report;
    CandidateExams exams(report, announcer, *commandLine.timeout);
    SettingsExaminer settings;
    report.locations.push_back(settings.Examine(folder + OrvixProviderConfigManager::FileName));
    report.locations.push_back(ExaminePrompts(folder + PromptFileName));
    PluginExaminer plugins(report, settings, exams);
    if ((commandLine.sources & OrvixProviderSource::Plugins) != 0)
    {
        plugins.Examine(HostSession::PluginFolder(commandLine));
        if (commandLine.plugins.empty())
        {
            report.locations.back().AddNote("default-folder", L"no folder is named; hosts name their own, this one is "
                                                              L"beside the program");
        }
        if (commandLine.pluginsAreRelative)
        {
            report.locations.back().AddNote("relative-folder",
                                            L"the folder is named by a relative path; a host that does so finds it "
                                            L"from one current folder only");
        }
    }
    if ((commandLine.sources & OrvixProviderSource::InstalledMSSCCI) != 0)
    {
        RegistrationExaminer(report, settings, exams).Examine();
    }
    exams.Run();
    if (commandLine.sources == Everywhere)
    {
        settings.FindUnused(report.locations.front());
    }
    output.Progress({});
    return report;
}
