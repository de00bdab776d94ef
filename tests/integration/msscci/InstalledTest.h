#pragma once

#include "IOrvixProvider.h"
#include "OrvixProviderResult.h"
#include "OutputHost.h"
#include "RegistryKey.h"
#include "SccRecorder.h"
#include "ServicesTest.h"

#include <gmock/gmock.h>

#include <list>
#include <string>

constexpr wchar_t ListPath[] = L"Software\\SourceCodeControlProvider\\InstalledSCCProviders";
constexpr wchar_t ServerName[] = L"SCCServerName";
constexpr wchar_t ServerPath[] = L"SCCServerPath";

/// The path of a recording library.
inline std::wstring Recording(const std::wstring& name)
{
    return ORVIX_RECORDING_MSSCCI L"\\" + name + L".dll";
}

/// The bytes of a text without its terminator: filled with zeros, or cut, to `size` bytes.
inline std::string Bytes(const std::wstring& text, std::size_t size)
{
    std::string bytes(reinterpret_cast<const char*>(text.data()), text.size() * sizeof(wchar_t));
    bytes.resize(size);
    return bytes;
}

/// A services object for a machine on which no MSSCCI library is installed yet.
class InstalledTest : public ServicesTest
{
protected:
    InstalledTest() { m_scc = {}; }
    void TearDown() override { m_scc = {}; }

    /// Makes a provider's key that the list does not name.
    TemporaryRegistryKey& AddKey()
    {
        return m_keys.emplace_back(L"Software\\OrvixTest\\" + std::to_wstring(m_keys.size() + 1));
    }

    /// Makes a provider's key with name and path, which the list does not name.
    TemporaryRegistryKey& AddProvider(const std::wstring& name, const std::wstring& path = Recording(L"recording_full"))
    {
        TemporaryRegistryKey& key = AddKey();
        key.SetString(ServerName, name);
        key.SetString(ServerPath, path);
        return key;
    }

    /// Makes a provider's key with name and path, which the list names in a value of the key's number.
    TemporaryRegistryKey& Install(const std::wstring& name, const std::wstring& path = Recording(L"recording_full"))
    {
        TemporaryRegistryKey& key = AddProvider(name, path);
        m_list.SetString(std::to_wstring(m_keys.size()), key.Path());
        return key;
    }

    /// Initialises with installed libraries alone and returns the only provider.
    IOrvixProvider* InitializeAndGet()
    {
        EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
        EXPECT_EQ(m_services->GetProviderCount(), 1u);
        return m_services->GetProvider(0);
    }

    static void SetBytes(TemporaryRegistryKey& key, const std::wstring& name, DWORD type, const std::string& bytes)
    {
        // Where zeros follow the bytes in memory, Wine takes them for the missing terminator and stores them too.
        const std::string guarded = bytes + "xxxx";
        key.SetBytes(name, type, guarded.data(), bytes.size());
    }

    SccRecorder& m_scc = *TheSccRecorder();
    TemporaryRegistryKey m_list{ListPath};
    std::list<TemporaryRegistryKey> m_keys;
};
