#include "XmlFileFindings.h"

#include "FilePath.h"
#include "Text.h"
#include "UniqueHandle.h"
#include "XmlFault.h"

#include <algorithm>
#include <filesystem>
#include <iterator>
#include <map>
#include <string_view>
#include <system_error>

namespace
{

using Content = OrvixFileIO::Content;
using Kind = FileDiagnostics::Kind;

std::wstring Quoted(const std::wstring& text)
{
    return L'"' + text + L'"';
}

/// The system's error when the file is opened for reading.
DWORD OpenError(const std::wstring& path)
{
    const UniqueFile file(CreateFileW(path.c_str(), GENERIC_READ,
                                      FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr, OPEN_EXISTING,
                                      FILE_ATTRIBUTE_NORMAL, nullptr));
    return file ? ERROR_SUCCESS : GetLastError();
}

void AddFault(DoctorReport::Subject& file)
{
    // The texts are longer than the file only where entities are replaced, which can give gigabytes.
    std::error_code ignored;
    const std::optional<XmlFault> fault =
        XmlFault::Find(file.location, std::filesystem::file_size(file.location, ignored));
    if (std::filesystem::file_size(file.location, ignored) == 0)
    {
        file.AddProblem("malformed", L"the file is empty, so nothing in it applies");
        return;
    }
    file.AddProblem("malformed", L"the file is not well-formed and counts as empty: " +
                                     (fault ? L"line " + std::to_wstring(fault->line) + L", column " +
                                                  std::to_wstring(fault->column) + L": " + fault->reason
                                            : L"the position and the reason are not known"));
    if (fault)
    {
        file.findings.back().line = fault->line;
        file.findings.back().column = fault->column;
    }
}

/// The element that a diagnostic is about; null when it is not found.
const XmlElement* FindElement(const XmlElement& root, const FileDiagnostics::Diagnostic& diagnostic)
{
    if (diagnostic.item == 0 || diagnostic.item > root.children.size())
    {
        return nullptr;
    }
    const XmlElement* element = &root.children[diagnostic.item - 1];
    if (diagnostic.filter != 0)
    {
        std::vector<const XmlElement*> filters;
        for (const XmlElement* list : element->Find(L"Filters"))
        {
            for (const XmlElement& filter : list->children)
            {
                filters.push_back(&filter);
            }
        }
        element = diagnostic.filter <= filters.size() ? filters[diagnostic.filter - 1] : element;
    }
    const std::vector<const XmlElement*> named = element->Find(diagnostic.element.c_str());
    return named.empty() ? element : named.back();
}

void AddDiagnostic(DoctorReport::Subject& file, const FileDiagnostics::Diagnostic& diagnostic,
                   const std::wstring& where)
{
    const std::wstring element = where + L": " + diagnostic.element;
    switch (diagnostic.kind)
    {
    case Kind::NoName:
        file.AddProblem("no-name", where + L" is ignored: it has no Name");
        break;
    case Kind::NameNotFirst:
        file.AddProblem("name-not-first", where + L" is ignored: Name is not its first element");
        break;
    case Kind::UnknownElement:
        file.AddProblem("unknown-element", element + L" is ignored: no such element is known");
        break;
    case Kind::NoText:
        file.AddProblem("no-text", element + L" is ignored: it holds no text");
        break;
    case Kind::UnknownValue:
        file.AddProblem("unknown-value", element + L" is " + Quoted(diagnostic.text) + L", which counts as " +
                                             Quoted(diagnostic.countsAs));
        break;
    case Kind::MissingElement:
        file.AddProblem("incomplete-prompt", where + L" is ignored: it has no " + diagnostic.element);
        break;
    case Kind::TextCut:
        file.AddProblem("text-cut", element + L" is too long and is cut");
        break;
    }
}

} // namespace

void XmlFileFindings::AddContent(DoctorReport::Subject& file, const FileDiagnostics& diagnostics, const wchar_t* root)
{
    if (diagnostics.content == Content::Missing && !PathExists(file.location))
    {
        file.AddNote("no-file", L"there is no such file, which counts as an empty one");
    }
    else if (const DWORD error = OpenError(file.location); error != ERROR_SUCCESS)
    {
        file.AddProblem("unreadable-file",
                        L"the file cannot be opened and counts as empty: " + SystemMessage(error, file.location));
    }
    else if (diagnostics.content == Content::Missing || diagnostics.content == Content::Unreadable)
    {
        file.AddProblem("no-xml-service",
                        L"the system's XML service does not start, so the file is not read and counts as empty");
    }
    else if (diagnostics.content == Content::UsesEntities)
    {
        file.AddProblem("entities",
                        L"the file declares or uses entities of its own, or is in an encoding in which that cannot "
                        L"be told, and therefore counts as empty");
    }
    else if (diagnostics.content == Content::TooLarge)
    {
        file.AddProblem("too-large", L"the file has more than " +
                                         std::to_wstring(OrvixFileIO::MaxFileSize / 1024 / 1024) +
                                         L" MB and therefore counts as empty");
    }
    else if (diagnostics.content == Content::Malformed)
    {
        AddFault(file);
    }
    else if (!diagnostics.hasRoot && _wcsicmp(diagnostics.root.c_str(), root) == 0)
    {
        file.AddProblem("root-not-second", L"the root element " + diagnostics.root +
                                               L" is not the second node of the document, directly after the XML "
                                               L"declaration, so nothing in the file is read");
    }
    else if (!diagnostics.hasRoot)
    {
        file.AddProblem("no-root", L"the root element is " + Quoted(diagnostics.root) + L", not " + Quoted(root) +
                                       L", so nothing in the file is read");
    }
}

std::wstring XmlFileFindings::WhyUnread(const DoctorReport::Subject& file)
{
    constexpr std::string_view Codes[] = {"unreadable-file", "no-xml-service",  "entities", "too-large",
                                          "malformed",       "root-not-second", "no-root"};
    const auto found = std::find_first_of(
        file.findings.begin(), file.findings.end(), std::begin(Codes), std::end(Codes),
        [](const auto& finding, std::string_view code) { return finding.isProblem && finding.code == code; });
    return found != file.findings.end() ? found->text : L"";
}

void XmlFileFindings::AddDiagnostics(DoctorReport::Subject& file, const FileDiagnostics& diagnostics,
                                     const wchar_t* item, const XmlElement* root)
{
    std::map<unsigned int, std::wstring> names;
    for (const FileDiagnostics::Provider& provider : diagnostics.providers)
    {
        names[provider.item] = L" (" + Quoted(provider.name) + L")";
    }
    for (const FileDiagnostics::Diagnostic& diagnostic : diagnostics.diagnostics)
    {
        std::wstring where = item + std::wstring(L" ") + std::to_wstring(diagnostic.item) + names[diagnostic.item];
        where += diagnostic.filter != 0 ? L", filter " + std::to_wstring(diagnostic.filter) : L"";
        AddDiagnostic(file, diagnostic, where);
        if (const XmlElement* element = root != nullptr ? FindElement(*root, diagnostic) : nullptr)
        {
            file.findings.back().line = element->line;
            file.findings.back().column = element->column;
        }
    }
}
