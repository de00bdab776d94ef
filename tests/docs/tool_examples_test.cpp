// What the guides show of orvix is what it takes and prints.

#include "CommandLineParser.h"
#include "Guides.h"
#include "Text.h"
#include "ToolError.h"
#include "ToolTest.h"

#include <shellapi.h>

#include <nlohmann/json.hpp>

#include <map>
#include <memory>

namespace
{

using Json = nlohmann::ordered_json;

/// A call of orvix in a fence, and what the fence shows below it.
struct Call
{
    std::string place;
    std::wstring line;
    std::string output;
};

/// The line without the shell's prompt.
std::string_view WithoutPrompt(std::string_view line)
{
    return line.starts_with("> ") || line.starts_with("$ ") ? line.substr(2) : line;
}

/// Every call after a prompt, and in fences for a shell also without a prompt.
std::vector<Call> Calls()
{
    std::vector<Call> calls;
    for (const Guides::Fence& fence : Guides::Fences())
    {
        const bool forShell = fence.language == "console" || fence.language == "sh";
        bool inCall = false;
        std::istringstream lines(fence.text);
        for (std::string line; std::getline(lines, line);)
        {
            const std::string_view command = WithoutPrompt(line);
            const bool prompted = command.size() < line.size();
            if (command.starts_with("orvix ") && (prompted || forShell))
            {
                calls.push_back({fence.Place(), Wide(command), {}});
                inCall = true;
            }
            else if (prompted)
            {
                inCall = false;
            }
            else if (inCall)
            {
                calls.back().output += line + '\n';
            }
        }
    }
    return calls;
}

/// The line as the tool understands it. Throws `ToolError` as the tool does.
std::optional<Invocation> Parse(const Call& call)
{
    int count = 0;
    const std::unique_ptr<LPWSTR, decltype(&LocalFree)> arguments(CommandLineToArgvW(call.line.c_str(), &count),
                                                                  LocalFree);
    return ParseCommandLine(count, arguments.get());
}

/// Whether both have the same members in the same order, and values of the same kinds. Null means any value. Each
/// element of `shown` has a counterpart in `printed`.
bool HasShapeOf(const Json& printed, const Json& shown)
{
    if (shown.is_null() || printed.is_null())
    {
        return true;
    }
    if (shown.is_object() && printed.is_object())
    {
        return std::equal(shown.items().begin(), shown.items().end(), printed.items().begin(), printed.items().end(),
                          [](const auto& left, const auto& right) {
                              return left.key() == right.key() && HasShapeOf(right.value(), left.value());
                          });
    }
    if (shown.is_array() && printed.is_array())
    {
        return std::all_of(shown.begin(), shown.end(), [&](const Json& element) {
            return std::any_of(printed.begin(), printed.end(),
                               [&](const Json& other) { return HasShapeOf(other, element); });
        });
    }
    return (shown.is_number() && printed.is_number()) || shown.type() == printed.type();
}

/// What every listing command prints with --json, in a small project.
class ShownJson : public ToolTest
{
protected:
    void SetUp() override
    {
        ToolTest::SetUp();
        Write(L"a.txt", "x");
        Write(L"plugins\\broken.dll", "no library");
        const std::wstring plugins = File(L"plugins").wstring();
        for (const wchar_t* command : {L"status", L"add", L"checkout", L"checkin", L"undo", L"get", L"history"})
        {
            Print({command, L"a.txt"});
        }
        Print({L"providers"});
        Print({L"filters", L"a.txt"});
        Print({L"prompts", L"list"});
        Print({L"doctor", L"--sources", L"plugins", L"--plugins", plugins});
        Print({L"validate", plugins + L"\\broken.dll"});
    }

    /// What the tool printed for a command.
    const std::map<std::wstring, Json>& Printed() const { return m_printed; }

private:
    void Print(Arguments arguments)
    {
        arguments.emplace_back(L"--json");
        const OrvixTool::Result result = Run(arguments);
        m_printed[arguments.front()] = Json::parse(result.output, nullptr, false);
        EXPECT_TRUE(m_printed[arguments.front()].is_object()) << arguments.front() << '\n'
                                                              << result.output << result.errors;
    }

    std::map<std::wstring, Json> m_printed;
};

} // namespace

TEST(ShownCall, IsAcceptedByTheTool)
{
    const std::vector<Call> calls = Calls();
    EXPECT_FALSE(calls.empty());
    for (const Call& call : calls)
    {
        try
        {
            Parse(call);
        }
        catch (const ToolError& error)
        {
            ADD_FAILURE() << call.place << ": " << Utf8(call.line) << '\n' << error.what();
        }
    }
}

TEST_F(ShownJson, HasTheKeysThatTheToolPrints)
{
    for (const Guides::Fence& fence : Guides::Fences())
    {
        if (fence.language != "json")
        {
            continue;
        }
        const Json shown = Json::parse(fence.text, nullptr, false);
        EXPECT_TRUE(std::any_of(Printed().begin(), Printed().end(),
                                [&](const auto& printed) { return HasShapeOf(printed.second, shown); }))
            << fence.Place() << ": no command prints this\n"
            << fence.text;
    }
}

TEST_F(ShownJson, BelowACallHasTheKeysThatItPrints)
{
    for (const Call& call : Calls())
    {
        const std::optional<Invocation> invocation = Parse(call);
        if (!invocation || !invocation->commandLine.json || call.output.empty())
        {
            continue;
        }
        const std::wstring& command = invocation->commandLine.command;
        const Json shown = Json::parse(call.output, nullptr, false);
        ASSERT_TRUE(Printed().contains(command)) << call.place;
        EXPECT_TRUE(HasShapeOf(Printed().at(command), shown)) << call.place << '\n' << call.output;
    }
}
