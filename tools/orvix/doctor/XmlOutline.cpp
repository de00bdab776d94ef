#include "XmlOutline.h"

#include "SaxHandler.h"

namespace
{

/// Builds the elements, as descendants of a root element that represents the document.
class OutlineBuilder final : public SaxHandler
{
public:
    OutlineBuilder() : m_open{{}} {}

    std::optional<XmlElement> Root() const
    {
        const bool complete = !m_isBroken && m_open.size() == 1 && m_open.front().children.size() == 1;
        return complete ? std::optional(m_open.front().children.front()) : std::nullopt;
    }

    HRESULT STDMETHODCALLTYPE fatalError(ISAXLocator*, const wchar_t*, HRESULT code) override
    {
        m_isBroken = true;
        return code;
    }

    HRESULT STDMETHODCALLTYPE startElement(const wchar_t*, int, const wchar_t*, int, const wchar_t* name, int length,
                                           ISAXAttributes*) override
    {
        XmlElement& element = m_open.emplace_back();
        element.name.assign(name, static_cast<std::size_t>(length));
        if (Locator() != nullptr)
        {
            Locator()->getLineNumber(&element.line);
            Locator()->getColumnNumber(&element.column);
        }
        return S_OK;
    }

    HRESULT STDMETHODCALLTYPE endElement(const wchar_t*, int, const wchar_t*, int, const wchar_t*, int) override
    {
        XmlElement element = std::move(m_open.back());
        m_open.pop_back();
        m_open.back().children.push_back(std::move(element));
        return S_OK;
    }

    HRESULT STDMETHODCALLTYPE characters(const wchar_t* text, int length) override
    {
        m_open.back().text.append(text, static_cast<std::size_t>(length));
        return S_OK;
    }

private:
    std::vector<XmlElement> m_open; // from the document to the element that is being read
    bool m_isBroken = false;
};

} // namespace

std::optional<XmlElement> XmlElement::Read(const std::wstring& path)
{
    OutlineBuilder builder;
    builder.Read(path);
    return builder.Root();
}

std::vector<const XmlElement*> XmlElement::Find(const wchar_t* wanted) const
{
    std::vector<const XmlElement*> found;
    for (const XmlElement& child : children)
    {
        if (_wcsicmp(child.name.c_str(), wanted) == 0)
        {
            found.push_back(&child);
        }
    }
    return found;
}
