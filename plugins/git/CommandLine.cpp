#include "CommandLine.h"

#include <string_view>

namespace
{

/// Letters, digits and marks that no program treats in a special way. Anything else is quoted: some C libraries replace
/// an unquoted "*" by names of files.
bool IsPlain(const std::wstring& argument)
{
    constexpr std::wstring_view Plain = L"abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789-_=./:,+";
    return !argument.empty() && argument.find_first_not_of(Plain) == std::wstring::npos;
}

/// Backslashes are doubled where a quotation mark follows, and only there.
std::wstring Quote(const std::wstring& argument)
{
    std::wstring quoted = L"\"";
    std::size_t backslashes = 0;
    for (const wchar_t character : argument)
    {
        if (character == L'"')
        {
            quoted.append(backslashes + 1, L'\\');
        }
        backslashes = character == L'\\' ? backslashes + 1 : 0;
        quoted += character;
    }
    quoted.append(backslashes, L'\\');
    return quoted + L'"';
}

} // namespace

std::wstring MakeCommandLine(const std::wstring& program, const std::vector<std::wstring>& arguments)
{
    std::wstring line = L'"' + program + L'"'; // its rules are simpler: a backslash is always itself
    for (const std::wstring& argument : arguments)
    {
        line += L' ' + (IsPlain(argument) ? argument : Quote(argument));
    }
    return line;
}
