#pragma once

#include <windows.h>

#include <string>

/// What the fake plug-ins were asked: words with a blank after each. An environment variable of the process holds it,
/// so that it outlives a plug-in that is unloaded at once.
class FakeJournal
{
public:
    static void Add(const std::wstring& word) { Write(Read() + word + L" "); }
    static void Clear() { Write({}); }

    static std::wstring Read()
    {
        std::wstring text(32767, L'\0');
        text.resize(GetEnvironmentVariableW(Variable, text.data(), static_cast<DWORD>(text.size())));
        return text;
    }

private:
    static constexpr const wchar_t* Variable = L"ORVIX_FAKE_JOURNAL";

    static void Write(const std::wstring& text) { SetEnvironmentVariableW(Variable, text.c_str()); }
};
