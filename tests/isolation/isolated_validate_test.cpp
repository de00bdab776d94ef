// What orvix validate finds in an isolated library.

#include "Defect.h"
#include "IsolatedCopy.h"
#include "ToolTest.h"

#include <nlohmann/json.hpp>

#include <map>
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
    /// The results of the rules by their names.
    std::map<std::string, std::string> Results(const std::filesystem::path& library)
    {
        const auto run = RunExactly({L"validate", library.wstring(), L"--msscci", L"--json"});
        const nlohmann::json report = nlohmann::json::parse(run.output);
        std::map<std::string, std::string> results;
        for (const auto& rule : report["rules"])
        {
            results[rule["name"]] = rule["result"];
        }
        return results;
    }

    void TearDown() override
    {
        SetEnvironmentVariableW(Defect::Variable, nullptr);
        ToolTest::TearDown();
    }
};

} // namespace

TEST_P(IsolatedValidation, FindsTheSameAsInTheLibraryItself)
{
    const std::string defect = GetParam().defect;
    SetEnvironmentVariableW(Defect::Variable, std::wstring(defect.begin(), defect.end()).c_str());
    const IsolatedCopy isolated(GetParam().library());
    const std::map<std::string, std::string> direct = Results(GetParam().library());
    EXPECT_GT(direct.size(), 20u);
    EXPECT_EQ(Results(isolated.Proxy()), direct);
    for (const auto& [name, result] : direct)
    {
        EXPECT_EQ(result == "fail", name == defect) << name;
    }
}

INSTANTIATE_TEST_SUITE_P(, IsolatedValidation, testing::Values(Subject{Archive, ""}, Subject{Defective, "info-bits"}));
