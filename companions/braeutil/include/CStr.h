#pragma once

#include "BraeExport.h"

/// Narrow text in the system's ANSI code page.
class BRAE_API CStr
{
public:
    /// Converts null-terminated UTF-16; characters outside the code page become its default character.
    /// Null, exhausted memory and text of 2^31 characters or more give a null text.
    explicit CStr(const wchar_t* text) noexcept;
    CStr(const CStr&) = delete;
    CStr& operator=(const CStr&) = delete;
    ~CStr();

    /// The text, owned by the object; null when the conversion failed.
    const char* Get() const noexcept { return m_text; }

private:
    char* m_text = nullptr;
};
