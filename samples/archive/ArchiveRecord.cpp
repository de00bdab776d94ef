#include "ArchiveRecord.h"

#include "ArchiveText.h"

#include <charconv>

namespace
{

constexpr std::string_view FirstLine = "archive-record 1";
constexpr std::string_view LastLine = "end";

using Fields = std::vector<std::string_view>;

/// Removes the first line from the text and returns it. Nothing when there is no line end.
std::optional<std::string_view> TakeLine(std::string_view& text)
{
    const std::size_t end = text.find('\n');
    if (end == std::string_view::npos)
    {
        return std::nullopt;
    }
    const std::string_view line = text.substr(0, end);
    text.remove_prefix(end + 1);
    return line;
}

Fields Split(std::string_view line)
{
    Fields fields;
    for (;;)
    {
        const std::size_t end = line.find('\t');
        fields.push_back(line.substr(0, end));
        if (end == std::string_view::npos)
        {
            return fields;
        }
        line.remove_prefix(end + 1);
    }
}

bool ReadText(std::string_view field, std::wstring& text)
{
    const std::optional<std::string> plain = ArchiveText::Unescape(field);
    std::optional<std::wstring> wide = plain ? ArchiveText::FromUtf8(*plain) : std::nullopt;
    if (!wide || wide->find(L'\0') != std::wstring::npos)
    {
        return false;
    }
    text = std::move(*wide);
    return true;
}

bool ReadNumber(std::string_view field, std::uint64_t& number)
{
    const auto [end, error] = std::from_chars(field.data(), field.data() + field.size(), number);
    return error == std::errc() && end == field.data() + field.size() && number <= INT64_MAX;
}

bool ReadTime(std::string_view field, std::string& time)
{
    constexpr std::string_view Pattern = "dddd-dd-ddTdd:dd:ddZ";
    if (field.size() != Pattern.size())
    {
        return false;
    }
    for (std::size_t i = 0; i < Pattern.size(); ++i)
    {
        if (Pattern[i] == 'd' ? field[i] < '0' || field[i] > '9' : field[i] != Pattern[i])
        {
            return false;
        }
    }
    time = field;
    return true;
}

bool ReadDigest(std::string_view field, std::string& digest)
{
    if (field.size() != 64 || field.find_first_not_of("0123456789abcdef") != std::string_view::npos)
    {
        return false;
    }
    digest = field;
    return true;
}

bool ReadCheckOut(const Fields& fields, ArchiveCheckOut& checkOut)
{
    return fields.size() == 4 && ReadTime(fields[1], checkOut.time) && ReadText(fields[2], checkOut.user) &&
           ReadText(fields[3], checkOut.comment);
}

bool ReadVersion(const Fields& fields, std::size_t expectedNumber, ArchiveVersion& version)
{
    std::uint64_t number = 0;
    return fields.size() == 8 && ReadNumber(fields[1], number) && number == expectedNumber &&
           ReadTime(fields[2], version.time) && ReadText(fields[3], version.user) &&
           ReadDigest(fields[4], version.sha256) && ReadNumber(fields[5], version.size) &&
           ReadNumber(fields[6], version.lastWrite) && ReadText(fields[7], version.comment);
}

std::string Field(std::wstring_view text)
{
    return '\t' + ArchiveText::Escape(ArchiveText::ToUtf8(text));
}

} // namespace

std::optional<ArchiveRecord> ArchiveRecord::Parse(std::string_view text)
{
    ArchiveRecord record;
    std::optional<std::string_view> line = TakeLine(text);
    if (line != FirstLine || !(line = TakeLine(text)))
    {
        return std::nullopt;
    }

    Fields fields = Split(*line);
    if (fields.size() != 2 || fields[0] != "path" || !ReadText(fields[1], record.path))
    {
        return std::nullopt;
    }

    while ((line = TakeLine(text)) && line != LastLine)
    {
        fields = Split(*line);
        if (fields[0] == "checkout" && !record.checkOut && record.versions.empty())
        {
            if (!ReadCheckOut(fields, record.checkOut.emplace()))
            {
                return std::nullopt;
            }
            continue;
        }
        ArchiveVersion version;
        if (fields[0] != "version" || !ReadVersion(fields, record.versions.size() + 1, version))
        {
            return std::nullopt;
        }
        record.versions.push_back(std::move(version));
    }
    if (!line || !text.empty() || record.versions.empty())
    {
        return std::nullopt;
    }
    return record;
}

std::string ArchiveRecord::Format() const
{
    std::string text(FirstLine);
    text += "\npath" + Field(path) + '\n';
    if (checkOut)
    {
        text += "checkout\t" + checkOut->time + Field(checkOut->user) + Field(checkOut->comment) + '\n';
    }
    std::size_t number = 0;
    for (const ArchiveVersion& version : versions)
    {
        text += "version\t" + std::to_string(++number) + '\t' + version.time + Field(version.user) + '\t' +
                version.sha256 + '\t' + std::to_string(version.size) + '\t' + std::to_string(version.lastWrite) +
                Field(version.comment) + '\n';
    }
    return text.append(LastLine) + '\n';
}
