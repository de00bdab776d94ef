// What orvix validate finds in an isolated library.

#include "Defect.h"
#include "IsolatedCopy.h"
#include "ToolTest.h"

#include <gmock/gmock.h>
#include <nlohmann/json.hpp>

#include <set>
#include <string>

namespace
{

struct Subject
{
    std::filesystem::path (*library)();
    const char* defect; ///< of the library; also the name of the rule that it breaks
};

std::filesystem::path Archive()
{
    return BuiltFile(L"archive_msscci.dll");
}

std::filesystem::path Defective()
{
    return std::filesystem::path(ORVIX_DEFECTIVE_MSSCCI) / L"defective_scc.dll";
}

class IsolatedValidation : public ToolTest, public testing::WithParamInterface<Subject>
{
protected:
    void TearDown() override
    {
        SetEnvironmentVariableW(Defect::Variable, nullptr);
        ToolTest::TearDown();
    }
};

} // namespace

TEST_P(IsolatedValidation, FindsNoMoreThanInTheLibraryItself)
{
    const std::string defect = GetParam().defect;
    SetEnvironmentVariableW(Defect::Variable, std::wstring(defect.begin(), defect.end()).c_str());
    const IsolatedCopy isolated(GetParam().library());
    const auto result = RunExactly({L"validate", isolated.Proxy().wstring(), L"--msscci", L"--json"});
    const nlohmann::json report = nlohmann::json::parse(result.output);
    std::set<std::string> broken;
    std::set<std::string> kept;
    for (const auto& rule : report["rules"])
    {
        (rule["result"] == "fail" ? broken : kept).insert(rule["name"]);
    }
    EXPECT_THAT(broken, testing::IsSubsetOf({defect})) << result.output;
    EXPECT_GT(kept.size(), 20u);
}

INSTANTIATE_TEST_SUITE_P(, IsolatedValidation, testing::Values(Subject{Archive, ""}, Subject{Defective, "info-bits"}));
