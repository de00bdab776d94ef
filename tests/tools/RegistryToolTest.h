#pragma once

#include "RegistryKey.h"
#include "ToolTest.h"
#include "UniqueHandle.h"

#include <sddl.h>

/// orvix.exe on a machine with no MSSCCI library registered.
class RegistryToolTest : public ToolTest
{
protected:
    static constexpr const wchar_t* OwnKeys = L"Software\\OrvixCore\\MSSCCI\\";

    OrvixTool::Result Register(const std::filesystem::path& library, const std::wstring& name)
    {
        return RunExactly({L"register", library.wstring(), name});
    }
    OrvixTool::Result Unregister(const std::wstring& name) { return RunExactly({L"unregister", name}); }

    /// What `orvix providers` says of installed libraries.
    OrvixTool::Result Providers() { return Run({L"providers", L"--sources", L"msscci"}); }

    /// The path that is registered for a name.
    static std::optional<std::wstring> Path(const std::wstring& name)
    {
        return TemporaryRegistryKey::Text(OwnKeys + name, L"SCCServerPath");
    }

    // What everybody may do with a key.
    static constexpr const wchar_t* Everything = L"D:P(A;;KA;;;WD)";
    static constexpr const wchar_t* ReadAndDelete = L"D:P(A;;KRSD;;;WD)";
    static constexpr const wchar_t* Nothing = L"D:P(A;;WD;;;WD)";

    /// Sets what everybody may do with a key. A key that nobody can read and delete would outlive its test.
    static void SetAccess(const std::wstring& path, const wchar_t* access)
    {
        UniqueLocalMemory descriptor;
        UniqueRegistryKey key;
        ASSERT_TRUE(
            ConvertStringSecurityDescriptorToSecurityDescriptorW(access, SDDL_REVISION_1, descriptor.Out(), nullptr));
        EXPECT_EQ(RegOpenKeyExW(HKEY_LOCAL_MACHINE, path.c_str(), 0, WRITE_DAC, key.Out()), ERROR_SUCCESS);
        EXPECT_EQ(RegSetKeySecurity(key.Get(), DACL_SECURITY_INFORMATION, descriptor.Get()), ERROR_SUCCESS);
    }

    TemporaryRegistryKey& List() { return m_list; }

private:
    TemporaryRegistryKey m_list{L"Software\\SourceCodeControlProvider\\InstalledSCCProviders"};
    TemporaryRegistryKey m_own{L"Software\\OrvixCore"};
};
