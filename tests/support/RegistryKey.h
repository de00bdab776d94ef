#pragma once

#include <windows.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>

/// A key below HKEY_LOCAL_MACHINE that belongs to the test: empty at first, and at the end as it was before, with
/// everything in it, or gone. Tests that use it are SERIAL.
///
/// What was there waits in a key beside it. Should a test end the process, that key stays, and the next object of the
/// same path takes what it holds, if anything, for what was there.
class TemporaryRegistryKey
{
public:
    /// Throws std::runtime_error, without administrator rights for one.
    explicit TemporaryRegistryKey(const std::wstring& path)
        : m_path(path), m_aside(path + L".saved"), m_saved(m_aside + L"\\content"), m_topmostMade(TopmostMissing(path))
    {
        UniqueKey made;
        if (!Exists(m_aside))
        {
            Check(Exists(m_path) ? Copy(m_path, m_saved) : OpenOrMake(m_aside, made));
        }
        Remove();
        Check(OpenOrMake(m_path, made));
    }
    TemporaryRegistryKey(const TemporaryRegistryKey&) = delete;
    TemporaryRegistryKey& operator=(const TemporaryRegistryKey&) = delete;
    ~TemporaryRegistryKey()
    {
        Remove();
        if (!Exists(m_saved) || Copy(m_saved, m_path) == ERROR_SUCCESS)
        {
            RegDeleteTreeW(HKEY_LOCAL_MACHINE, m_aside.c_str());
        }
        if (!m_topmostMade.empty())
        {
            RegDeleteTreeW(HKEY_LOCAL_MACHINE, m_topmostMade.c_str());
        }
    }

    const std::wstring& Path() const { return m_path; }

    /// Makes the key missing; a value that is set afterwards makes it again.
    void Remove() { RegDeleteTreeW(HKEY_LOCAL_MACHINE, m_path.c_str()); }

    void SetString(const std::wstring& name, const std::wstring& text)
    {
        SetBytes(name, REG_SZ, text.c_str(), (text.size() + 1) * sizeof(wchar_t));
    }

    void SetDword(const std::wstring& name, std::uint32_t number) { SetBytes(name, REG_DWORD, &number, sizeof number); }

    /// Sets a value of any type to exactly these bytes.
    void SetBytes(const std::wstring& name, DWORD type, const void* data, std::size_t size)
    {
        UniqueKey key;
        Check(OpenOrMake(m_path, key));
        Check(
            RegSetValueExW(key.get(), name.c_str(), 0, type, static_cast<const BYTE*>(data), static_cast<DWORD>(size)));
    }

    /// The text of a REG_SZ value in any key; nothing when there is none.
    static std::optional<std::wstring> Text(const std::wstring& path, const std::wstring& name)
    {
        DWORD size = 0;
        if (RegGetValueW(HKEY_LOCAL_MACHINE, path.c_str(), name.c_str(), RRF_RT_REG_SZ, nullptr, nullptr, &size) !=
            ERROR_SUCCESS)
        {
            return std::nullopt;
        }
        std::wstring text(size / sizeof(wchar_t), L'\0');
        Check(RegGetValueW(HKEY_LOCAL_MACHINE, path.c_str(), name.c_str(), RRF_RT_REG_SZ, nullptr, text.data(), &size));
        return text.c_str();
    }
    std::optional<std::wstring> Text(const std::wstring& name) const { return Text(m_path, name); }

    /// Whether there is such a key.
    static bool Exists(const std::wstring& path)
    {
        HKEY key = nullptr;
        const bool exists = RegOpenKeyExW(HKEY_LOCAL_MACHINE, path.c_str(), 0, KEY_READ, &key) == ERROR_SUCCESS;
        RegCloseKey(key);
        return exists;
    }

private:
    struct CloseKey
    {
        using pointer = HKEY;
        void operator()(HKEY key) const { RegCloseKey(key); }
    };
    using UniqueKey = std::unique_ptr<HKEY, CloseKey>;

    static LSTATUS OpenOrMake(const std::wstring& path, UniqueKey& key)
    {
        HKEY opened = nullptr;
        const LSTATUS status =
            RegCreateKeyExW(HKEY_LOCAL_MACHINE, path.c_str(), 0, nullptr, 0, KEY_ALL_ACCESS, nullptr, &opened, nullptr);
        key.reset(opened);
        return status;
    }

    static void Check(LSTATUS status)
    {
        if (status != ERROR_SUCCESS)
        {
            throw std::runtime_error("the registry answers with error " + std::to_string(status));
        }
    }

    static LSTATUS Copy(const std::wstring& from, const std::wstring& to)
    {
        UniqueKey source;
        UniqueKey target;
        LSTATUS status = OpenOrMake(from, source);
        if (status == ERROR_SUCCESS)
        {
            status = OpenOrMake(to, target);
        }
        return status == ERROR_SUCCESS ? RegCopyTreeW(source.get(), nullptr, target.get()) : status;
    }

    /// The first key on the way to `path` that is missing; empty when none is.
    static std::wstring TopmostMissing(const std::wstring& path)
    {
        std::size_t end = 0;
        do
        {
            end = path.find(L'\\', end + 1);
            if (!Exists(path.substr(0, end)))
            {
                return path.substr(0, end);
            }
        } while (end != std::wstring::npos);
        return L"";
    }

    std::wstring m_path;
    std::wstring m_aside;
    std::wstring m_saved;
    std::wstring m_topmostMade;
};
