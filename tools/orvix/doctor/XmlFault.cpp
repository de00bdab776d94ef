#include "XmlFault.h"

#include "SaxHandler.h"

#include <cwctype>

namespace
{

/// Stores the first fault that a reader finds, and ends the reading after a number of characters.
class FirstFault final : public SaxHandler
{
public:
    explicit FirstFault(std::uintmax_t maxText) : m_remaining(maxText) {}

    const std::optional<XmlFault>& Get() const { return m_fault; }

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
    HRESULT STDMETHODCALLTYPE characters(const wchar_t*, int length) override { return Count(length); }
    HRESULT STDMETHODCALLTYPE ignorableWhitespace(const wchar_t*, int length) override { return Count(length); }

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

} // namespace

std::optional<XmlFault> XmlFault::Find(const std::wstring& path, std::uintmax_t maxText)
{
    FirstFault fault(maxText);
    fault.Read(path);
    return fault.Get();
}
