#pragma once

#include "BraeExport.h"

/// Wide text (UTF-16), converted from the system's ANSI code page. No function throws.
class BRAE_API WStr
{
public:
    /// Converts null-terminated text of the ANSI code page. The text is null when `text` is null or has 2^31 bytes or
    /// more, and when memory is exhausted.
    explicit WStr(const char* text) noexcept;
    WStr(const WStr&) = delete;
    WStr& operator=(const WStr&) = delete;

    /// Frees the text.
    ~WStr();

    /// The text, valid as long as this object; null when the conversion failed.
    const wchar_t* Get() const noexcept { return m_text; }

private:
    wchar_t* m_text = nullptr;
};
