#include "FileLists.h"
#include "IsolationSettings.h"
#include "MSSCCI.h"
#include "Measure.h"
#include "ModulePath.h"
#include "TempFolder.h"
#include "UniqueHandle.h"

#include <array>
#include <filesystem>
#include <string>
#include <vector>

namespace
{

constexpr wchar_t IdleLibrary[] = L"idle_msscci.dll";

// What an isolated call may take longer than a direct one, in milliseconds.
constexpr double PerCall = 0.15;
constexpr double PerFile = 0.0001;

/// A started MSSCCI library.
class Library
{
public:
    explicit Library(const std::filesystem::path& file) : m_module(LoadLibraryW(file.c_str()))
    {
        std::array<char, SCC_NAME_SIZE> name = {};
        std::array<char, SCC_AUXLABEL_SIZE> label = {};
        LONG unused = 0;
        Export<decltype(SccInitialize)>("SccInitialize")(&m_context, nullptr, "bench", name.data(), &unused,
                                                         label.data(), &unused, &unused);
    }
    Library(const Library&) = delete;
    Library& operator=(const Library&) = delete;
    ~Library() { Export<decltype(SccUninitialize)>("SccUninitialize")(m_context); }

    void Query(std::vector<LPCSTR>& names, std::vector<LONG>& status) const
    {
        m_query(m_context, static_cast<LONG>(names.size()), names.data(), status.data());
    }

private:
    template <typename Function>
    Function* Export(const char* name) const
    {
        return reinterpret_cast<Function*>(reinterpret_cast<void (*)()>(GetProcAddress(m_module.Get(), name)));
    }

    UniqueModule m_module;
    LPVOID m_context = nullptr;
    decltype(&SccQueryInfo) m_query = Export<decltype(SccQueryInfo)>("SccQueryInfo");
};

/// Best time of a query in milliseconds.
double QueryTime(const Library& library, std::vector<LPCSTR>& names, unsigned int repeat)
{
    std::vector<LONG> status(names.size() + 1);
    return BestTime([&] {
               for (unsigned int i = 0; i < repeat; ++i)
               {
                   library.Query(names, status);
               }
           }) /
           repeat;
}

} // namespace

void BenchIsolation(MeasureTable& table)
{
    const std::filesystem::path programs = std::filesystem::path(ModulePath(nullptr)).parent_path();
    const TempFolder folder;
    std::filesystem::copy_file(programs / L"scc_proxy.dll", folder.Path() / L"scc_proxy.dll");
    std::filesystem::copy_file(programs / L"scc_host64.exe", folder.Path() / L"scc_host64.exe");
    IsolationSettings settings;
    settings.name = L"Idle";
    settings.library = programs / IdleLibrary;
    settings.Write(folder.Path());

    const Library direct(programs / IdleLibrary);
    const Library isolated(folder.Path() / L"scc_proxy.dll");
    for (const auto& [count, repeat] : {std::pair{0U, 200U}, {1000U, 50U}, {100000U, 2U}})
    {
        std::vector<std::string> texts;
        std::vector<LPCSTR> names;
        names.reserve(count);
        for (unsigned int i = 0; i < count; ++i)
        {
            texts.push_back(std::filesystem::path(FileName(i)).string());
        }
        for (const std::string& text : texts)
        {
            names.push_back(text.c_str());
        }
        table.Print({"SccQueryInfo, " + std::to_string(count) + " files: isolated, over the direct call",
                     QueryTime(isolated, names, repeat) - QueryTime(direct, names, repeat), PerCall + PerFile * count,
                     1.0});
    }
}
