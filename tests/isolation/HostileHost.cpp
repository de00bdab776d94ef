// A program in place of scc_host64.exe. It carries out calls as functions that only succeed, and breaks the rules of
// messages now and then. The number that ORVIX_HOSTILE has decides where.

#include "LibraryHost.h"
#include "SccCalls.h"

#include <array>
#include <cstdlib>
#include <cstring>
#include <random>
#include <utility>

namespace
{

template <typename... Kinds>
struct Succeeding
{
    static SCCRTN Function(typename Kinds::Type...) { return SCC_OK; }
};

template <typename... Kinds>
void PerformCall(const SccCall<Kinds...>& call, MessageReader& request, LibrarySide& side, MessageWriter& reply)
{
    Perform(call, &Succeeding<Kinds...>::Function, request, side, reply);
}

class Program
{
public:
    explicit Program(InheritedHandles handles)
        : m_handles(std::move(handles)), m_memory(m_handles.memory.Get()),
          m_random(static_cast<unsigned int>(std::atoi(std::getenv("ORVIX_HOSTILE"))))
    {
    }

    void Run()
    {
        while (WaitForSingleObject(m_handles.requested.Get(), INFINITE) == WAIT_OBJECT_0)
        {
            MessageReader request(m_memory.Request());
            const MessageKind kind = request.Header().kind;
            if (kind == MessageKind::Call)
            {
                Ask(m_memory.Background(), m_handles.backgroundAsked.Get());
            }
            Reply(request);
            SetEvent(m_handles.replied.Get());
            if (kind == MessageKind::Quit)
            {
                return;
            }
        }
    }

private:
    void Reply(MessageReader& request)
    {
        const MessageHeader header = request.Header();
        MessageWriter reply(m_memory.Reply(), {0, MessageKind::Reply, header.number, header.function});
        request.WideText();
        if (header.kind == MessageKind::Load)
        {
            reply.Number(std::uint32_t{ERROR_SUCCESS});
            reply.Number(std::uint32_t{GetACP()});
        }
        else if (header.kind == MessageKind::Call)
        {
            std::apply(
                [&](const auto&... calls) {
                    (static_cast<void>(calls.number == header.function &&
                                       (PerformCall(calls, request, m_side, reply), true)),
                     ...);
                },
                SccCalls::All);
        }
        reply.Finish();
        if (header.kind == MessageKind::Call && Random(3) == 0)
        {
            Damage(m_memory.Reply());
        }
    }

    /// Sends a text, which may be damaged, or what looks like one.
    void Ask(std::span<std::byte> area, HANDLE event)
    {
        MessageWriter message(area, {0, Random(2) == 0 ? MessageKind::Output : MessageKind::Populate, 0, 0});
        message.Number(static_cast<std::int32_t>(Random(12)));
        message.Text("text");
        message.Finish();
        Damage(area);
        SetEvent(event);
    }

    void Damage(std::span<std::byte> area)
    {
        constexpr std::array<std::uint32_t, 7> Numbers = {0, 1, 3, 16, 0x7FFFFFFF, 0x80000000, 0xFFFFFFFF};
        for (unsigned int change = Random(3) + 1; change > 0; --change)
        {
            const std::uint32_t number = Numbers[Random(Numbers.size())];
            std::memcpy(&area[Random(60)], &number, sizeof number);
        }
    }

    unsigned int Random(std::size_t limit) { return static_cast<unsigned int>(m_random() % limit); }

    InheritedHandles m_handles;
    Wire::SharedMemory m_memory;
    LibrarySide m_side;
    std::mt19937 m_random;
};

UniqueKernelHandle Argument(int index)
{
    return UniqueKernelHandle(reinterpret_cast<HANDLE>(std::strtoull(__argv[index], nullptr, 10)));
}

} // namespace

int WINAPI WinMain(HINSTANCE, HINSTANCE, LPSTR, int)
{
    Program({Argument(1), Argument(2), Argument(3), Argument(4), Argument(5)}).Run();
    return 0;
}
