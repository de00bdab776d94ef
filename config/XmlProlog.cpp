#include "XmlProlog.h"

#include <algorithm>
#include <array>
#include <string>

namespace
{

// Encodings that write ASCII as ASCII, and nothing else with the byte of "<", by the beginning of their names.
constexpr std::array<std::string_view, 26> SafeEncodings = {
    "ascii",          "big5",      "cp125",     "euc-",      "gb18030", "gb2312",    "gbk",
    "iso-10646-ucs-", "iso-8859-", "iso8859-",  "iso_8859-", "koi8-",   "ks_c_5601", "latin",
    "macintosh",      "shift-jis", "shift_jis", "sjis",      "tis-620", "ucs-",      "us-ascii",
    "utf-16",         "utf-32",    "utf-8",     "utf8",      "windows-"};

// How "<" and a byte order mark begin in the encodings that parsers recognise without a declaration and that do not
// write ASCII as ASCII: EBCDIC, UTF-7, and UTF-32 of the two mixed byte orders.
constexpr std::array<std::string_view, 5> UnsafeBeginnings = {
    "\x4C\x6F\xA7\x94", "+ADw", "+/v", std::string_view("\0\0<\0", 4), std::string_view("\0<\0\0", 4)};

/// The encoding that the XML declaration names, in lower case; empty when it names none.
std::string DeclaredEncoding(std::string_view text)
{
    const std::string_view declaration = text.substr(0, text.find("?>"));
    if (!declaration.starts_with("<?xml"))
    {
        return {};
    }
    const std::size_t name = declaration.find("encoding");
    const std::size_t quote = declaration.find_first_of("\"'", name);
    if (name == std::string_view::npos || quote == std::string_view::npos)
    {
        return {};
    }
    if (declaration.find("encoding", name + 1) != std::string_view::npos)
    {
        return "more than one";
    }
    std::string encoding(declaration.substr(quote + 1, declaration.find(declaration[quote], quote + 1) - quote - 1));
    std::transform(encoding.begin(), encoding.end(), encoding.begin(),
                   [](char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; });
    return encoding;
}

bool IsSafe(const std::string& encoding)
{
    return encoding.empty() || std::any_of(SafeEncodings.begin(), SafeEncodings.end(),
                                           [&](std::string_view safe) { return encoding.starts_with(safe); });
}

bool StartsUnsafely(std::string_view text)
{
    return std::any_of(UnsafeBeginnings.begin(), UnsafeBeginnings.end(),
                       [&](std::string_view beginning) { return text.starts_with(beginning); });
}

/// The text after what begins at its front and ends with `end`.
std::string_view After(std::string_view text, std::size_t start, std::string_view end)
{
    const std::size_t found = text.find(end, start);
    return found == std::string_view::npos ? std::string_view() : text.substr(found + end.size());
}

/// How many bytes a character of the text has, and which of them is its value in ASCII.
struct Width
{
    std::size_t size;
    std::size_t low;
};

/// Takes the byte order mark off the text. Without one, the zero bytes beside the first character tell the width.
Width TakeMark(std::string_view& text)
{
    using namespace std::string_view_literals;
    struct Mark
    {
        std::string_view bytes;
        Width width;
    };
    constexpr std::array<Mark, 5> Marks = {{{"\0\0\xFE\xFF"sv, {4, 3}},
                                            {"\xFF\xFE\0\0"sv, {4, 0}},
                                            {"\xFE\xFF"sv, {2, 1}},
                                            {"\xFF\xFE"sv, {2, 0}},
                                            {"\xEF\xBB\xBF"sv, {1, 0}}}};
    for (const Mark& mark : Marks)
    {
        if (text.starts_with(mark.bytes))
        {
            text.remove_prefix(mark.bytes.size());
            return mark.width;
        }
    }
    if (text.starts_with("\0\0\0"sv))
    {
        return {4, 3};
    }
    if (text.starts_with('\0'))
    {
        return {2, 1};
    }
    const std::string_view rest = text.substr(std::min<std::size_t>(text.size(), 1));
    if (rest.starts_with("\0\0\0"sv))
    {
        return {4, 0};
    }
    return rest.starts_with('\0') ? Width{2, 0} : Width{1, 0};
}

/// The text in ASCII; another character becomes one that means nothing to XML.
std::string ToAscii(std::string_view bytes, Width width)
{
    constexpr char Other = '\x7F';
    std::string text;
    for (std::size_t i = 0; i + width.size <= bytes.size(); i += width.size)
    {
        const std::string_view unit = bytes.substr(i, width.size);
        const char low = unit[width.low];
        const auto zeros = static_cast<std::size_t>(std::count(unit.begin(), unit.end(), '\0'));
        text += static_cast<unsigned char>(low) < 0x80 && zeros >= width.size - 1 ? low : Other;
    }
    return text;
}

} // namespace

bool XmlProlog::MayDeclareEntities(std::string_view bytes)
{
    if (StartsUnsafely(bytes))
    {
        return true;
    }
    std::string_view text = bytes;
    std::string ascii;
    if (const Width width = TakeMark(text); width.size > 1)
    {
        ascii = ToAscii(text, width);
        text = ascii;
    }
    if (StartsUnsafely(text) || !IsSafe(DeclaredEncoding(text)))
    {
        return true;
    }
    // Comments, processing instructions and literals may contain anything. The root element ends the prolog.
    while (!text.empty())
    {
        if (text.starts_with("<!ENTITY"))
        {
            return true;
        }
        if (text.starts_with("<!--"))
        {
            text = After(text, 4, "-->");
        }
        else if (text.starts_with("<?"))
        {
            text = After(text, 2, "?>");
        }
        else if (text.front() == '"' || text.front() == '\'')
        {
            text = After(text, 1, text.substr(0, 1));
        }
        else if (text.front() == '<' && !text.starts_with("<!"))
        {
            return false;
        }
        else
        {
            text.remove_prefix(1);
        }
    }
    return false;
}
