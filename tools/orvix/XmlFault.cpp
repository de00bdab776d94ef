#include "XmlFault.h"

#include <windows.h>

#include <msxml2.h>
#include <wrl/client.h>

#include <cwctype>

namespace
{
// The service's streaming reader, as its published headers give it. It tells the position of a fault on every system;
// the document object model does so on some alone.
constexpr CLSID ClassReader = {0x079AA557, 0x4A18, 0x424A, {0x8E, 0xEE, 0xE3, 0x9F, 0x0A, 0x8D, 0x41, 0xB9}};
constexpr IID InterfaceReader = {0xA4F96ED0, 0xF829, 0x476E, {0x81, 0xC0, 0xCD, 0xC7, 0xBD, 0x2A, 0x08, 0x02}};
constexpr IID InterfaceErrorHandler = {0xA60511C4, 0xCCF5, 0x479E, {0x98, 0xA3, 0xDC, 0x8D, 0xC5, 0x45, 0xB7, 0xD0}};

/// Keeps the first fault that a reader meets. Lives on the stack: nobody else owns it.
class FirstFault final : public ISAXErrorHandler
{
public:
    FirstFault() = default;
    FirstFault(const FirstFault&) = delete;
    FirstFault& operator=(const FirstFault&) = delete;
    ~FirstFault() = default;

    const std::optional<XmlFault>& Get() const { return m_fault; }

    HRESULT STDMETHODCALLTYPE QueryInterface(REFIID wanted, void** object) override
    {
        constexpr IID Unknown = {0x00000000, 0x0000, 0x0000, {0xC0, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x46}};
        const bool known = IsEqualIID(wanted, InterfaceErrorHandler) || IsEqualIID(wanted, Unknown);
        *object = known ? this : nullptr;
        return known ? S_OK : E_NOINTERFACE;
    }
    ULONG STDMETHODCALLTYPE AddRef() override { return 1; }
    ULONG STDMETHODCALLTYPE Release() override { return 1; }

    HRESULT STDMETHODCALLTYPE error(ISAXLocator* locator, const wchar_t* message, HRESULT code) override
    {
        return fatalError(locator, message, code);
    }
    HRESULT STDMETHODCALLTYPE fatalError(ISAXLocator* locator, const wchar_t* message, HRESULT code) override
    {
        if (!m_fault)
        {
            m_fault.emplace();
            locator->getLineNumber(&m_fault->line);
            locator->getColumnNumber(&m_fault->column);
            m_fault->reason = message ? message : L"";
            while (!m_fault->reason.empty() && std::iswspace(m_fault->reason.back()))
            {
                m_fault->reason.pop_back();
            }
        }
        return code;
    }
    HRESULT STDMETHODCALLTYPE ignorableWarning(ISAXLocator*, const wchar_t*, HRESULT) override { return S_OK; }

private:
    std::optional<XmlFault> m_fault;
};

/// COM on this thread, for a scope.
class ComScope
{
public:
    ComScope() : m_result(CoInitialize(nullptr)) {}
    ComScope(const ComScope&) = delete;
    ComScope& operator=(const ComScope&) = delete;
    ~ComScope()
    {
        if (SUCCEEDED(m_result))
        {
            CoUninitialize();
        }
    }

private:
    HRESULT m_result;
};
} // namespace

std::optional<XmlFault> XmlFault::Find(const std::wstring& path)
{
    const ComScope com;
    FirstFault fault;
    Microsoft::WRL::ComPtr<ISAXXMLReader> reader;
    if (SUCCEEDED(CoCreateInstance(ClassReader, nullptr, CLSCTX_INPROC_SERVER, InterfaceReader,
                                   reinterpret_cast<void**>(reader.GetAddressOf()))))
    {
        reader->putFeature(L"http://xml.org/sax/features/external-general-entities", VARIANT_FALSE);
        reader->putFeature(L"http://xml.org/sax/features/external-parameter-entities", VARIANT_FALSE);
        reader->putErrorHandler(&fault);
        reader->parseURL(path.c_str());
        reader->putErrorHandler(nullptr);
    }
    return fault.Get();
}
