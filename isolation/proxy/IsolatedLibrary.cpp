#include "IsolatedLibrary.h"

#include "CurrentFolderPath.h"

#include <objbase.h>

#include <shared_mutex>
#include <utility>
#include <vector>

namespace
{

using namespace std::chrono_literals;

constexpr auto EndPatience = 5s;

std::wstring Wide(const char* ascii)
{
    return {ascii, ascii + std::strlen(ascii)};
}

std::string Ansi(const std::wstring& text)
{
    std::string bytes(text.size() * 4, '\0');
    bytes.resize(
        static_cast<std::size_t>(WideCharToMultiByte(CP_ACP, 0, text.data(), static_cast<int>(text.size()),
                                                     bytes.data(), static_cast<int>(bytes.size()), nullptr, nullptr)));
    return bytes;
}

/// The thread's windows belong to a single-threaded apartment of COM.
bool IsApartment()
{
    APTTYPE type{};
    APTTYPEQUALIFIER qualifier{};
    return CoGetApartmentType(&type, &qualifier) == S_OK && (type == APTTYPE_STA || type == APTTYPE_MAINSTA);
}

// Only one thread at a time paints while it waits: a window that is painting may call the library, and then waits too.
// A thread_local variable would cost handles in a DLL that is loaded and unloaded.
std::atomic<bool> isPainting = false;

/// Waits for at most so long. Meanwhile the windows of this thread are painted, and other threads send messages to
/// them.
void WaitHandlingMessages(HANDLE handle, DWORD milliseconds)
{
    const DWORD count = handle != nullptr ? 1 : 0;
    const DWORD wakeMask = isPainting ? QS_SENDMESSAGE : QS_PAINT | QS_SENDMESSAGE;
    if (MsgWaitForMultipleObjectsEx(count, &handle, milliseconds, wakeMask, MWMO_INPUTAVAILABLE) == WAIT_OBJECT_0 &&
        count != 0)
    {
        return;
    }
    const bool mayPaint = !isPainting.exchange(true);
    MSG message;
    const bool isThere =
        PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE | PM_QS_SENDMESSAGE | (mayPaint ? PM_QS_PAINT : 0)) != FALSE;
    if (isThere && message.message == WM_QUIT)
    {
        PostQuitMessage(static_cast<int>(message.wParam)); // for the host's own loop
    }
    else if (isThere)
    {
        DispatchMessageW(&message);
    }
    if (mayPaint)
    {
        isPainting = false;
    }
}

} // namespace

IsolatedLibrary::Turn::Turn(IsolatedLibrary& library) : m_library(library)
{
    constexpr DWORD Period = 10; // milliseconds

    const DWORD self = GetCurrentThreadId();
    DWORD caller = 0;
    while (!library.m_caller.compare_exchange_strong(caller, self))
    {
        if (caller == self || self == library.m_listenerId)
        {
            return;
        }
        WaitHandlingMessages(nullptr, Period);
        caller = 0;
    }
    m_isGiven = true;
}

IsolatedLibrary::Turn::~Turn()
{
    if (!m_isGiven)
    {
        return;
    }
    if (m_library.m_endsAfterCall.exchange(false))
    {
        m_library.End();
    }
    m_library.m_caller = 0;
}

IsolatedLibrary::Listing::Listing(IsolatedLibrary& library) : m_library(library)
{
    library.m_populateData = library.m_side.populateData;
    library.m_populate = library.m_side.populate;
}

IsolatedLibrary::Listing::~Listing()
{
    constexpr DWORD Period = 10; // milliseconds

    m_library.m_populate = nullptr;
    while (!m_library.m_listing.try_lock()) // another thread is in the callback
    {
        WaitHandlingMessages(nullptr, Period);
    }
    m_library.m_listing.unlock();
}

void IsolatedLibrary::Start()
{
    m_process = LibraryProcess::Start(m_settings.program);
    if (!m_process)
    {
        Report(m_settings.name + L" does not start: error " + std::to_wstring(GetLastError()) + L" for " +
               m_settings.program.wstring());
        throw Failure{SCC_E_INITIALIZEFAILED};
    }
    m_state = State::Running;
    MessageWriter request = Begin(MessageKind::Load, 0);
    request.Text(std::wstring_view(m_settings.library.native()));
    request.Text(std::wstring_view(m_searchFolder));
    request.Flag(IsApartment());
    MessageReader reply = Exchange(request);
    const auto error = reply.Number<std::uint32_t>();
    const auto codePage = reply.Number<std::uint32_t>();
    reply.End();
    if (error != ERROR_SUCCESS || codePage != GetACP())
    {
        Report(error != ERROR_SUCCESS ? m_settings.name + L" does not load: error " + std::to_wstring(error) +
                                            L" for " + m_settings.library.wstring()
                                      : m_settings.name + L" has the code page " + std::to_wstring(codePage) +
                                            L" in its own process, not " + std::to_wstring(GetACP()));
        m_process.reset();
        m_isSent = false; // nothing is left that a later failure would have to end
        m_state = State::NotStarted;
        throw Failure{SCC_E_INITIALIZEFAILED};
    }
}

MessageWriter IsolatedLibrary::Begin(MessageKind kind, std::uint32_t function)
{
    m_functionNumber = function;
    MessageWriter request(m_process->Memory().Request(), {0, kind, ++m_number, function});
    request.Text(std::wstring_view(CurrentFolderPath()));
    return request;
}

MessageReader IsolatedLibrary::Exchange(MessageWriter& request)
{
    request.Finish();
    m_isSent = true;
    m_parent = ParentWindow(m_side.window);
    AllowSetForegroundWindow(m_process->Id());
    CallWait wait(*m_process, m_parent.OfThisThread(), m_settings.patience, {m_settings.name, Wide(m_function)});
    SetEvent(m_process->Requested());
    CallWait::Result result = CallWait::Result::Signalled;
    while ((result = wait.For(m_process->Replied())) == CallWait::Result::Signalled)
    {
        MessageReader message(m_process->Memory().Reply());
        if (message.Header().kind == MessageKind::Reply)
        {
            MessageReader::Check(message.Header().number == m_number && message.Header().function == m_functionNumber);
            return message;
        }
        m_process->Memory().GetState().callAnswer = static_cast<std::int32_t>(Answer(message));
        wait.Restart();
        SetEvent(m_process->Requested());
    }
    const std::wstring function = Wide(m_function);
    Lose(result == CallWait::Result::Ended ? m_process->WhyEnded(function)
         : result == CallWait::Result::Hangs
             ? L"hangs in " + function + L" and was ended: no answer and no window for " +
                   std::to_wstring(m_settings.patience.count()) + L" seconds"
             : L"was ended by the user, " + std::to_wstring(wait.Elapsed().count()) + L" seconds after the start of " +
                   function);
    throw Failure{SCC_E_NONSPECIFICERROR};
}

LONG IsolatedLibrary::Answer(MessageReader& message)
{
    const auto kindOrAdd = message.Number<std::int32_t>();
    const bool isPopulate = message.Header().kind == MessageKind::Populate;
    MessageReader::Check(isPopulate || message.Header().kind == MessageKind::Output);
    MessageReader::Check(isPopulate || !IsBackgroundKind(kindOrAdd));
    const LONG status = isPopulate ? message.Number<std::int32_t>() : 0;
    std::string text;
    const bool hasText = message.CopyText(text);
    message.End();
    try
    {
        if (isPopulate)
        {
            const std::shared_lock lock(m_listing);
            const POPLISTFUNC populate = m_populate;
            return populate != nullptr ? populate(m_populateData, kindOrAdd, status, hasText ? text.data() : nullptr)
                                       : FALSE;
        }
        const LPTEXTOUTPROC output = m_side.output;
        return output != nullptr ? output(hasText ? text.c_str() : nullptr, kindOrAdd) : SCC_MSG_RTN_OK;
    }
    catch (...) // the host's own, which must not go on while the library waits
    {
        return isPopulate ? FALSE : SCC_MSG_RTN_CANCEL;
    }
}

void IsolatedLibrary::FailMessage()
{
    if (m_isSent)
    {
        Lose(L"sent an answer that cannot be read, in " + Wide(m_function));
    }
    else
    {
        Report(m_settings.name + L" was not called: the arguments of " + Wide(m_function) + L" are too long");
    }
}

void IsolatedLibrary::Abandon()
{
    if (m_isSent)
    {
        EndLost();
    }
}

void IsolatedLibrary::Lose(const std::wstring& why)
{
    EndLost();
    Report(m_settings.name + L' ' + why + L". The operation failed; this program goes on. To use " + m_settings.name +
           L" again, start source control again. If it happens again, report this line to the maker of " +
           m_settings.library.wstring());
}

void IsolatedLibrary::EndLost()
{
    m_process->End();
    m_state = State::Lost;
    m_parent.Restore();
}

void IsolatedLibrary::Report(const std::wstring& text)
{
    m_lastReport = text;
    OutputDebugStringW((text + L"\r\n").c_str());
    if (const LPTEXTOUTPROC output = m_side.output)
    {
        try
        {
            output(Ansi(text).c_str(), SCC_MSG_ERROR);
        }
        catch (...) // the host's own; the failed call has its result
        {
        }
    }
}

void IsolatedLibrary::Listen()
{
    HMODULE unused = nullptr; // the thread frees this module when it ends
    GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS, reinterpret_cast<LPCWSTR>(&Listener), &unused);
    auto* const self = new std::shared_ptr<IsolatedLibrary>(shared_from_this());
    m_listener.Reset(CreateThread(nullptr, 0, Listener, self, 0, &m_listenerId));
    if (!m_listener)
    {
        delete self;
        FreeLibrary(unused);
    }
}

DWORD WINAPI IsolatedLibrary::Listener(LPVOID library)
{
    HMODULE module = nullptr;
    GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                       reinterpret_cast<LPCWSTR>(&Listener), &module);
    {
        const std::unique_ptr<std::shared_ptr<IsolatedLibrary>> self(
            static_cast<std::shared_ptr<IsolatedLibrary>*>(library));
        (*self)->AnswerInBackground();
    }
    FreeLibraryAndExitThread(module, 0);
}

void IsolatedLibrary::AnswerInBackground()
{
    const std::shared_ptr<LibraryProcess> process = m_process;
    const HANDLE handles[] = {process->BackgroundAsked(), process->Process()};
    while (WaitForMultipleObjects(2, handles, FALSE, INFINITE) == WAIT_OBJECT_0)
    {
        LONG answer = SCC_MSG_RTN_OK;
        try
        {
            MessageReader message(process->Memory().Background());
            answer = Answer(message);
        }
        catch (const std::exception&) // no message, or no memory: the library goes on
        {
        }
        process->NoteSign();
        process->Memory().GetState().backgroundAnswer = static_cast<std::int32_t>(answer);
        SetEvent(process->BackgroundAnswered());
    }
}

SCCRTN IsolatedLibrary::Uninitialize()
{
    SCCRTN result = SCC_OK;
    {
        const Turn turn(*this);
        if (!turn)
        {
            m_endsAfterCall = true;
            return SCC_OK;
        }
        result = End();
    }
    // A callback that waits for this thread to go on must not stop it for good.
    const auto end = std::chrono::steady_clock::now() + EndPatience;
    while (m_listener && GetCurrentThreadId() != m_listenerId &&
           WaitForSingleObject(m_listener.Get(), 0) == WAIT_TIMEOUT && std::chrono::steady_clock::now() < end)
    {
        WaitHandlingMessages(m_listener.Get(), 100);
    }
    return result;
}

SCCRTN IsolatedLibrary::End()
{
    if (IsLost())
    {
        return SCC_E_NONSPECIFICERROR;
    }
    const SCCRTN result =
        Try(SccCalls::Uninitialize.name, [this] { return ExchangeCall(SccCalls::Uninitialize, nullptr); });
    if (m_state != State::Running)
    {
        return result;
    }
    m_settings.patience = EndPatience;
    Try(SccCalls::Uninitialize.name, [this] {
        MessageWriter request = Begin(MessageKind::Quit, 0);
        Exchange(request).End();
        CallWait(*m_process, nullptr, EndPatience, {m_settings.name, Wide(m_function)}).For(m_process->Process());
        return SCC_OK;
    });
    m_process->End();
    m_state = State::Lost;
    return result;
}
