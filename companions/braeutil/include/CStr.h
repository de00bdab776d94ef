#pragma once

#include "BraeExport.h"

/// Narrow text in the system's ANSI code page, converted from UTF-16. No function throws.
class BRAE_API CStr
{
public:
    /// Converts null-terminated UTF-16. A character that is not in the code page becomes its default character. The
    /// text is null when `text` is null or has 2^31 characters or more, and when memory is exhausted.
    explicit CStr(const wchar_t* text) noexcept;
    CStr(const CStr&) = delete;
    CStr& operator=(const CStr&) = delete;

    /// Frees the text.
    ~CStr();

    /// The text, valid as long as this object; null when the conversion failed.
    const char* Get() const noexcept { return m_text; }

private:
    char* m_text = nullptr;
};
