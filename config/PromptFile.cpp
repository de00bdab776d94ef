#include "PromptFile.h"

#include "OrvixFileIO.h"
#include "OrvixPromptTable.h"

#include <array>
#include <cwchar>
#include <new>

namespace
{

constexpr std::size_t MaxTextLength = 1024;
constexpr long RootIndex = 1; // the declaration is child 0; the root's name is not looked at, on purpose

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

bool ReadPrompts(OrvixPromptTable& table, const wchar_t* path)
{
    OrvixFileIO file;
    if (!file.OpenDocument(path))
        return false;
    const OpenedDocument opened(file);
    OrvixFileIO::Node root;
    if (!file.GetChildNode(nullptr, RootIndex, root))
        return false;

    std::array<std::wstring, NumFields> fields;
    OrvixFileIO::Node prompt;
    for (bool more = file.GetFirstChild(root.Get(), prompt); more; more = file.GetNextSibling(prompt))
    {
        if (!file.FindChildTexts(prompt.Get(), FieldNames, fields))
            continue;
        if (fields[Text].size() > MaxTextLength)
            fields[Text].resize(MaxTextLength);
        const int id = _wtoi(fields[Id].c_str());
        const auto options = static_cast<unsigned long>(_wtoi(fields[ActionOpts].c_str()));
        const auto action = static_cast<unsigned long>(_wtoi(fields[Action].c_str()));
        const bool locked = _wcsicmp(fields[Locked].c_str(), L"false") != 0;
        if (table.AddPrompt(id, fields[Text].c_str(), options, action, locked) < 0)
            throw std::bad_alloc();
    }
    return true;
}

/// The 32 bits in signed decimal: values of 2^31 and above appear negative.
std::wstring Decimal(unsigned long value)
{
    return std::to_wstring(static_cast<int>(value));
}

} // namespace

bool ReadPromptFile(OrvixPromptTable& table, const wchar_t* path)
{
    try
    {
        return ReadPrompts(table, path);
    }
    catch (...)
    {
        // Half a table must not be saved over the whole file later.
        table.RemoveAll();
        throw;
    }
}

bool WritePromptFile(OrvixPromptTable& table, const wchar_t* path)
{
    if (table.NumPrompts() == 0)
        return true;
    OrvixFileIO file;
    if (!file.CreateDocument())
        return false;
    const OpenedDocument opened(file);
    OrvixFileIO::Node root;
    file.AddElement(nullptr, L"OrvixPrompts", root, false);
    if (!root)
        return false;
    file.SetAttribute(root.Get(), L"version", L"1.0");
    for (unsigned int i = 0; i < static_cast<unsigned int>(table.NumPrompts()); ++i)
    {
        OrvixFileIO::Node prompt;
        file.AddElement(root.Get(), L"Prompt", prompt, false);
        if (!prompt)
            return false;
        const std::array<std::wstring, NumFields> values = {
            table.GetPromptText(i), std::to_wstring(table.GetPromptID(i)), table.GetLocked(i) ? L"true" : L"false",
            Decimal(table.GetPromptOptions(i)), Decimal(table.GetPrompt(i))};
        for (std::size_t field = 0; field < NumFields; ++field)
        {
            if (!file.AddTextElement(prompt.Get(), FieldNames[field].data(), values[field].c_str()))
                return false;
        }
    }
    file.SaveDocument(path);
    return true;
}
