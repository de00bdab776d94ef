#include "JsonOutput.h"

#include "Text.h"

#include <nlohmann/json.hpp>

#include <iostream>

namespace
{

using Json = nlohmann::ordered_json;

/// The value of a cell's own field.
Json ValueOf(const Listing::Cell& cell)
{
    struct
    {
        Json operator()(std::monostate) const { return nullptr; }
        Json operator()(std::int64_t number) const { return number; }
        Json operator()(bool yes) const { return yes; }
        Json operator()(const std::wstring& text) const { return Utf8(text); }
        Json operator()(const Listing::State& state) const { return state.words; }
    } const asJson;
    return std::visit(asJson, cell.value);
}

Json ObjectOf(const std::vector<Listing::Cell>& row, const std::vector<Listing::Column>& columns)
{
    Json object = Json::object();
    for (std::size_t column = 0; column < row.size(); ++column)
    {
        const std::string key = columns[column].key;
        object[key] = ValueOf(row[column]);
        if (const auto* state = std::get_if<Listing::State>(&row[column].value))
        {
            object[key + "Text"] = Utf8(state->text);
        }
    }
    return object;
}

} // namespace

void JsonOutput::Print(std::wstring_view text)
{
    m_lines.push_back(Utf8(text));
}

void JsonOutput::PrintMessage(std::wstring_view text)
{
    m_messages.push_back(Utf8(text));
    std::cerr << PrintableLines(text) << std::endl; // a command that fails writes no document
}

void JsonOutput::Show(const Listing& listing)
{
    Json rows = Json::array();
    for (const std::vector<Listing::Cell>& row : listing.rows)
    {
        rows.push_back(ObjectOf(row, listing.columns));
    }
    Json summary = Json::object();
    for (const Listing::Count& count : listing.summary)
    {
        summary[count.key] = count.count;
    }
    const Json document = {
        {listing.key, std::move(rows)}, {"summary", std::move(summary)}, {"lines", m_lines}, {"messages", m_messages}};
    m_stream << document.dump(2) << '\n';
}
