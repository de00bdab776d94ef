#pragma once

#include <windows.h>

#include <comdef.h>
#include <oleauto.h>

#include <string_view>

/// A BSTR that frees itself. Throws `_com_error` when memory is exhausted.
class ComString
{
public:
    ComString() = default;
    explicit ComString(const wchar_t* text) : m_text(SysAllocString(text))
    {
        if (text != nullptr && m_text == nullptr)
        {
            throw _com_error(E_OUTOFMEMORY);
        }
    }
    ComString(const ComString&) = delete;
    ComString& operator=(const ComString&) = delete;
    ~ComString() { SysFreeString(m_text); }

    BSTR Get() const { return m_text; }

    /// Where an operation stores a string that the object then owns.
    BSTR* Out() { return &m_text; }

    std::wstring_view View() const { return {m_text, SysStringLen(m_text)}; }

private:
    BSTR m_text = nullptr;
};
