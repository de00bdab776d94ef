#include "JsonOutput.h"

#include "Text.h"

#include <nlohmann/json.hpp>

namespace
{

using Json = nlohmann::ordered_json;

Json ValueOf(const Listing::Cell& cell)
{
    struct
    {
        Json operator()(std::monostate) const { return nullptr; }
        Json operator()(std::int64_t number) const { return number; }
        Json operator()(bool yes) const { return yes; }
        Json operator()(const std::wstring& text) const { return Utf8(text); }
    } const asJson;
    return std::visit(asJson, cell.value);
}

} // namespace

void JsonOutput::Say(std::wstring_view text)
{
    m_lines.push_back(Utf8(text));
}

void JsonOutput::Show(const Listing& listing)
{
    Json rows = Json::array();
    for (const std::vector<Listing::Cell>& row : listing.rows)
    {
        Json object = Json::object();
        for (std::size_t column = 0; column < row.size(); ++column)
        {
            object[listing.columns[column].key] = ValueOf(row[column]);
        }
        rows.push_back(std::move(object));
    }
    Json summary = Json::object();
    for (const Listing::Count& count : listing.summary)
    {
        summary[count.key] = count.count;
    }
    const Json document = {{listing.key, std::move(rows)}, {"summary", std::move(summary)}, {"lines", m_lines}};
    m_stream << document.dump(2) << '\n';
}
