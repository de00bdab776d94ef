#pragma once

#include <windows.h>

#include <comdef.h>
#include <oleauto.h>

#include <exception>
#include <string_view>

/// A VARIANT that clears itself. Throws `_com_error` when memory is exhausted and when it cannot be cleared
/// (unless an exception is under way already).
class ComVariant
{
public:
    ComVariant() = default;
    explicit ComVariant(const wchar_t* text) : ComVariant()
    {
        V_BSTR(&m_value) = SysAllocString(text);
        if (text != nullptr && !V_BSTR(&m_value))
        {
            throw _com_error(E_OUTOFMEMORY);
        }
        V_VT(&m_value) = VT_BSTR;
    }
    explicit ComVariant(long number) : ComVariant()
    {
        V_VT(&m_value) = VT_I4;
        V_I4(&m_value) = number;
    }
    explicit ComVariant(IDispatch* object) : ComVariant()
    {
        V_VT(&m_value) = VT_DISPATCH;
        V_DISPATCH(&m_value) = object;
        if (object != nullptr)
        {
            object->AddRef();
        }
    }
    explicit ComVariant(IUnknown* object) : ComVariant()
    {
        V_VT(&m_value) = VT_UNKNOWN;
        V_UNKNOWN(&m_value) = object;
        if (object != nullptr)
        {
            object->AddRef();
        }
    }

    /// An array with a copy of the bytes.
    explicit ComVariant(std::string_view bytes) : ComVariant()
    {
        SAFEARRAY* array = SafeArrayCreateVector(VT_UI1, 0, static_cast<ULONG>(bytes.size()));
        void* data = nullptr;
        if (array == nullptr || FAILED(SafeArrayAccessData(array, &data)))
        {
            throw _com_error(E_OUTOFMEMORY);
        }
        bytes.copy(static_cast<char*>(data), bytes.size());
        SafeArrayUnaccessData(array);
        V_VT(&m_value) = VT_ARRAY | VT_UI1;
        V_ARRAY(&m_value) = array;
    }
    ComVariant(const ComVariant&) = delete;
    ComVariant& operator=(const ComVariant&) = delete;
    ~ComVariant() noexcept(false) // NOLINT(bugprone-exception-escape): as said above
    {
        const HRESULT result = VariantClear(&m_value);
        if (FAILED(result) && std::uncaught_exceptions() == 0)
        {
            throw _com_error(result);
        }
    }

    const VARIANT& Get() const { return m_value; }

    /// Where an operation stores a value that the object then owns.
    VARIANT* Out() { return &m_value; }

    /// The string, owned by the object; null when the value is anything else.
    BSTR String() const { return V_VT(&m_value) == VT_BSTR ? V_BSTR(&m_value) : nullptr; }

private:
    VARIANT m_value = {}; // VT_EMPTY
};
