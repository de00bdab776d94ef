// An MSSCCI library for tests, built several times with export lists in which functions are missing. It notes its calls
// in the recorder of the program that loaded it.

#include "ActiveManifest.h"
#include "ModulePath.h"
#include "ProcessDllDirectory.h"
#include "SccRecorder.h"

#include <filesystem>
#include <span>
#include <sstream>
#include <stdexcept>

namespace
{

SccRecorder& Recorder()
{
    static const auto find = reinterpret_cast<decltype(&TheSccRecorder)>(
        reinterpret_cast<void (*)()>(GetProcAddress(GetModuleHandleW(nullptr), "TheSccRecorder")));
    return *find();
}

std::string Show(LPCSTR text)
{
    return text != nullptr ? '"' + std::string(text) + '"' : "null";
}

std::string Show(LPSTR text)
{
    return Show(const_cast<LPCSTR>(text));
}

std::string Show(LONG value)
{
    std::ostringstream text;
    text << "0x" << std::hex << value;
    return text.str();
}

std::string Show(SCCCOMMAND command)
{
    return Show(static_cast<LONG>(command));
}

std::string Show(BOOL value)
{
    return Show(static_cast<LONG>(value));
}

template <typename Element>
std::string Show(std::span<Element> elements)
{
    std::string text;
    for (const auto& element : elements)
    {
        text += (text.empty() ? "" : ", ") + Show(element);
    }
    return '[' + text + ']';
}

template <typename Pointer>
std::string Show(Pointer* pointer)
{
    std::ostringstream text;
    text << "0x" << std::hex << reinterpret_cast<std::uintptr_t>(pointer);
    return text.str();
}

std::string Names(LONG count, LPCSTR* names)
{
    return names != nullptr ? Show(std::span(names, static_cast<std::size_t>(count))) : "null";
}

std::string Join()
{
    return {};
}

template <typename First, typename... Rest>
std::string Join(const First& first, const Rest&... rest)
{
    std::string text;
    if constexpr (std::is_same_v<First, std::string>)
    {
        text = first;
    }
    else
    {
        text = Show(first);
    }
    if constexpr (sizeof...(rest) > 0)
    {
        text += ", " + Join(rest...);
    }
    return text;
}

template <typename... Arguments>
SCCRTN Record(const std::string& function, const Arguments&... arguments)
{
    Recorder().calls.push_back(function + '(' + Join(arguments...) + ')');
    if (Recorder().throwing.contains(function))
    {
        throw std::runtime_error(function);
    }
    const auto result = Recorder().results.find(function);
    return result == Recorder().results.end() ? SCC_OK : result->second;
}

template <typename Handler, typename... Arguments>
SCCRTN Answer(SCCRTN result, const Handler& handler, Arguments... arguments)
{
    if (!handler)
    {
        return result;
    }
    const Handler copy = handler; // it may replace itself
    return copy(arguments...);
}

std::string LibraryName(HINSTANCE library)
{
    return std::filesystem::path(ModulePath(library)).stem().string();
}

} // namespace

extern "C" {

LONG SccGetVersion()
{
    const SCCRTN result = Record(__func__);
    return result ? result : 0x00010003;
}

SCCRTN SccInitialize(LPVOID* context, HWND window, LPCSTR caller, LPSTR sccName, LPLONG capabilities,
                     LPSTR auxPathLabel, LPLONG checkoutCommentLength, LPLONG commentLength)
{
    const SCCRTN result = Record(__func__, *context, window, caller, sccName, auxPathLabel);
    return Answer(result, Recorder().initialize, context, window, caller, sccName, capabilities, auxPathLabel,
                  checkoutCommentLength, commentLength);
}

SCCRTN SccUninitialize(LPVOID context)
{
    return Answer(Record(__func__, context), Recorder().uninitialize, context);
}

SCCRTN SccOpenProject(LPVOID context, HWND window, LPSTR user, LPCSTR projectName, LPCSTR localPath, LPSTR auxPath,
                      LPCSTR comment, LPTEXTOUTPROC output, LONG flags)
{
    const SCCRTN result = Record(__func__, context, window, user, projectName, localPath, auxPath, comment, flags);
    return Answer(result, Recorder().openProject, context, window, user, projectName, localPath, auxPath, comment,
                  output, flags);
}

SCCRTN SccCloseProject(LPVOID context)
{
    return Record(__func__, context);
}

SCCRTN SccGetProjPath(LPVOID context, HWND window, LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath,
                      BOOL allowChangePath, LPBOOL isNew)
{
    const SCCRTN result =
        Record(__func__, context, window, user, projectName, localPath, auxPath, allowChangePath, *isNew);
    return Answer(result, Recorder().getProjPath, context, window, user, projectName, localPath, auxPath,
                  allowChangePath, isNew);
}

SCCRTN SccGet(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block)
{
    const SCCRTN result = Record(__func__, context, window, count, Names(count, names), options, block);
    return Answer(result, Recorder().get, context, window, count, names, options, block);
}

SCCRTN SccCheckout(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG options,
                   LPCMDOPTS block)
{
    return Record(__func__, context, window, count, Names(count, names), comment, options, block);
}

SCCRTN SccUncheckout(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block)
{
    return Record(__func__, context, window, count, Names(count, names), options, block);
}

SCCRTN SccCheckin(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG options, LPCMDOPTS block)
{
    return Record(__func__, context, window, count, Names(count, names), comment, options, block);
}

SCCRTN SccAdd(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG* options, LPCMDOPTS block)
{
    const SCCRTN result = Record(__func__, context, window, count, Names(count, names), comment,
                                 std::span(options, static_cast<std::size_t>(count)), block);
    return Answer(result, Recorder().add, context, window, count, names, comment, options, block);
}

SCCRTN SccBeginBatch()
{
    return Record(__func__);
}

SCCRTN SccEndBatch()
{
    return Record(__func__);
}

SCCRTN SccHistory(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block)
{
    const SCCRTN result = Record(__func__, context, window, count, Names(count, names), options, block);
    return Answer(result, Recorder().history, context, window, count, names, options, block);
}

SCCRTN SccProperties(LPVOID context, HWND window, LPCSTR name)
{
    return Record(__func__, context, window, name);
}

SCCRTN SccQueryInfo(LPVOID context, LONG count, LPCSTR* names, LPLONG status)
{
    const SCCRTN result =
        Record(__func__, context, count, Names(count, names), std::span(status, static_cast<std::size_t>(count)));
    return Answer(result, Recorder().queryInfo, context, count, names, status);
}

SCCRTN SccPopulateList(LPVOID context, SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback,
                       LPVOID callerData, LPLONG status, LONG options)
{
    const SCCRTN result = Record(__func__, context, command, count, Names(count, names), callerData, status, options);
    return Answer(result, Recorder().populateList, context, command, count, names, callback, callerData, status,
                  options);
}

SCCRTN SccRunScc(LPVOID context, HWND window, LONG count, LPCSTR* names)
{
    return Record(__func__, context, window, count, Names(count, names));
}

SCCRTN SccGetCommandOptions(LPVOID context, HWND window, SCCCOMMAND command, LPCMDOPTS* block)
{
    const SCCRTN result =
        Record(__func__, context, window, command, block != nullptr ? "block " + Show(*block) : std::string("null"));
    return Answer(result, Recorder().getCommandOptions, context, window, command, block);
}

SCCRTN SccAddFromScc(LPVOID context, HWND window, LPLONG count, LPCSTR** names)
{
    const SCCRTN result = Record(__func__, context, window, count, names);
    return Answer(result, Recorder().addFromScc, context, window, count, names);
}

SCCRTN SccSetOption(LPVOID context, LONG option, LONG value)
{
    return Record(__func__, context, option, value);
}

} // extern "C"

BOOL WINAPI DllMain(HINSTANCE library, DWORD reason, void* processEnds)
{
    if (reason == DLL_PROCESS_ATTACH)
    {
        Recorder().calls.push_back("load " + LibraryName(library));
        Recorder().manifestAtLoad = ActiveManifest();
        Recorder().dllDirectoryAtLoad = ProcessDllDirectory::Current();
    }
    else if (reason == DLL_PROCESS_DETACH && processEnds == nullptr)
    {
        Recorder().calls.push_back("unload " + LibraryName(library));
    }
    return TRUE;
}
