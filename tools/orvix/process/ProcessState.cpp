#include "ProcessState.h"

#include <objbase.h>

#include <algorithm>
#include <cfloat>
#include <clocale>
#include <iterator>

namespace
{

constexpr DWORD StandardHandles[] = {STD_INPUT_HANDLE, STD_OUTPUT_HANDLE, STD_ERROR_HANDLE};

constexpr int NoApartment = -2;
constexpr int MaxEntries = 100; // that a library has left open into one apartment

constexpr unsigned int FloatingPointBits = _MCW_EM | _MCW_RC | _MCW_DN; // masks, rounding and denormal numbers

/// Changes bits of the control word and returns it.
unsigned int FloatingPointControl(unsigned int control = 0, unsigned int bits = 0)
{
#ifdef _MSC_VER
    _controlfp_s(&control, control, bits);
    return control;
#else
    return _controlfp(control, bits);
#endif
}

bool IsOpen(HANDLE handle)
{
    DWORD flags = 0;
    return handle == nullptr || handle == INVALID_HANDLE_VALUE || GetHandleInformation(handle, &flags) != 0;
}

bool SameLocale(const std::string& locale)
{
    const char* const now = std::setlocale(LC_ALL, nullptr);
    return now != nullptr && locale == now;
}

} // namespace

ProcessState::ProcessState()
    : m_folder(CurrentFolder()), m_dllDirectory(DllDirectory()), m_apartment(ComApartment()),
      m_locale(std::setlocale(LC_ALL, nullptr)), m_threadLocale(GetThreadLocale()), m_codePage(GetConsoleOutputCP()),
      m_floatingPoint(FloatingPointControl()), m_errorMode(GetErrorMode())
{
    std::transform(std::begin(StandardHandles), std::end(StandardHandles), std::begin(m_handles), GetStdHandle);
}

std::vector<std::string> ProcessState::FindChanges() const
{
    std::vector<std::string> changes;
    const auto addWhen = [&changes](bool changed, const char* what) {
        if (changed)
        {
            changes.emplace_back(what);
        }
    };
    addWhen(CurrentFolder() != m_folder, "the current folder");
    addWhen(ComApartment() != m_apartment, "the COM apartment of the thread");
    addWhen(!SameLocale(m_locale) || GetThreadLocale() != m_threadLocale, "the locale");
    addWhen(GetConsoleOutputCP() != m_codePage, "the code page of the console");
    addWhen(FloatingPointControl() != m_floatingPoint, "the floating-point control word");
    addWhen(GetErrorMode() != m_errorMode, "the error mode");
    addWhen(DllDirectory() != m_dllDirectory, "the DLL directory");
    for (std::size_t i = 0; i < std::size(StandardHandles); ++i)
    {
        const HANDLE now = GetStdHandle(StandardHandles[i]);
        if (now != m_handles[i] || !IsOpen(m_handles[i]))
        {
            addWhen(true, "a standard handle");
            break;
        }
    }
    return changes;
}

void ProcessState::Restore() const
{
    if (CurrentFolder() != m_folder)
    {
        SetCurrentDirectoryW(m_folder.c_str());
    }
    if (m_apartment == APTTYPE_MAINSTA || m_apartment == APTTYPE_STA)
    {
        // Leaves the apartment that a library has entered in its place.
        for (int i = 0; i < MaxEntries && ComApartment() == APTTYPE_MTA; ++i)
        {
            CoUninitialize();
        }
        if (const int now = ComApartment(); now != APTTYPE_MAINSTA && now != APTTYPE_STA)
        {
            CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED);
        }
    }
    if (!SameLocale(m_locale))
    {
        std::setlocale(LC_ALL, m_locale.c_str());
    }
    if (GetThreadLocale() != m_threadLocale)
    {
        SetThreadLocale(m_threadLocale);
    }
    if (GetConsoleOutputCP() != m_codePage)
    {
        SetConsoleOutputCP(m_codePage);
    }
    if (FloatingPointControl() != m_floatingPoint)
    {
        _clearfp();
        FloatingPointControl(m_floatingPoint, FloatingPointBits);
    }
    if (GetErrorMode() != m_errorMode)
    {
        SetErrorMode(m_errorMode);
    }
    if (DllDirectory() != m_dllDirectory)
    {
        SetDllDirectoryW(m_dllDirectory.empty() ? nullptr : m_dllDirectory.c_str());
    }
    for (std::size_t i = 0; i < std::size(StandardHandles); ++i)
    {
        if (GetStdHandle(StandardHandles[i]) != m_handles[i])
        {
            SetStdHandle(StandardHandles[i], m_handles[i]);
        }
    }
}

std::wstring ProcessState::CurrentFolder()
{
    std::wstring folder(GetCurrentDirectoryW(0, nullptr), L'\0');
    folder.resize(GetCurrentDirectoryW(static_cast<DWORD>(folder.size()), folder.data()));
    return folder;
}

std::wstring ProcessState::DllDirectory()
{
    std::wstring folder(GetDllDirectoryW(0, nullptr), L'\0');
    folder.resize(GetDllDirectoryW(static_cast<DWORD>(folder.size()), folder.data()));
    return folder;
}

int ProcessState::ComApartment()
{
    APTTYPE type = APTTYPE_CURRENT;
    APTTYPEQUALIFIER qualifier = APTTYPEQUALIFIER_NONE;
    const bool known = SUCCEEDED(CoGetApartmentType(&type, &qualifier));
    // A thread that joined no apartment sees the one that another thread made for the process.
    return known && qualifier != APTTYPEQUALIFIER_IMPLICIT_MTA ? static_cast<int>(type) : NoApartment;
}
