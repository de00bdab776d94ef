#include "DeadSettings.h"

#include "BareFileName.h"
#include "FilePath.h"

#include <algorithm>
#include <cwchar>
#include <iterator>

namespace
{

std::wstring Quoted(const std::wstring& text)
{
    return L'"' + text + L'"';
}

/// Adds problems about one provider element.
class ProviderChecks
{
public:
    ProviderChecks(DoctorReport::Subject& file, const XmlElement& provider, const std::wstring& where)
        : m_file(file), m_provider(provider), m_where(where)
    {
    }

    void Run()
    {
        constexpr const wchar_t* Single[] = {L"Name",
                                             L"Enabled",
                                             L"FixedProjectRoot",
                                             L"AltProviderExecutable",
                                             L"MSSCCProjectFile",
                                             L"MSSCCDllSearchPath",
                                             L"MSSCCDllFullPath"};
        for (const wchar_t* name : Single)
        {
            CheckRepeated(m_provider, name, m_where);
        }
        CheckPaths();
        unsigned int number = 0;
        for (const XmlElement* filters : m_provider.Find(L"Filters"))
        {
            for (const XmlElement& filter : filters->children)
            {
                CheckFilter(filter, m_where + L", filter " + std::to_wstring(++number));
            }
        }
    }

private:
    void Add(const char* code, const XmlElement& element, const std::wstring& where, const std::wstring& text)
    {
        const bool isIgnored =
            std::any_of(m_file.findings.begin(), m_file.findings.end(), [&](const DoctorReport::Finding& finding) {
                return finding.code == "no-text" && finding.line == element.line && finding.column == element.column;
            });
        if (isIgnored)
        {
            return;
        }
        m_file.AddProblem(code, where + L": " + text);
        m_file.findings.back().line = element.line;
        m_file.findings.back().column = element.column;
    }

    void CheckRepeated(const XmlElement& parent, const wchar_t* name, const std::wstring& where)
    {
        const std::vector<const XmlElement*> all = parent.Find(name);
        if (all.size() > 1)
        {
            Add("repeated", *all.front(), where,
                std::wstring(name) + L" is there " + std::to_wstring(all.size()) + L" times; the last one counts");
        }
    }

    void CheckPaths()
    {
        for (const XmlElement* root : m_provider.Find(L"FixedProjectRoot"))
        {
            if (!root->text.empty() && (!IsAbsolutePath(root->text) || !IsFolder(root->text)))
            {
                Add("no-root-folder", *root, m_where,
                    L"FixedProjectRoot " + Quoted(root->text) + L" is not the full path of a folder");
            }
        }
        for (const XmlElement* program : m_provider.Find(L"AltProviderExecutable"))
        {
            if (!program->text.empty() &&
                (!IsAbsolutePath(program->text) || !PathExists(program->text) || IsFolder(program->text)))
            {
                Add("no-executable", *program, m_where,
                    L"AltProviderExecutable " + Quoted(program->text) + L" is not the full path of a file");
            }
        }
        for (const XmlElement* folder : m_provider.Find(L"MSSCCDllSearchPath"))
        {
            if (!folder->text.empty() && !IsAbsolutePath(folder->text))
            {
                Add("no-search-path", *folder, m_where,
                    L"MSSCCDllSearchPath " + Quoted(folder->text) + L" is not a full path");
            }
        }
        for (const XmlElement* name : m_provider.Find(L"MSSCCProjectFile"))
        {
            if (!name->text.empty() && !IsBareFileName(name->text))
            {
                Add("bad-file-name", *name, m_where,
                    L"MSSCCProjectFile " + Quoted(name->text) + L" is not the name of a file");
            }
        }
    }

    void CheckFilter(const XmlElement& filter, const std::wstring& where)
    {
        if (filter.children.empty() || _wcsicmp(filter.children.front().name.c_str(), L"Name") != 0)
        {
            return; // the library ignores it, which is a finding of its own
        }
        const std::vector<const XmlElement*> types = filter.Find(L"FileType");
        const std::vector<const XmlElement*> folders = filter.Find(L"Folder");
        const std::vector<const XmlElement*> kinds = filter.Find(L"Type");
        const bool isInclude = !kinds.empty() && _wcsicmp(kinds.back()->text.c_str(), L"exclude") != 0;
        CheckRepeated(filter, L"Name", where);
        CheckRepeated(filter, L"Type", where);
        const std::size_t known = filter.Find(L"Name").size() + kinds.size();
        if (types.empty() && folders.empty() && filter.children.size() == known)
        {
            Add("empty-filter", filter, where, L"the filter has no FileType and no Folder, so it excludes nothing");
        }
        const bool allEmpty = !types.empty() && std::all_of(types.begin(), types.end(),
                                                            [](const XmlElement* type) { return type->text.empty(); });
        if (isInclude && allEmpty)
        {
            Add("empty-type", *types.front(), where,
                L"the include filter has an empty FileType and no other, so it excludes every file with an extension");
        }
        for (const XmlElement* type : types)
        {
            if (type->text.find_first_of(L".*?") != std::wstring::npos)
            {
                Add("file-type", *type, where,
                    L"FileType " + Quoted(type->text) +
                        L" matches no file: it is compared with the text after the last dot of a name");
            }
        }
        for (const XmlElement* folder : folders)
        {
            CheckFolder(*folder, where);
        }
    }

    void CheckFolder(const XmlElement& folder, const std::wstring& where)
    {
        if (folder.text.find(L'/') != std::wstring::npos)
        {
            Add("folder-slash", folder, where,
                L"Folder " + Quoted(folder.text) + L" matches no file: paths have backslashes");
        }
        else if (folder.text.empty() || (folder.text.size() == 2 && folder.text.back() == L':'))
        {
            Add("folder-all", folder, where,
                L"Folder " + Quoted(folder.text) + L" matches every file" +
                    (folder.text.empty() ? L"" : L" of the drive"));
        }
        else if (!IsAbsolutePath(folder.text))
        {
            Add("folder-relative", folder, where,
                L"Folder " + Quoted(folder.text) +
                    L" matches no file: it is compared with the beginning of full paths");
        }
        else if (folder.text.back() != L'\\')
        {
            Add("folder-end", folder, where,
                L"Folder " + Quoted(folder.text) + L" also matches neighbours whose names begin like it, such as " +
                    Quoted(folder.text + L"2"));
        }
    }

    DoctorReport::Subject& m_file;
    const XmlElement& m_provider;
    std::wstring m_where;
};

/// Adds problems about one prompt element.
void CheckPrompt(DoctorReport::Subject& file, const XmlElement& prompt, const std::wstring& where)
{
    const auto add = [&](const char* code, const XmlElement& element, const std::wstring& text) {
        file.AddProblem(code, where + L": " + text);
        file.findings.back().line = element.line;
        file.findings.back().column = element.column;
    };
    for (const wchar_t* name : {L"Text", L"ID", L"Locked", L"ActionOpts", L"Action"})
    {
        std::vector<const XmlElement*> all = prompt.Find(name);
        std::erase_if(all, [name](const XmlElement* element) { return element->name != name; });
        if (all.size() > 1)
        {
            add("repeated", *all.back(),
                std::wstring(name) + L" is there " + std::to_wstring(all.size()) + L" times; the first one counts");
        }
        const bool isNumber = std::wcscmp(name, L"ID") == 0 || std::wcsncmp(name, L"Action", 6) == 0;
        if (!isNumber || all.empty())
        {
            continue;
        }
        const std::wstring& text = all.front()->text;
        wchar_t* end = nullptr;
        const long number = std::wcstol(text.c_str(), &end, 10);
        if (text.empty() || *end != L'\0')
        {
            add("not-a-number", *all.front(),
                std::wstring(name) + L" is " + Quoted(text) + L", which counts as " + std::to_wstring(number));
        }
    }
}

} // namespace

void DeadSettings::AddProviders(DoctorReport::Subject& file, const XmlElement& root)
{
    if (root.children.empty())
    {
        file.AddNote("empty-file", L"the file has no provider element, so it sets nothing");
    }
    for (std::size_t i = 0; i < root.children.size(); ++i)
    {
        const XmlElement& provider = root.children[i];
        const std::vector<const XmlElement*> names = provider.Find(L"Name");
        const std::wstring name = names.empty() ? L"" : L" (" + Quoted(names.back()->text) + L")";
        ProviderChecks(file, provider, L"provider element " + std::to_wstring(i + 1) + name).Run();
    }
}

void DeadSettings::AddPrompts(DoctorReport::Subject& file, const XmlElement& root)
{
    for (std::size_t i = 0; i < root.children.size(); ++i)
    {
        CheckPrompt(file, root.children[i], L"prompt " + std::to_wstring(i + 1));
    }
}
