#include "GitStatus.h"

#include "GitText.h"

#include <charconv>

namespace
{

/// Takes a prefix from a text; false when it does not begin so.
bool Take(std::string_view& text, std::string_view prefix)
{
    if (!text.starts_with(prefix))
    {
        return false;
    }
    text.remove_prefix(prefix.size());
    return true;
}

/// The text after a number of fields, each of which ends with a space. A path may contain spaces.
std::string_view AfterFields(std::string_view record, int count)
{
    for (; count > 0; --count)
    {
        const std::size_t end = record.find(' ');
        record.remove_prefix(end == std::string_view::npos ? record.size() : end + 1);
    }
    return record;
}

int Number(std::string_view text)
{
    int number = 0;
    std::from_chars(text.data(), text.data() + text.size(), number);
    return number;
}

void ReadHeader(std::string_view header, GitStatus& status)
{
    if (Take(header, "head "))
    {
        status.branch = GitText::FromUtf8(header);
    }
    else if (Take(header, "upstream "))
    {
        status.upstream = GitText::FromUtf8(header);
    }
    else if (Take(header, "ab +"))
    {
        const std::size_t minus = header.find('-');
        status.ahead = Number(header.substr(0, minus));
        status.behind = minus != std::string_view::npos ? Number(header.substr(minus + 1)) : 0;
    }
}

} // namespace

GitStatus GitStatus::Read(std::string_view printed)
{
    using Kind = File::Kind;
    GitStatus status;
    for (std::string_view record : GitText::Split(printed, '\0'))
    {
        if (Take(record, "# branch."))
        {
            ReadHeader(record, status);
        }
        else if (Take(record, "? "))
        {
            status.files.push_back({std::string(record), Kind::Untracked});
        }
        else if (Take(record, "1 ") && record.size() > 2)
        {
            status.files.push_back({std::string(AfterFields(record, 7)), Kind::Changed, record[0], record[1]});
        }
        else if (Take(record, "u ") && record.size() > 2)
        {
            status.files.push_back({std::string(AfterFields(record, 9)), Kind::Conflicted, record[0], record[1]});
        }
    }
    return status;
}

std::wstring GitStatus::Word(const File& file)
{
    if (file.kind == File::Kind::Untracked)
    {
        return L"not controlled";
    }
    if (file.kind == File::Kind::Conflicted)
    {
        return L"in conflict";
    }
    if (file.IsDeleted())
    {
        return L"deleted";
    }
    return file.IsAdded() ? L"added" : L"modified";
}
