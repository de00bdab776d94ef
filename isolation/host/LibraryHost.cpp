#include "LibraryHost.h"

#include "CrashReport.h"
#include "CurrentFolderPath.h"
#include "DllDirectoryScope.h"
#include "SccCalls.h"

#include <objbase.h>

#include <array>
#include <cstring>
#include <utility>

namespace
{

// A longer text is cut. The rest of the area is for the message's numbers.
constexpr std::size_t LongestText = Wire::BackgroundBytes - 1024;

using Performer = void (*)(HMODULE library, MessageReader& request, LibrarySide& side, MessageWriter& reply);

template <std::size_t Index>
void PerformCall(HMODULE library, MessageReader& request, LibrarySide& side, MessageWriter& reply)
{
    constexpr const auto& Call = std::get<Index>(SccCalls::All);
    using Function = typename std::remove_cvref_t<decltype(Call)>::Function;
    auto* const function =
        reinterpret_cast<Function*>(reinterpret_cast<void (*)()>(GetProcAddress(library, Call.name)));
    Perform(Call, function, request, side, reply);
}

template <std::size_t... Indices>
constexpr auto PerformersOf(std::index_sequence<Indices...>)
{
    static_assert(((std::get<Indices>(SccCalls::All).number == Indices) && ...));
    return std::array{Performer{PerformCall<Indices>}...};
}

constexpr auto Performers =
    PerformersOf(std::make_index_sequence<std::tuple_size_v<std::remove_cvref_t<decltype(SccCalls::All)>>>());

void WriteText(MessageWriter& message, LPCSTR text)
{
    if (text == nullptr)
    {
        message.Text(nullptr);
    }
    else
    {
        message.Text(std::string_view(text, strnlen(text, LongestText)));
    }
}

} // namespace

LibraryHost* LibraryHost::s_host = nullptr;

LibraryHost::LibraryHost(InheritedHandles handles) : m_handles(std::move(handles)), m_memory(m_handles.memory.Get())
{
    s_host = this;
    m_side.output = Output;
    m_side.populate = Populate;
}

LibraryHost::~LibraryHost()
{
    s_host = nullptr;
}

bool LibraryHost::Run()
{
    if (!m_memory)
    {
        return false;
    }
    ReportCrashTo(m_memory.GetState().crash);
    const HANDLE requested = m_handles.requested.Get();
    try
    {
        for (bool more = true; more;)
        {
            if (MsgWaitForMultipleObjectsEx(1, &requested, INFINITE, QS_ALLINPUT, MWMO_INPUTAVAILABLE) == WAIT_OBJECT_0)
            {
                more = Perform();
            }
            else
            {
                DispatchOneMessage();
            }
        }
        return true;
    }
    catch (const MessageError&)
    {
        return false;
    }
}

/// Performs one request. False when it was the last one.
bool LibraryHost::Perform()
{
    ReportCrashTo(m_memory.GetState().crash); // the library may have replaced the handler
    MessageReader request(m_memory.Request());
    const MessageHeader& header = request.Header();
    MessageWriter reply(m_memory.Reply(), {0, MessageKind::Reply, header.number, header.function});
    if (const std::wstring folder = request.WideText(); !folder.empty() && folder != CurrentFolderPath())
    {
        SetCurrentDirectoryW(folder.c_str());
    }
    switch (header.kind)
    {
    case MessageKind::Load:
        Load(request, reply);
        break;
    case MessageKind::Call:
        MessageReader::Check(header.function < Performers.size());
        m_isCalling = true;
        Performers[header.function](m_library.Get(), request, m_side, reply);
        m_isCalling = false;
        break;
    case MessageKind::Quit:
        m_library.Reset();
        break;
    default:
        throw MessageError();
    }
    reply.Finish();
    SetEvent(m_handles.replied.Get());
    return header.kind != MessageKind::Quit;
}

/// Loads the library as OrvixCore does, except that the library's own folder is searched first for what it needs.
void LibraryHost::Load(MessageReader& request, MessageWriter& reply)
{
    const std::wstring library = request.WideText();
    const std::wstring searchFolder = request.WideText();
    const bool isApartment = request.Flag();
    request.End();
    if (isApartment)
    {
        static_cast<void>(CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED));
    }
    DWORD error = ERROR_SUCCESS;
    {
        const DllDirectoryScope directory(searchFolder);
        m_library.Reset(LoadLibraryExW(library.c_str(), nullptr, LOAD_WITH_ALTERED_SEARCH_PATH));
        error = m_library ? ERROR_SUCCESS : GetLastError();
    }
    reply.Number(std::uint32_t{error});
    reply.Number(std::uint32_t{GetACP()});
    ReportCrashTo(m_memory.GetState().crash);
}

/// Only one, because a window may ask for painting without an end.
void LibraryHost::DispatchOneMessage()
{
    MSG message;
    if (PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE))
    {
        TranslateMessage(&message);
        DispatchMessageW(&message);
    }
}

void LibraryHost::Wait(HANDLE event) const
{
    while (MsgWaitForMultipleObjects(1, &event, FALSE, INFINITE, QS_SENDMESSAGE) != WAIT_OBJECT_0)
    {
        MSG message;
        PeekMessageW(&message, nullptr, 0, 0, PM_NOREMOVE | PM_QS_SENDMESSAGE);
    }
}

LONG LibraryHost::Ask(MessageKind kind, LONG fallback, const std::function<void(MessageWriter&)>& write)
{
    const bool isMain = GetCurrentThreadId() == m_thread;
    if (isMain && m_isAsking) // a window of the library was called in the middle of a question
    {
        return fallback;
    }
    const bool isOfCall = isMain && m_isCalling;
    std::unique_lock lock(m_background, std::defer_lock);
    if (!isOfCall)
    {
        lock.lock();
    }
    try
    {
        MessageWriter message(isOfCall ? m_memory.Reply() : m_memory.Background(), {0, kind, 0, 0});
        write(message);
        message.Finish();
    }
    catch (const MessageError&)
    {
        return fallback;
    }
    SetEvent((isOfCall ? m_handles.replied : m_handles.backgroundAsked).Get());
    const HANDLE answered = (isOfCall ? m_handles.requested : m_handles.backgroundAnswered).Get();
    if (isMain)
    {
        m_isAsking = true;
        Wait(answered);
        m_isAsking = false;
    }
    else
    {
        WaitForSingleObject(answered, INFINITE);
    }
    return isOfCall ? m_memory.GetState().callAnswer : m_memory.GetState().backgroundAnswer;
}

LONG LibraryHost::Output(LPCSTR text, LONG kind)
{
    if (IsBackgroundKind(kind))
    {
        return SCC_MSG_RTN_OK;
    }
    return s_host->Ask(MessageKind::Output, SCC_MSG_RTN_OK, [&](MessageWriter& message) {
        message.Number(static_cast<std::int32_t>(kind));
        WriteText(message, text);
    });
}

BOOL LibraryHost::Populate(LPVOID, BOOL add, LONG status, LPSTR fileName)
{
    return s_host->Ask(MessageKind::Populate, TRUE, [&](MessageWriter& message) {
        message.Number(static_cast<std::int32_t>(add));
        message.Number(static_cast<std::int32_t>(status));
        WriteText(message, fileName);
    });
}
