#pragma once

#include "BareFileName.h"
#include "FileBytes.h"
#include "IOrvixMSSCC.h"
#include "UniqueHandle.h"

#include <array>
#include <string>
#include <string_view>
#include <type_traits>

template <typename Function>
struct SccFunction;

/// The bridge to one MSSCCI library. It loads the library on first use and frees it when it is destroyed.
///
/// Each operation looks its function up when it is called for the first time. A missing function fails that operation
/// alone; without SccGetVersion the operation that loads the library fails. After a failed load the next operation
/// tries again. During the load the process searches the search folder for libraries, and the previous DLL directory
/// afterwards. An empty DLL directory is restored as none: the system reports both alike.
///
/// A library may write up to 300 bytes of text, as the interface allows: every buffer has room for that. Texts are cut
/// to the field's limit; on their way to the library never within a character.
///
/// A library that asks for a project (`GetProjPath`) may make a new one. After a failed start the context and the
/// capabilities are dropped.
class OrvixMSSCC final : public IOrvixMSSCC
{
public:
    OrvixMSSCC() = default;
    OrvixMSSCC(const OrvixMSSCC&) = delete;
    OrvixMSSCC& operator=(const OrvixMSSCC&) = delete;
    ~OrvixMSSCC() override;

    /// Names the library; called once. `searchFolder` is the folder of the libraries that it needs; null keeps the old
    /// one. False only with `loadNow`, when the library does not load or does not export SccGetVersion. Throws
    /// std::bad_alloc.
    bool SetProvider(const wchar_t* dllPath, const wchar_t* searchFolder, const wchar_t* providerName, bool loadNow);

    /// Bare name of the settings file that is kept in each project's folder; empty for none. Any other name, which
    /// could lead out of the folder, counts as none. Throws std::bad_alloc.
    void SetProjectSettingsFile(const std::wstring& name)
    {
        m_settingsFileName = IsBareFileName(name) ? name : std::wstring();
    }

    /// The library's `SCC_CAP_*` bits; 0 while it is not initialised.
    LONG Capabilities() const { return m_capabilities; }

    /// How many bytes a comment may have, as the library said when it was initialised; 0 when it did not say.
    LONG CommentLength() const { return m_commentLength; }
    LONG CheckoutCommentLength() const { return m_checkoutCommentLength; }

    /// Parent of the library's dialogs; may be null.
    void SetParentWindow(HWND window) { m_parentWindow = window; }

    const wchar_t* GetProviderName() override { return m_providerName.c_str(); }
    const wchar_t* GetDllPath() override { return m_dllPath.c_str(); }
    bool IsInitialized() override { return m_initialized; }
    bool IsProjectOpen() override { return m_projectOpen; }
    LONG GetVersion() override;
    SCCRTN Initialize(LPCSTR callerName) override;
    SCCRTN Uninitialize() override;
    SCCRTN OpenProject(LPCSTR localPath, LPCSTR comment, LPTEXTOUTPROC output) override;
    SCCRTN CloseProject() override;
    SCCRTN GetProjPath(LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath, BOOL allowChangePath) override;
    SCCRTN Get(LONG count, LPCSTR* names, LONG options, LPCMDOPTS block) override;
    SCCRTN Checkout(LONG count, LPCSTR* names, LPCSTR comment, LONG options, LPCMDOPTS block) override;
    SCCRTN Uncheckout(LONG count, LPCSTR* names, LONG options, LPCMDOPTS block) override;
    SCCRTN Checkin(LONG count, LPCSTR* names, LPCSTR comment, LONG options, LPCMDOPTS block) override;
    SCCRTN Add(LONG count, LPCSTR* names, LPCSTR comment, LONG* options, LPCMDOPTS block) override;
    SCCRTN Reserved1() override { return DoNothing(); }
    SCCRTN BeginBatch() override;
    SCCRTN EndBatch() override;
    SCCRTN Reserved2() override { return DoNothing(); }
    SCCRTN Reserved3() override { return DoNothing(); }
    SCCRTN Reserved4() override { return DoNothing(); }
    SCCRTN History(LONG count, LPCSTR* names, LONG options, LPCMDOPTS block) override;
    SCCRTN Properties(LPCSTR name) override;
    SCCRTN QueryInfo(LONG count, LPCSTR* names, LPLONG status) override;
    SCCRTN Reserved5() override { return DoNothing(); }
    SCCRTN PopulateList(SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback, LPVOID callerData,
                        LPLONG status, LONG options) override;
    SCCRTN Reserved6() override { return DoNothing(); }
    SCCRTN RunScc(LONG count, LPCSTR* names) override;
    SCCRTN GetCommandOptions() override;
    SCCRTN AddFromScc(LPLONG count, LPCSTR** names) override;
    SCCRTN SetOption(LONG option, LONG value) override;
    SCCRTN Reserved7() override { return DoNothing(); }
    SCCRTN Reserved8() override { return DoNothing(); }
    SCCRTN Reserved9() override { return DoNothing(); }
    SCCRTN Reserved10() override { return DoNothing(); }

private:
    static constexpr std::size_t FieldLimit = 260; // characters
    static constexpr std::size_t NumOperations = 31;
    using Field = std::array<wchar_t, FieldLimit + 1>;
    using AnyFunction = void (*)();

    static SCCRTN DoNothing() { return SCC_OK; }
    static void Store(Field& field, std::wstring_view text, std::size_t limit) noexcept;
    static void StoreNarrow(Field& field, const char* text, std::size_t limit) noexcept;

    bool Load();
    template <typename Function>
    Function* Resolve(const SccFunction<Function>& entry) noexcept;
    template <typename Result, typename... Parameters>
    Result Call(const SccFunction<Result(Parameters...)>& entry,
                std::type_identity_t<Parameters>... arguments) noexcept;
    void ReadProjectSettings(const wchar_t* folder);
    void WriteProjectSettings(const wchar_t* folder);

    std::wstring m_providerName;
    std::wstring m_dllPath;
    std::wstring m_searchFolder;
    std::wstring m_settingsFileName;
    FileBytes::Previous m_previousSettings = FileBytes::Previous::Replaced; ///< what the next save does with the file
    bool m_initialized = false;
    bool m_projectOpen = false;
    bool m_commandOptionsPending = true; // until the library has said that it has options
    UniqueModule m_module;
    std::array<AnyFunction, NumOperations> m_entryPoints = {};
    Field m_sccName = {};
    Field m_auxPath = {};
    Field m_user = {};
    Field m_spare = {}; // cleared with the others and read by nobody: part of the object's fixed fields
    Field m_projectName = {};
    Field m_localPath = {};
    LPVOID m_context = nullptr;
    LPCMDOPTS m_commandOptions = nullptr;
    HWND m_parentWindow = nullptr;
    LONG m_version = 0;
    LONG m_capabilities = 0;
    LONG m_checkoutCommentLength = 0;
    LONG m_commentLength = 0;
};
