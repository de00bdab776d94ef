#pragma once

#include <windows.h>

/// Makes the console show UTF-8, and restores its code page at the end. Without a console nothing happens: pipes and
/// files get plain UTF-8.
class ConsoleCodePage
{
public:
    ConsoleCodePage() : m_previous(GetConsoleOutputCP())
    {
        if (m_previous != 0)
        {
            SetConsoleOutputCP(CP_UTF8);
        }
    }
    ConsoleCodePage(const ConsoleCodePage&) = delete;
    ConsoleCodePage& operator=(const ConsoleCodePage&) = delete;
    ~ConsoleCodePage()
    {
        if (m_previous != 0)
        {
            SetConsoleOutputCP(m_previous);
        }
    }

private:
    UINT m_previous;
};
