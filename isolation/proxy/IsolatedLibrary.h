#pragma once

#include "CallWait.h"
#include "IsolationSettings.h"
#include "LibraryProcess.h"
#include "ParentWindow.h"
#include "SccCalls.h"
#include "SystemLock.h"

#include <atomic>
#include <memory>
#include <new>
#include <string>

/// An MSSCCI library in a process of its own, for one context of the host. The process starts with the first call. When
/// it is lost (a crash, a hang, an exit), the call and all later ones fail with SCC_E_NONSPECIFICERROR, and the host's
/// text output says why.
///
/// Calls from several threads wait for each other. A call that begins within another one on the same thread, since the
/// host's messages are dispatched meanwhile, fails; only the end may come then.
class IsolatedLibrary : public std::enable_shared_from_this<IsolatedLibrary>
{
public:
    /// `searchFolder` is searched for the DLLs that the library needs and may be empty.
    IsolatedLibrary(const IsolationSettings& settings, const std::wstring& searchFolder)
        : m_settings(settings), m_searchFolder(searchFolder)
    {
    }

    /// Calls a function of the library. SCC_E_INITIALIZEFAILED when the library does not load or has no such function.
    template <typename... Kinds>
    SCCRTN Call(const SccCall<Kinds...>& call, std::type_identity_t<typename Kinds::Type>... arguments)
    {
        return InTurn(call.name, [&] { return ExchangeCall(call, arguments...); });
    }

    /// From now on the library's callbacks are answered that come from other threads and between calls.
    void Listen();

    /// Calls SccUninitialize, unloads the library and ends its process. Returns the result of the library. Within a
    /// call of this thread, all that happens when the call returns, and the result is SCC_OK.
    SCCRTN Uninitialize();

    /// What was reported last, for people. Empty when nothing went wrong.
    const std::wstring& LastReport() const { return m_lastReport; }

    bool IsLost() const { return m_state == State::Lost; }

private:
    enum class State
    {
        NotStarted,
        Running,
        Lost
    };

    /// A call that ends without a result of the library.
    struct Failure
    {
        SCCRTN result;
    };

    /// The right to call, for a scope. False when the thread is in a call already.
    class Turn
    {
    public:
        explicit Turn(IsolatedLibrary& library);
        Turn(const Turn&) = delete;
        Turn& operator=(const Turn&) = delete;
        ~Turn();
        explicit operator bool() const { return m_isGiven; }

    private:
        IsolatedLibrary& m_library;
        bool m_isGiven = false;
    };

    /// The time in which the host's callback of SccPopulateList may be called: until the function returns.
    class Listing
    {
    public:
        explicit Listing(IsolatedLibrary& library);
        Listing(const Listing&) = delete;
        Listing& operator=(const Listing&) = delete;
        ~Listing();

    private:
        IsolatedLibrary& m_library;
    };

    /// Runs the exchange of one call, when it is its turn. Starts the process when it does not run yet.
    template <typename Exchange>
    SCCRTN InTurn(const char* function, const Exchange& exchange)
    {
        const Turn turn(*this);
        return turn && !IsLost() ? Try(function, exchange) : SCC_E_NONSPECIFICERROR;
    }

    /// The same, in the turn of this thread.
    template <typename Exchange>
    SCCRTN Try(const char* function, const Exchange& exchange)
    {
        try
        {
            if (m_state == State::NotStarted)
            {
                m_function = "its start";
                Start();
            }
            m_function = function;
            m_isSent = false;
            return exchange();
        }
        catch (const Failure& failure)
        {
            return failure.result;
        }
        catch (const MessageError&)
        {
            FailMessage();
            return SCC_E_NONSPECIFICERROR;
        }
        catch (const std::bad_alloc&)
        {
            Abandon();
            return SCC_E_NONSPECIFICERROR;
        }
    }

    template <typename... Kinds>
    SCCRTN ExchangeCall(const SccCall<Kinds...>& call, std::type_identity_t<typename Kinds::Type>... arguments)
    {
        MessageWriter request = Begin(MessageKind::Call, call.number);
        m_side.populate = nullptr;
        SendArguments(call, request, m_side, arguments...);
        const Listing listing(*this);
        MessageReader reply = Exchange(request);
        const SCCRTN result = reply.Number<std::int32_t>();
        ReceiveArguments(call, reply, m_side, arguments...);
        return result;
    }

    /// Calls SccUninitialize, unloads the library and ends its process, in the turn of this thread. Unloading may take
    /// five seconds, whatever the patience: the host may be about to end.
    SCCRTN End();

    /// Starts the process, which loads the library. Throws `Failure`.
    void Start();

    /// Begins the next request.
    MessageWriter Begin(MessageKind kind, std::uint32_t function);

    /// Sends the request and waits for the reply; answers callbacks meanwhile. Throws `Failure` when the process is
    /// lost.
    MessageReader Exchange(MessageWriter& request);

    /// Calls the host's function that a message is for.
    LONG Answer(MessageReader& message);

    /// The request was too large, or the reply breaks the rules.
    void FailMessage();

    /// Ends the process, and gives the host's window its input back.
    void EndLost();

    /// Memory ran out in a call. The library may still be at work on it.
    void Abandon();

    /// Ends the process, which is of no use any more. `why` completes the sentence that the library's name begins.
    void Lose(const std::wstring& why);

    void Report(const std::wstring& text);
    void AnswerInBackground();
    static DWORD WINAPI Listener(LPVOID library);

    IsolationSettings m_settings;
    std::wstring m_searchFolder;
    std::shared_ptr<LibraryProcess> m_process;
    std::atomic<State> m_state = State::NotStarted;
    HostSide m_side;
    std::atomic<POPLISTFUNC> m_populate = nullptr; ///< null when no SccPopulateList runs
    LPVOID m_populateData = nullptr;               ///< written only while `m_populate` is null and nobody is in it
    SystemLock m_listing;                          ///< shared by the threads that are in it
    std::wstring m_lastReport;
    UniqueKernelHandle m_listener;
    DWORD m_listenerId = 0;
    std::atomic<DWORD> m_caller = 0; ///< the thread that is in a call
    std::atomic<bool> m_endsAfterCall = false;

    // Of the running call.
    std::uint32_t m_number = 0;
    std::uint32_t m_functionNumber = 0;
    const char* m_function = "";
    bool m_isSent = false;
    ParentWindow m_parent{nullptr};
};
