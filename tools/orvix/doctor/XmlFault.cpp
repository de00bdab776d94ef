#include "XmlFault.h"

#include <windows.h>

#include <msxml2.h>
#include <wrl/client.h>

#include <cwctype>

namespace
{

// The service's streaming reader, from its published headers. It reports the position of a fault on every system; the
// document object model does so on some of them only.
constexpr CLSID ClassReader = {0x079AA557, 0x4A18, 0x424A, {0x8E, 0xEE, 0xE3, 0x9F, 0x0A, 0x8D, 0x41, 0xB9}};
constexpr IID InterfaceReader = {0xA4F96ED0, 0xF829, 0x476E, {0x81, 0xC0, 0xCD, 0xC7, 0xBD, 0x2A, 0x08, 0x02}};
constexpr IID InterfaceContentHandler = {0x1545CDFA, 0x9E4E, 0x4497, {0xA8, 0xA4, 0x2B, 0xF7, 0xD0, 0x11, 0x2C, 0x44}};
constexpr IID InterfaceErrorHandler = {0xA60511C4, 0xCCF5, 0x479E, {0x98, 0xA3, 0xDC, 0x8D, 0xC5, 0x45, 0xB7, 0xD0}};

/// Stores the first fault that a reader finds, and ends the reading after a number of characters. It lives on the
/// stack, so its references are not counted.
class FirstFault final : public ISAXErrorHandler, public ISAXContentHandler
{
public:
    explicit FirstFault(std::uintmax_t maxText) : m_remaining(maxText) {}
    FirstFault(const FirstFault&) = delete;
    FirstFault& operator=(const FirstFault&) = delete;
    ~FirstFault() = default;

    const std::optional<XmlFault>& Get() const { return m_fault; }

    HRESULT STDMETHODCALLTYPE QueryInterface(REFIID wanted, void** object) override
    {
        constexpr IID Unknown = {0x00000000, 0x0000, 0x0000, {0xC0, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x46}};
        *object = nullptr;
        if (IsEqualIID(wanted, InterfaceContentHandler))
        {
            *object = static_cast<ISAXContentHandler*>(this);
        }
        else if (IsEqualIID(wanted, InterfaceErrorHandler) || IsEqualIID(wanted, Unknown))
        {
            *object = static_cast<ISAXErrorHandler*>(this);
        }
        return *object != nullptr ? S_OK : E_NOINTERFACE;
    }
    ULONG STDMETHODCALLTYPE AddRef() override { return 1; }
    ULONG STDMETHODCALLTYPE Release() override { return 1; }

    HRESULT STDMETHODCALLTYPE error(ISAXLocator* locator, const wchar_t* message, HRESULT code) override
    {
        return fatalError(locator, message, code);
    }
    HRESULT STDMETHODCALLTYPE fatalError(ISAXLocator* locator, const wchar_t* message, HRESULT code) override
    {
        if (!m_fault && code != ReadingEnded)
        {
            m_fault.emplace();
            locator->getLineNumber(&m_fault->line);
            locator->getColumnNumber(&m_fault->column);
            m_fault->reason = message != nullptr ? message : L"";
            while (!m_fault->reason.empty() && std::iswspace(m_fault->reason.back()))
            {
                m_fault->reason.pop_back();
            }
        }
        return code;
    }
    HRESULT STDMETHODCALLTYPE ignorableWarning(ISAXLocator*, const wchar_t*, HRESULT) override { return S_OK; }

    HRESULT STDMETHODCALLTYPE putDocumentLocator(ISAXLocator*) override { return S_OK; }
    HRESULT STDMETHODCALLTYPE startDocument() override { return S_OK; }
    HRESULT STDMETHODCALLTYPE endDocument() override { return S_OK; }
    HRESULT STDMETHODCALLTYPE startPrefixMapping(const wchar_t*, int, const wchar_t*, int) override { return S_OK; }
    HRESULT STDMETHODCALLTYPE endPrefixMapping(const wchar_t*, int) override { return S_OK; }
    HRESULT STDMETHODCALLTYPE startElement(const wchar_t*, int, const wchar_t*, int, const wchar_t*, int,
                                           ISAXAttributes* attributes) override
    {
        int count = 0;
        attributes->getLength(&count);
        for (int i = 0; i < count; ++i)
        {
            const wchar_t* value = nullptr;
            int length = 0;
            attributes->getValue(i, &value, &length);
            Count(length);
        }
        return Count(0);
    }
    HRESULT STDMETHODCALLTYPE endElement(const wchar_t*, int, const wchar_t*, int, const wchar_t*, int) override
    {
        return S_OK;
    }
    HRESULT STDMETHODCALLTYPE characters(const wchar_t*, int length) override { return Count(length); }
    HRESULT STDMETHODCALLTYPE ignorableWhitespace(const wchar_t*, int length) override { return Count(length); }
    HRESULT STDMETHODCALLTYPE processingInstruction(const wchar_t*, int, const wchar_t*, int) override { return S_OK; }
    HRESULT STDMETHODCALLTYPE skippedEntity(const wchar_t*, int) override { return S_OK; }

private:
    static constexpr HRESULT ReadingEnded = E_ABORT;

    HRESULT Count(int length)
    {
        m_isFull = m_isFull || static_cast<std::uintmax_t>(length) > m_remaining;
        m_remaining -= m_isFull ? 0 : static_cast<std::uintmax_t>(length);
        return m_isFull ? ReadingEnded : S_OK;
    }

    std::optional<XmlFault> m_fault;
    std::uintmax_t m_remaining; // characters that may still be read
    bool m_isFull = false;
};

/// Initialises COM on this thread for a scope.
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

std::optional<XmlFault> XmlFault::Find(const std::wstring& path, std::uintmax_t maxText)
{
    const ComScope com;
    FirstFault fault(maxText);
    Microsoft::WRL::ComPtr<ISAXXMLReader> reader;
    if (SUCCEEDED(CoCreateInstance(ClassReader, nullptr, CLSCTX_INPROC_SERVER, InterfaceReader,
                                   reinterpret_cast<void**>(reader.GetAddressOf()))))
    {
        reader->putFeature(L"http://xml.org/sax/features/external-general-entities", VARIANT_FALSE);
        reader->putFeature(L"http://xml.org/sax/features/external-parameter-entities", VARIANT_FALSE);
        reader->putContentHandler(&fault);
        reader->putErrorHandler(&fault);
        reader->parseURL(path.c_str());
        reader->putErrorHandler(nullptr);
        reader->putContentHandler(nullptr);
    }
    return fault.Get();
}
