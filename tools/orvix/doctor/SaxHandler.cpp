#include "SaxHandler.h"

#include "ComApartment.h"

#include <wrl/client.h>

namespace
{

// The service's streaming reader, from its published headers. It reports the position of a fault on every system; the
// document object model does so on some of them only.
constexpr CLSID ClassReader = {0x079AA557, 0x4A18, 0x424A, {0x8E, 0xEE, 0xE3, 0x9F, 0x0A, 0x8D, 0x41, 0xB9}};
constexpr IID InterfaceReader = {0xA4F96ED0, 0xF829, 0x476E, {0x81, 0xC0, 0xCD, 0xC7, 0xBD, 0x2A, 0x08, 0x02}};
constexpr IID InterfaceContentHandler = {0x1545CDFA, 0x9E4E, 0x4497, {0xA8, 0xA4, 0x2B, 0xF7, 0xD0, 0x11, 0x2C, 0x44}};
constexpr IID InterfaceErrorHandler = {0xA60511C4, 0xCCF5, 0x479E, {0x98, 0xA3, 0xDC, 0x8D, 0xC5, 0x45, 0xB7, 0xD0}};
constexpr IID Unknown = {0x00000000, 0x0000, 0x0000, {0xC0, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x46}};

} // namespace

void SaxHandler::Read(const std::wstring& path)
{
    const ComApartment apartment;
    Microsoft::WRL::ComPtr<ISAXXMLReader> reader;
    if (SUCCEEDED(CoCreateInstance(ClassReader, nullptr, CLSCTX_INPROC_SERVER, InterfaceReader,
                                   reinterpret_cast<void**>(reader.GetAddressOf()))))
    {
        reader->putFeature(L"http://xml.org/sax/features/external-general-entities", VARIANT_FALSE);
        reader->putFeature(L"http://xml.org/sax/features/external-parameter-entities", VARIANT_FALSE);
        reader->putContentHandler(this);
        reader->putErrorHandler(this);
        reader->parseURL(path.c_str());
        reader->putErrorHandler(nullptr);
        reader->putContentHandler(nullptr);
    }
}

HRESULT STDMETHODCALLTYPE SaxHandler::QueryInterface(REFIID wanted, void** object)
{
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
