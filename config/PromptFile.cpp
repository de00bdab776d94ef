#include "PromptFile.h"

#include "FileDiagnostics.h"
#include "OrvixFileIO.h"
#include "OrvixPromptTable.h"

#include <algorithm>
#include <array>
#include <cwchar>
#include <new>

namespace
{

constexpr std::size_t MaxTextLength = 1024;
constexpr long RootIndex = 1; // the declaration is child 0; a root of any name is read

enum Field
{
    Text,
    Id,
    Locked,
    ActionOpts,
    Action,
    NumFields
};

constexpr std::array<std::wstring_view, NumFields> FieldNames = {L"Text", L"ID", L"Locked", L"ActionOpts", L"Action"};

/// Any other text locks.
bool IsUnlocked(const std::wstring& text)
{
    return _wcsicmp(text.c_str(), L"false") == 0;
}

using Kind = FileDiagnostics::Kind;

/// Describes the document as a whole.
void Describe(OrvixFileIO& file, FileDiagnostics& diagnostics)
{
    OrvixFileIO::Node node;
    diagnostics.content = file.GetContent();
    diagnostics.hasRoot = file.GetChildNode(nullptr, RootIndex, node) && file.GetNodeName(node.Get(), diagnostics.root);
    if (!diagnostics.hasRoot)
    {
        file.GetRootElement(node, diagnostics.root);
    }
}

/// The remarks on one node below the root.
void Explain(OrvixFileIO& file, IXMLDOMNode* prompt, DiagnosticReporter& reporter)
{
    std::wstring text;
    if (!file.GetNodeName(prompt, text))
    {
        return;
    }
    reporter.EnterItem();
    for (const std::wstring_view name : FieldNames)
    {
        if (!file.FindChildText(prompt, name.data(), text))
        {
            reporter.Report(Kind::MissingElement, name.data());
        }
        else if (name == FieldNames[Text] && text.size() > MaxTextLength)
        {
            reporter.Report(Kind::TextCut, name.data());
        }
        else if (name == FieldNames[Locked] && !IsUnlocked(text) && _wcsicmp(text.c_str(), L"true") != 0)
        {
            reporter.Report(Kind::UnknownValue, name.data(), text.c_str(), L"true");
        }
    }
    OrvixFileIO::Node child;
    for (bool more = file.GetFirstChild(prompt, child); more; more = file.GetNextSibling(child))
    {
        if (file.GetNodeName(child.Get(), text) &&
            std::find(FieldNames.begin(), FieldNames.end(), text) == FieldNames.end())
        {
            reporter.Report(Kind::UnknownElement, text.c_str());
        }
    }
}

bool ReadPrompts(OrvixPromptTable& table, const wchar_t* path, FileDiagnostics* diagnostics,
                 OrvixFileIO::Content& content)
{
    OrvixFileIO file;
    const bool isOpen = file.OpenDocument(path);
    content = file.GetContent();
    if (!isOpen)
    {
        return false;
    }
    const OpenedDocument opened(file);
    if (diagnostics != nullptr)
    {
        Describe(file, *diagnostics);
    }
    OrvixFileIO::Node root;
    std::wstring rootName;
    if (!file.GetChildNode(nullptr, RootIndex, root) || !file.GetNodeName(root.Get(), rootName))
    {
        return false; // also for a comment in the root's place: the prompts after it were not read
    }

    DiagnosticReporter reporter(diagnostics);
    std::array<std::wstring, NumFields> fields;
    OrvixFileIO::Node prompt;
    for (bool more = file.GetFirstChild(root.Get(), prompt); more; more = file.GetNextSibling(prompt))
    {
        if (diagnostics != nullptr)
        {
            Explain(file, prompt.Get(), reporter);
        }
        if (!file.FindChildTexts(prompt.Get(), FieldNames, fields))
        {
            continue;
        }
        if (fields[Text].size() > MaxTextLength)
        {
            fields[Text].resize(MaxTextLength);
        }
        const int id = _wtoi(fields[Id].c_str());
        const auto options = static_cast<unsigned long>(_wtoi(fields[ActionOpts].c_str()));
        const auto action = static_cast<unsigned long>(_wtoi(fields[Action].c_str()));
        if (table.AddPrompt(id, fields[Text].c_str(), options, action, !IsUnlocked(fields[Locked])) < 0)
        {
            throw std::bad_alloc();
        }
    }
    return true;
}

/// The 32 bits in signed decimal: values of 2^31 and above appear negative.
std::wstring Decimal(unsigned long value)
{
    return std::to_wstring(static_cast<int>(value));
}

} // namespace

bool ReadPromptFile(OrvixPromptTable& table, const wchar_t* path, FileDiagnostics* diagnostics,
                    OrvixFileIO::Content* content)
{
    OrvixFileIO::Content ignored = OrvixFileIO::Content::Missing;
    try
    {
        return ReadPrompts(table, path, diagnostics, content != nullptr ? *content : ignored);
    }
    catch (...)
    {
        // Half a table must not be saved over the whole file later.
        table.RemoveAll();
        throw;
    }
}

bool WritePromptFile(OrvixPromptTable& table, const wchar_t* path, FileBytes::Previous previous)
{
    if (table.NumPrompts() == 0)
    {
        return true;
    }
    OrvixFileIO file;
    if (!file.CreateDocument())
    {
        return false;
    }
    const OpenedDocument opened(file);
    OrvixFileIO::Node root;
    file.AddElement(nullptr, PromptFileRoot, root, false);
    if (root == nullptr)
    {
        return false;
    }
    file.SetAttribute(root.Get(), L"version", L"1.0");
    for (unsigned int i = 0; i < static_cast<unsigned int>(table.NumPrompts()); ++i)
    {
        OrvixFileIO::Node prompt;
        file.AddElement(root.Get(), L"Prompt", prompt, false);
        if (prompt == nullptr)
        {
            return false;
        }
        const std::array<std::wstring, NumFields> values = {
            table.GetPromptText(i), std::to_wstring(table.GetPromptID(i)), table.GetLocked(i) ? L"true" : L"false",
            Decimal(table.GetPromptOptions(i)), Decimal(table.GetPrompt(i))};
        for (std::size_t field = 0; field < NumFields; ++field)
        {
            if (!file.AddTextElement(prompt.Get(), FieldNames[field].data(), values[field].c_str()))
            {
                return false;
            }
        }
    }
    return file.SaveDocument(path, previous);
}
