#pragma once

#include <optional>
#include <string>
#include <vector>

/// The elements of an XML file with their texts and positions.
struct XmlElement
{
    std::wstring name;
    std::wstring text;
    int line = 0;
    int column = 0; ///< of the end of the start tag
    std::vector<XmlElement> children;

    /// The root of a file; empty when the file is not well-formed. The file uses no entities of its own.
    static std::optional<XmlElement> Read(const std::wstring& path);

    /// The children with a name, in any letter case.
    std::vector<const XmlElement*> Find(const wchar_t* wanted) const;
};
