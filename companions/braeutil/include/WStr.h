#pragma once

#include "BraeExport.h"

/// Wide text (UTF-16).
class BRAE_API WStr
{
public:
    /// Converts null-terminated text of the system's ANSI code page. Null, exhausted memory and text of
    /// 2^31 bytes or more give a null text.
    explicit WStr(const char* text) noexcept;
    WStr(const WStr&) = delete;
    WStr& operator=(const WStr&) = delete;
    ~WStr();

    /// The text, owned by the object; null when the conversion failed.
    const wchar_t* Get() const noexcept { return m_text; }

private:
    wchar_t* m_text = nullptr;
};
