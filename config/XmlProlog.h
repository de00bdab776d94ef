#pragma once

#include <string_view>

/// Looks at the beginning of an XML file before a parser does.
namespace XmlProlog
{

/// Whether the prolog declares entities, in whatever encoding MSXML would read it. A few hundred bytes of such
/// declarations can keep a parser busy for hours. True as well for an encoding in which this cannot be told:
/// one that does not write ASCII as ASCII (UTF-7, EBCDIC and the like) or that is not known here.
bool MayDeclareEntities(std::string_view bytes);

} // namespace XmlProlog
