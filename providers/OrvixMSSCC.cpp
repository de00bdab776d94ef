#include "OrvixMSSCC.h"

#include "ActivationContext.h"
#include "DllDirectoryScope.h"
#include "ExceptionBarrier.h"
#include "IsolatedLoad.h"
#include "LibraryModule.h"
#include "NarrowBuffer.h"
#include "OrvixFileIO.h"
#include "SccFunctions.h"
#include "WStr.h"

#include <algorithm>
#include <cwchar>
#include <string>
#include <utility>

namespace
{

// Limits of the texts, in bytes on their way to a library and in characters on their way back.
constexpr std::size_t NameLimit = SCC_NAME_SIZE - 1;
constexpr std::size_t AuxPathLimit = SCC_AUXLABEL_SIZE - 1; // of paths as well, far below the interface's own limit
constexpr std::size_t UserLimit = SCC_USER_SIZE - 1;
constexpr std::size_t ProjectNameLimit = SCC_PRJPATH_SIZE - 1;
constexpr std::size_t LocalPathLimit = MAX_PATH - 1;

constexpr wchar_t RootName[] = L"MSSCCProjectSettings";
constexpr wchar_t AuxPathName[] = L"AuxPath";
constexpr wchar_t ProjectNameName[] = L"ProjectName";

bool EqualNames(const std::wstring& left, const wchar_t* right)
{
    return _wcsicmp(left.c_str(), right) == 0;
}

} // namespace

OrvixMSSCC::~OrvixMSSCC()
{
    if (m_initialized)
    {
        Uninitialize();
    }
}

bool OrvixMSSCC::SetProvider(const wchar_t* dllPath, const wchar_t* searchFolder, const wchar_t* providerName,
                             bool loadNow)
{
    m_dllPath = dllPath;
    m_providerName = providerName;
    Store(m_sccName, m_providerName, FieldLimit);
    if (searchFolder != nullptr)
    {
        m_searchFolder = searchFolder;
    }
    return !loadNow || Load();
}

/// Loads the library and asks it for its version. A library without SccGetVersion stays loaded.
bool OrvixMSSCC::Load()
{
    {
        const DllDirectoryScope directory(m_searchFolder);
        m_module = LoadLibraryIsolated(m_dllPath.c_str(), MakeManifestContext(LibraryModule()));
    }
    const auto getVersion =
        m_module ? reinterpret_cast<AnyFunction>(GetProcAddress(m_module.Get(), SccFunctions::GetVersion.name))
                 : nullptr;
    if (getVersion == nullptr)
    {
        return false;
    }
    m_entryPoints[SccFunctions::GetVersion.slot] = getVersion;
    m_version = GetVersion();
    return true;
}

/// The function, loading the library when it is not loaded; null when either is missing.
template <typename Function>
Function* OrvixMSSCC::Resolve(const SccFunction<Function>& entry) noexcept
{
    AnyFunction& function = m_entryPoints[entry.slot];
    if (!function && !m_module)
    {
        Store(m_sccName, m_providerName, FieldLimit);
        if (!WithBarrier(false, [this] { return Load(); }))
        {
            return nullptr;
        }
    }
    if (!function)
    {
        function = reinterpret_cast<AnyFunction>(GetProcAddress(m_module.Get(), entry.name));
    }
    return reinterpret_cast<Function*>(function);
}

/// Calls the function; -1 when it is missing or throws.
template <typename Result, typename... Parameters>
Result OrvixMSSCC::Call(const SccFunction<Result(Parameters...)>& entry,
                        std::type_identity_t<Parameters>... arguments) noexcept
{
    auto* const function = Resolve(entry);
    return function ? WithBarrier(Result{SCC_E_INITIALIZEFAILED}, [&] { return function(arguments...); })
                    : SCC_E_INITIALIZEFAILED;
}

/// Copies at most `limit` characters and fills up to the limit with zeros. A text that reaches the limit gets no
/// terminator there: when a text that was cut comes back unchanged, the rest of the field stays.
void OrvixMSSCC::Store(Field& field, std::wstring_view text, std::size_t limit) noexcept
{
    limit = std::min(limit, FieldLimit);
    text = text.substr(0, limit);
    std::fill(std::copy(text.begin(), text.end(), field.begin()), field.begin() + limit, L'\0');
}

void OrvixMSSCC::StoreNarrow(Field& field, const char* text, std::size_t limit) noexcept
{
    if (const WStr wide(text); wide.Get())
    {
        Store(field, wide.Get(), limit);
    }
}

LONG OrvixMSSCC::GetVersion()
{
    auto* const getVersion = Resolve(SccFunctions::GetVersion);
    return getVersion != nullptr ? WithBarrier(LONG{0}, getVersion) : 0;
}

SCCRTN OrvixMSSCC::Initialize(LPCSTR callerName)
{
    if (m_initialized)
    {
        return SCC_OK;
    }
    if (Resolve(SccFunctions::Initialize) == nullptr) // before the fields are read, since loading sets one
    {
        return SCC_E_INITIALIZEFAILED;
    }
    NarrowBuffer sccName(m_sccName.data(), NameLimit);
    NarrowBuffer auxPathLabel(m_auxPath.data(), AuxPathLimit);
    const SCCRTN result = Call(SccFunctions::Initialize, &m_context, m_parentWindow, callerName, sccName.Get(),
                               &m_capabilities, auxPathLabel.Get(), &m_checkoutCommentLength, &m_commentLength);
    if (result != SCC_OK)
    {
        m_context = nullptr;
        m_capabilities = 0;
        return result;
    }
    StoreNarrow(m_sccName, sccName.Get(), NameLimit);
    StoreNarrow(m_auxPath, auxPathLabel.Get(), AuxPathLimit);
    m_initialized = true;
    return SCC_OK;
}

SCCRTN OrvixMSSCC::Uninitialize()
{
    // The library is called even when it was never started, as the interface promises.
    if (Resolve(SccFunctions::Uninitialize) == nullptr)
    {
        return SCC_E_INITIALIZEFAILED;
    }
    if (m_projectOpen)
    {
        CloseProject();
    }
    for (Field* field : {&m_user, &m_spare, &m_localPath, &m_auxPath, &m_projectName})
    {
        field->front() = L'\0';
    }
    m_capabilities = 0;
    m_commentLength = 0; // the length of check-out comments keeps its value, as the interface promises
    m_initialized = false;
    m_projectOpen = false;
    m_commandOptionsPending = true;
    m_commandOptions = nullptr;
    // Forgotten first: a library that shows windows may let the host start it again before it returns.
    return Call(SccFunctions::Uninitialize, std::exchange(m_context, nullptr));
}

SCCRTN OrvixMSSCC::OpenProject(LPCSTR localPath, LPCSTR comment, LPTEXTOUTPROC output)
{
    if (m_projectOpen)
    {
        CloseProject();
    }
    if (Resolve(SccFunctions::OpenProject) == nullptr)
    {
        return SCC_E_INITIALIZEFAILED;
    }
    std::string path; // with room for the longest text that a library may write
    const bool hasPath = Completes([&] {
        path.reserve(MAX_PATH);
        path = localPath != nullptr ? localPath : "";
        path.resize(std::max<std::size_t>(path.size(), MAX_PATH));
    });
    if (!hasPath)
    {
        return SCC_E_INITIALIZEFAILED;
    }
    const WStr folder(localPath);
    ReadProjectSettings(folder.Get());
    NarrowBuffer user(m_user.data(), UserLimit);
    NarrowBuffer projectName(m_projectName.data(), NarrowBuffer::Unlimited);
    NarrowBuffer auxPath(m_auxPath.data(), AuxPathLimit);
    const auto open = [&] {
        return Call(SccFunctions::OpenProject, m_context, m_parentWindow, user.Get(), projectName.Get(),
                    localPath != nullptr ? path.data() : nullptr, auxPath.Get(), comment, output, SCC_OP_CREATEIFNEW);
    };
    SCCRTN result = open();
    if (result == SCC_E_PROJSYNTAXERR)
    {
        result = GetProjPath(nullptr, nullptr, nullptr, nullptr, TRUE);
        if (result == SCC_OK)
        {
            result = open(); // with the same texts: the library may have written into them
        }
    }
    if (result != SCC_OK)
    {
        return result;
    }
    StoreNarrow(m_user, user.Get(), UserLimit);
    StoreNarrow(m_auxPath, auxPath.Get(), AuxPathLimit);
    m_projectOpen = true;
    WriteProjectSettings(folder.Get());
    return SCC_OK;
}

SCCRTN OrvixMSSCC::CloseProject()
{
    if (!m_projectOpen)
    {
        return SCC_E_PROJNOTOPEN;
    }
    if (Resolve(SccFunctions::CloseProject) == nullptr)
    {
        return SCC_E_INITIALIZEFAILED;
    }
    m_projectOpen = false;
    return Call(SccFunctions::CloseProject, m_context);
}

SCCRTN OrvixMSSCC::GetProjPath(LPSTR, LPSTR, LPSTR, LPSTR, BOOL allowChangePath)
{
    if (Resolve(SccFunctions::GetProjPath) == nullptr)
    {
        return SCC_E_INITIALIZEFAILED;
    }
    NarrowBuffer user(m_user.data(), UserLimit);
    NarrowBuffer projectName(m_projectName.data(), ProjectNameLimit);
    NarrowBuffer localPath(m_localPath.data(), LocalPathLimit);
    NarrowBuffer auxPath(m_auxPath.data(), AuxPathLimit);
    BOOL isNew = TRUE;
    const SCCRTN result = Call(SccFunctions::GetProjPath, m_context, m_parentWindow, user.Get(), projectName.Get(),
                               localPath.Get(), auxPath.Get(), allowChangePath, &isNew);
    if (result != SCC_OK)
    {
        return result;
    }
    StoreNarrow(m_user, user.Get(), UserLimit);
    StoreNarrow(m_projectName, projectName.Get(), ProjectNameLimit);
    StoreNarrow(m_localPath, localPath.Get(), LocalPathLimit);
    StoreNarrow(m_auxPath, auxPath.Get(), AuxPathLimit);
    return SCC_OK;
}

SCCRTN OrvixMSSCC::Get(LONG count, LPCSTR* names, LONG options, LPCMDOPTS block)
{
    return Call(SccFunctions::Get, m_context, m_parentWindow, count, names, options, block);
}

SCCRTN OrvixMSSCC::Checkout(LONG count, LPCSTR* names, LPCSTR comment, LONG options, LPCMDOPTS block)
{
    return Call(SccFunctions::Checkout, m_context, m_parentWindow, count, names, comment, options, block);
}

SCCRTN OrvixMSSCC::Uncheckout(LONG count, LPCSTR* names, LONG options, LPCMDOPTS block)
{
    return Call(SccFunctions::Uncheckout, m_context, m_parentWindow, count, names, options, block);
}

SCCRTN OrvixMSSCC::Checkin(LONG count, LPCSTR* names, LPCSTR comment, LONG options, LPCMDOPTS block)
{
    return Call(SccFunctions::Checkin, m_context, m_parentWindow, count, names, comment, options, block);
}

SCCRTN OrvixMSSCC::Add(LONG count, LPCSTR* names, LPCSTR comment, LONG* options, LPCMDOPTS block)
{
    return Call(SccFunctions::Add, m_context, m_parentWindow, count, names, comment, options, block);
}

SCCRTN OrvixMSSCC::BeginBatch()
{
    return Call(SccFunctions::BeginBatch);
}

SCCRTN OrvixMSSCC::EndBatch()
{
    return Call(SccFunctions::EndBatch);
}

SCCRTN OrvixMSSCC::History(LONG count, LPCSTR* names, LONG options, LPCMDOPTS block)
{
    return Call(SccFunctions::History, m_context, m_parentWindow, count, names, options, block);
}

SCCRTN OrvixMSSCC::Properties(LPCSTR name)
{
    return Call(SccFunctions::Properties, m_context, m_parentWindow, name);
}

SCCRTN OrvixMSSCC::QueryInfo(LONG count, LPCSTR* names, LPLONG status)
{
    return Call(SccFunctions::QueryInfo, m_context, count, names, status);
}

SCCRTN OrvixMSSCC::PopulateList(SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback, LPVOID callerData,
                                LPLONG status, LONG options)
{
    return Call(SccFunctions::PopulateList, m_context, command, count, names, callback, callerData, status, options);
}

SCCRTN OrvixMSSCC::RunScc(LONG count, LPCSTR* names)
{
    return Call(SccFunctions::RunScc, m_context, m_parentWindow, count, names);
}

SCCRTN OrvixMSSCC::GetCommandOptions()
{
    if (Resolve(SccFunctions::GetCommandOptions) == nullptr)
    {
        return SCC_E_INITIALIZEFAILED;
    }
    const auto ask = [this](LPCMDOPTS* block) {
        return Call(SccFunctions::GetCommandOptions, m_context, m_parentWindow, SCC_COMMAND_OPTIONS, block);
    };
    if (m_commandOptionsPending)
    {
        if (ask(nullptr) != SCC_I_ADV_SUPPORT)
        {
            return SCC_E_OPNOTSUPPORTED;
        }
        m_commandOptionsPending = false;
    }
    return ask(&m_commandOptions);
}

SCCRTN OrvixMSSCC::AddFromScc(LPLONG count, LPCSTR** names)
{
    if (!(m_capabilities & SCC_CAP_ADDFROMSCC))
    {
        return SCC_E_OPNOTSUPPORTED;
    }
    if (Resolve(SccFunctions::AddFromScc) == nullptr)
    {
        return SCC_E_INITIALIZEFAILED;
    }
    if (SetOption(SCC_OPT_SHARESUBPROJ, 1) != SCC_I_SHARESUBPROJOK)
    {
        return SCC_E_OPNOTSUPPORTED;
    }
    return Call(SccFunctions::AddFromScc, m_context, m_parentWindow, count, names);
}

SCCRTN OrvixMSSCC::SetOption(LONG option, LONG value)
{
    return Call(SccFunctions::SetOption, m_context, option, value);
}

/// Takes the auxiliary path and the project name from the settings file. What cannot be read changes nothing, also
/// when memory runs out.
void OrvixMSSCC::ReadProjectSettings(const wchar_t* folder)
{
    if (m_settingsFileName.empty() || folder == nullptr)
    {
        return;
    }
    m_previousSettings = FileBytes::Previous::Kept; // also when memory runs out
    Completes([&] {
        OrvixFileIO file;
        if (!file.OpenDocument((folder + (L'\\' + m_settingsFileName)).c_str()))
        {
            return;
        }
        const OpenedDocument opened(file);
        if (file.GetContent() == OrvixFileIO::Content::Missing)
        {
            m_previousSettings = FileBytes::Previous::Replaced;
        }
        OrvixFileIO::Node root;
        std::wstring name;
        if (!file.GetRootElement(root, name) || !EqualNames(name, RootName))
        {
            return;
        }
        OrvixFileIO::Node child;
        std::wstring text;
        for (bool more = file.GetFirstChild(root.Get(), child); more; more = file.GetNextSibling(child))
        {
            if (!file.GetNodeName(child.Get(), name) || !file.GetNodeText(child.Get(), text))
            {
                continue;
            }
            if (EqualNames(name, AuxPathName))
            {
                Store(m_auxPath, text, FieldLimit);
            }
            else if (EqualNames(name, ProjectNameName))
            {
                Store(m_projectName, text, FieldLimit);
            }
        }
        m_previousSettings = FileBytes::Previous::Replaced;
    });
}

/// Writes both texts. A failure is silent, also when memory runs out: the project is open in any case.
void OrvixMSSCC::WriteProjectSettings(const wchar_t* folder)
{
    if (m_settingsFileName.empty() || folder == nullptr)
    {
        return;
    }
    Completes([&] {
        OrvixFileIO file;
        if (!file.CreateDocument())
        {
            return;
        }
        const OpenedDocument opened(file);
        OrvixFileIO::Node root;
        file.AddElement(nullptr, RootName, root, false);
        if (root != nullptr && file.AddTextElement(root.Get(), AuxPathName, m_auxPath.data()) &&
            file.AddTextElement(root.Get(), ProjectNameName, m_projectName.data()))
        {
            file.SaveDocument((folder + (L'\\' + m_settingsFileName)).c_str(), m_previousSettings);
        }
    });
}
