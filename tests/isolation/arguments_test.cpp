#include "GuardedArea.h"
#include "SccCalls.h"
#include "SccFunctions.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <array>
#include <cstring>
#include <random>
#include <string>
#include <utility>
#include <vector>

namespace
{

constexpr MessageHeader Request = {0, MessageKind::Call, 1, 0};
constexpr MessageHeader Reply = {0, MessageKind::Reply, 1, 0};

/// Both sides in one process: the host's arguments go through messages to a function, and what it stores comes back.
class Wire : public testing::Test
{
protected:
    template <typename... Kinds>
    SCCRTN Call(const SccCall<Kinds...>& call, std::type_identity_t<typename SccCall<Kinds...>::Function*> function,
                std::type_identity_t<typename Kinds::Type>... arguments)
    {
        MessageWriter request(m_request.All(), Request);
        SendArguments(call, request, m_host, arguments...);
        request.Finish();
        MessageReader received(m_request.All());
        MessageWriter reply(m_reply.All(), Reply);
        Perform(call, function, received, m_library, reply);
        reply.Finish();
        MessageReader answer(m_reply.All());
        const SCCRTN result = answer.Number<std::int32_t>();
        ReceiveArguments(call, answer, m_host, arguments...);
        return result;
    }

    GuardedArea m_request{64};
    GuardedArea m_reply{64};
    HostSide m_host;
    LibrarySide m_library;
};

template <std::size_t... Indices>
std::vector<std::string> NamesOf(std::index_sequence<Indices...>)
{
    return {std::get<Indices>(SccCalls::All).name...};
}

constexpr auto AllIndices = std::make_index_sequence<std::tuple_size_v<std::remove_cvref_t<decltype(SccCalls::All)>>>();

} // namespace

TEST_F(Wire, KnowsTheFunctionsThatTheBridgeKnows)
{
    EXPECT_THAT(NamesOf(AllIndices), testing::ElementsAreArray(SccFunctions::Names));
}

TEST_F(Wire, GivesMinusOneForAMissingFunctionAndAnException)
{
    EXPECT_EQ(Call(SccCalls::CloseProject, nullptr, nullptr), SCC_E_INITIALIZEFAILED);
    EXPECT_EQ(Call(
                  SccCalls::CloseProject, [](LPVOID) -> SCCRTN { throw 1; }, nullptr),
              SCC_E_INITIALIZEFAILED);
}

TEST_F(Wire, KeepsTheContextOnTheLibrarysSide)
{
    LPVOID hostContext = nullptr;
    std::array<char, SCC_NAME_SIZE> name{"Depot"};
    LONG capabilities = 0;
    EXPECT_EQ(
        Call(
            SccCalls::Initialize,
            [](LPVOID* context, HWND window, LPCSTR caller, LPSTR sccName, LPLONG bits, LPSTR label, LPLONG, LPLONG) {
                EXPECT_EQ(*context, nullptr);
                EXPECT_EQ(window, reinterpret_cast<HWND>(0x1234));
                EXPECT_STREQ(caller, "host");
                EXPECT_STREQ(sccName, "Depot");
                EXPECT_EQ(label, nullptr);
                *context = reinterpret_cast<LPVOID>(0x77);
                std::memset(sccName, 0, 300); // libraries do
                std::strcpy(sccName, "New");
                *bits = static_cast<LONG>(0x80000001);
                return SCCRTN{2};
            },
            &hostContext, reinterpret_cast<HWND>(0x1234), "host", name.data(), &capabilities, nullptr, nullptr,
            nullptr),
        2);
    EXPECT_EQ(hostContext, nullptr); // its caller stores the host's own
    EXPECT_STREQ(name.data(), "New");
    EXPECT_EQ(capabilities, static_cast<LONG>(0x80000001));
    EXPECT_EQ(Call(
                  SccCalls::CloseProject,
                  [](LPVOID context) { return context == reinterpret_cast<LPVOID>(0x77) ? SCC_OK : SCCRTN{-9}; },
                  &hostContext),
              SCC_OK);
}

TEST_F(Wire, CarriesATextThatFillsItsBufferAndTerminatesWhatTheHostGets)
{
    std::array<char, SCC_USER_SIZE> user{};
    user.fill('u');
    std::array<char, SCC_PRJPATH_SIZE> auxPath{"old and longer"};
    const auto open = [&](auto function) {
        return Call(SccCalls::OpenProject, function, nullptr, nullptr, user.data(), "name", "path", auxPath.data(),
                    nullptr, nullptr, 1);
    };
    open([](LPVOID, HWND, LPSTR name, LPCSTR, LPCSTR, LPSTR aux, LPCSTR comment, LPTEXTOUTPROC output, LONG) {
        EXPECT_EQ(std::string(name), std::string(SCC_USER_SIZE, 'u'));
        EXPECT_EQ(comment, nullptr);
        EXPECT_EQ(output, nullptr);
        std::strcpy(aux, "new");
        return SCC_OK;
    });
    EXPECT_EQ(std::string(user.data(), user.size()), std::string(SCC_USER_SIZE, 'u')) << "unchanged";
    EXPECT_STREQ(auxPath.data(), "new");

    open([](LPVOID, HWND, LPSTR name, LPCSTR project, LPCSTR, LPSTR aux, LPCSTR, LPTEXTOUTPROC, LONG) {
        std::memset(name, 'x', 200);
        std::strcpy(const_cast<LPSTR>(project), "what it may only read");
        std::memset(aux, 'y', 301);
        return SCC_OK;
    });
    EXPECT_EQ(std::string(user.data()), std::string(SCC_USER_SIZE - 1, 'x'));
    EXPECT_EQ(std::string(auxPath.data()), std::string(SCC_PRJPATH_SIZE - 1, 'y'));
}

TEST_F(Wire, DoesNotWriteATextThatTheLibraryLeavesAlone)
{
    auto* const literal = const_cast<LPSTR>("in memory that cannot be written");
    BOOL isNew = FALSE;
    const auto leave = [](LPVOID, HWND, LPSTR, LPSTR, LPSTR, LPSTR, BOOL allow, LPBOOL place) {
        *place = allow;
        return SCC_OK;
    };
    EXPECT_EQ(Call(SccCalls::GetProjPath, leave, nullptr, nullptr, literal, nullptr, nullptr, nullptr, TRUE, &isNew),
              SCC_OK);
    EXPECT_EQ(isNew, TRUE);
}

TEST_F(Wire, CarriesNamesAndStatusesOfManyFiles)
{
    static constexpr LONG Count = 2000;
    std::vector<std::string> texts;
    std::vector<LPCSTR> names;
    for (LONG i = 0; i < Count; ++i)
    {
        texts.push_back("C:\\project\\file " + std::to_string(i) + ".txt");
    }
    for (const std::string& text : texts)
    {
        names.push_back(text.c_str());
    }
    names[7] = nullptr;
    std::vector<LONG> status(Count + 1, 0x7777);
    EXPECT_EQ(Call(
                  SccCalls::QueryInfo,
                  [](LPVOID, LONG count, LPCSTR* files, LPLONG words) -> SCCRTN {
                      EXPECT_EQ(count, Count);
                      for (LONG i = 0; i < count; ++i)
                      {
                          const std::string expected = "C:\\project\\file " + std::to_string(i) + ".txt";
                          EXPECT_TRUE(i == 7 ? files[i] == nullptr : files[i] == expected);
                          words[i] = i == 3 ? words[i] : i;
                      }
                      words[count] = 5; // an overrun
                      const_cast<LPSTR>(files[0])[0] = '#';
                      return SCC_OK;
                  },
                  nullptr, Count, names.data(), status.data()),
              SCC_OK);
    EXPECT_EQ(status[2], 2);
    EXPECT_EQ(status[3], 0x7777);
    EXPECT_EQ(status[Count - 1], Count - 1);
    EXPECT_EQ(status[Count], 0x7777);
    EXPECT_EQ(texts[0].front(), 'C');
}

TEST_F(Wire, CarriesNoNamesAndACountThatIsNegative)
{
    const auto function = [](LPVOID, LONG count, LPCSTR* names, LPLONG status) -> SCCRTN {
        return count == -3 && names == nullptr && status == nullptr ? SCC_OK : SCC_E_NONSPECIFICERROR;
    };
    EXPECT_EQ(Call(SccCalls::QueryInfo, function, nullptr, -3, nullptr, nullptr), SCC_OK);
    LPCSTR one = "a";
    const auto counts = [](LPVOID, LONG count, LPCSTR* names, LPLONG status) -> SCCRTN {
        return count == 0 && names != nullptr && status != nullptr ? SCC_OK : SCC_E_NONSPECIFICERROR;
    };
    LONG status = 4;
    EXPECT_EQ(Call(SccCalls::QueryInfo, counts, nullptr, 0, &one, &status), SCC_OK);
    EXPECT_EQ(status, 4);
}

TEST_F(Wire, CarriesOneOptionWordForEachFile)
{
    std::array<LPCSTR, 2> names = {"a", "b"};
    std::array<LONG, 2> options = {0, SCC_KEEP_CHECKEDOUT};
    const auto function = [](LPVOID, HWND, LONG, LPCSTR*, LPCSTR comment, LONG* words, LPCMDOPTS block) -> SCCRTN {
        EXPECT_STREQ(comment, "why");
        EXPECT_EQ(block, nullptr);
        EXPECT_EQ(words[0], 0);
        return words[1];
    };
    EXPECT_EQ(Call(SccCalls::Add, function, nullptr, nullptr, 2, names.data(), "why", options.data(), nullptr),
              SCC_KEEP_CHECKEDOUT);
}

TEST_F(Wire, KnowsABlockOfOptionsByAHandle)
{
    static int block = 0;
    LPCMDOPTS handle = nullptr;
    const auto ask = [](LPVOID, HWND, SCCCOMMAND, LPCMDOPTS* place) -> SCCRTN {
        EXPECT_TRUE(*place == nullptr || *place == &block);
        *place = &block;
        return SCC_OK;
    };
    EXPECT_EQ(Call(SccCalls::GetCommandOptions, ask, nullptr, nullptr, SCC_COMMAND_GET, &handle), SCC_OK);
    ASSERT_NE(handle, nullptr);
    EXPECT_NE(handle, &block);
    const LPCMDOPTS first = handle;
    EXPECT_EQ(Call(SccCalls::GetCommandOptions, ask, nullptr, nullptr, SCC_COMMAND_GET, &handle), SCC_OK);
    EXPECT_EQ(handle, first);

    LPCSTR name = "a";
    const auto get = [](LPVOID, HWND, LONG, LPCSTR*, LONG, LPCMDOPTS used) -> SCCRTN {
        return used == &block ? 1 : used == nullptr ? 2 : 3;
    };
    EXPECT_EQ(Call(SccCalls::Get, get, nullptr, nullptr, 1, &name, 0, handle), 1);
    EXPECT_EQ(Call(SccCalls::Get, get, nullptr, nullptr, 1, &name, 0, &name), 2) << "a stranger becomes null";
    EXPECT_EQ(Call(
                  SccCalls::GetCommandOptions,
                  [](LPVOID, HWND, SCCCOMMAND, LPCMDOPTS* place) {
                      return place == nullptr ? SCC_I_ADV_SUPPORT : SCCRTN{-9};
                  },
                  nullptr, nullptr, SCC_COMMAND_OPTIONS, nullptr),
              SCC_I_ADV_SUPPORT);
}

TEST_F(Wire, CarriesTheFilesOfTheVersionControlSystem)
{
    static std::array<LPCSTR, 2> found = {"one", "two"};
    static bool isFreed = false;
    const auto add = [](LPVOID, HWND, LPLONG count, LPCSTR** names) -> SCCRTN {
        if (count == nullptr)
        {
            isFreed = names != nullptr && *names == found.data();
            *names = nullptr;
            return SCC_OK;
        }
        EXPECT_EQ(*count, 1);
        EXPECT_STREQ(**names, "folder");
        *count = 2;
        *names = found.data();
        return SCC_OK;
    };
    LONG count = 1;
    LPCSTR folder = "folder";
    LPCSTR* names = &folder;
    EXPECT_EQ(Call(SccCalls::AddFromScc, add, nullptr, nullptr, &count, &names), SCC_OK);
    ASSERT_EQ(count, 2);
    EXPECT_STREQ(names[0], "one");
    EXPECT_STREQ(names[1], "two");
    EXPECT_EQ(Call(SccCalls::AddFromScc, add, nullptr, nullptr, nullptr, &names), SCC_OK);
    EXPECT_TRUE(isFreed);
    EXPECT_EQ(names, nullptr);

    names = &folder;
    count = 1;
    const auto leave = [](LPVOID, HWND, LPLONG, LPCSTR**) -> SCCRTN { return SCC_E_NONSPECIFICERROR; };
    EXPECT_EQ(Call(SccCalls::AddFromScc, leave, nullptr, nullptr, &count, &names), SCC_E_NONSPECIFICERROR);
    EXPECT_EQ(names, &folder);
}

TEST_F(Wire, RefusesMoreAddedFilesThanTheHostsOwnArrayHas)
{
    constexpr std::uint32_t SameNames = 1;

    LONG count = 1;
    LPCSTR folder = "folder";
    LPCSTR* names = &folder;
    for (const std::int32_t answered : {1, 2})
    {
        count = 1;
        MessageWriter request(m_request.All(), Request);
        SendArguments(SccCalls::AddFromScc, request, m_host, nullptr, nullptr, &count, &names);
        MessageWriter reply(m_reply.All(), Reply);
        reply.Number(answered);
        reply.Number(SameNames);
        reply.Finish();
        MessageReader answer(m_reply.All());
        const auto receive = [&] {
            ReceiveArguments(SccCalls::AddFromScc, answer, m_host, nullptr, nullptr, &count, &names);
        };
        if (answered == 1)
        {
            EXPECT_NO_THROW(receive());
        }
        else
        {
            EXPECT_THROW(receive(), MessageError);
        }
        EXPECT_EQ(names, &folder);
    }
}

// Hostile messages

namespace
{

constexpr int FuzzedMessages = 200000; // half of them requests, half replies

/// Uses arguments as a library does: reads the texts and writes where it may.
class User
{
public:
    void Use(LPVOID) {}
    void Use(LPVOID* place)
    {
        if (place != nullptr)
        {
            *place = nullptr;
        }
    }
    void Use(HWND) {}
    void Use(SCCCOMMAND) {}
    void Use(POPLISTFUNC) {}
    void Use(LPTEXTOUTPROC) {}
    void Use(LONG number)
    {
        m_count = m_hasCount ? m_count : number;
        m_hasCount = true;
    }
    void Use(BOOL) {}
    void Use(LPBOOL place) { Write(place); }
    void Use(LPLONG place) { Write(place); }
    void Use(LPSTR text)
    {
        if (text != nullptr)
        {
            m_sum += std::strlen(text);
            std::memset(text, 'x', 40);
        }
    }
    void Use(LPCSTR text) { m_sum += text != nullptr ? std::strlen(text) : 0; }
    void Use(LPCSTR* names)
    {
        for (LONG i = 0; names != nullptr && i < m_count; ++i)
        {
            Use(names[i]);
        }
    }
    void Use(LPCSTR** names)
    {
        if (names != nullptr && *names != nullptr)
        {
            Use(**names);
        }
    }

    std::size_t Sum() const { return m_sum; }

private:
    template <typename Value>
    static void Write(Value* place)
    {
        if (place != nullptr)
        {
            *place = 3;
        }
    }

    LONG m_count = 0;
    bool m_hasCount = false;
    std::size_t m_sum = 0;
};

template <typename... Kinds>
struct UserOf
{
    static SCCRTN Function(typename Kinds::Type... arguments)
    {
        User user;
        (user.Use(arguments), ...);
        return static_cast<SCCRTN>(user.Sum() % 2);
    }
};

template <typename... Kinds>
constexpr auto FunctionFor(const SccCall<Kinds...>&)
{
    return &UserOf<Kinds...>::Function;
}

/// Arguments of every kind that a host may pass.
class Caller
{
public:
    template <typename Type>
    Type Make()
    {
        if constexpr (std::is_same_v<Type, LPCSTR*>)
        {
            return m_names.data();
        }
        else if constexpr (std::is_same_v<Type, LPCSTR**>)
        {
            m_added = m_names.data();
            return &m_added;
        }
        else if constexpr (std::is_same_v<Type, LPLONG>)
        {
            m_words = {1, 2, 3};
            return m_words.data();
        }
        else if constexpr (std::is_same_v<Type, LPBOOL>)
        {
            return &m_isNew;
        }
        else if constexpr (std::is_same_v<Type, LPCSTR>)
        {
            return "text";
        }
        else if constexpr (std::is_same_v<Type, LPSTR>)
        {
            return m_buffers[m_nextBuffer++ % m_buffers.size()].data();
        }
        else if constexpr (std::is_same_v<Type, LPVOID*>)
        {
            return &m_place;
        }
        else if constexpr (std::is_same_v<Type, LONG>)
        {
            return static_cast<LONG>(m_names.size());
        }
        else
        {
            return Type{};
        }
    }

private:
    std::array<LPCSTR, 3> m_names = {"C:\\a", "C:\\folder\\b", "c"};
    LPCSTR* m_added = nullptr;
    std::array<LONG, 3> m_words = {};
    BOOL m_isNew = TRUE;
    LPVOID m_place = nullptr;
    std::array<std::array<char, 512>, 4> m_buffers = {};
    std::size_t m_nextBuffer = 0;
};

class Fuzz : public Wire
{
public:
    /// A call of the function with this index.
    template <std::size_t Index>
    void Run()
    {
        RunCall(std::get<Index>(SccCalls::All));
    }

protected:
    /// Moves a message to the end of its area, so that nobody can read beyond it, and changes some of its bytes, or its
    /// size, if `isDamaged`.
    std::span<std::byte> Arrived(const GuardedArea& area, bool isDamaged)
    {
        std::uint32_t size = 0;
        std::memcpy(&size, area.All().data(), sizeof size);
        const std::span<std::byte> message = area.Last(size);
        std::memmove(message.data(), area.All().data(), size);
        for (unsigned change = isDamaged ? Random(4) + 1 : 0; change > 0; --change)
        {
            message[Random(size)] = Random(3) == 0 ? std::byte{0xFF} : static_cast<std::byte>(Random(256));
        }
        if (isDamaged && Random(4) == 0)
        {
            size = Random(size + 8);
            std::memcpy(message.data(), &size, sizeof size);
        }
        return message;
    }

    unsigned Random(unsigned limit) { return static_cast<unsigned>(m_random() % limit); }

    template <typename... Kinds>
    void RunCall(const SccCall<Kinds...>& call)
    {
        Caller caller;
        std::tuple<typename Kinds::Type...> arguments{caller.Make<typename Kinds::Type>()...};
        std::apply([&](auto... values) { Exchange(call, values...); }, arguments);
    }

    template <typename... Kinds>
    void Exchange(const SccCall<Kinds...>& call, typename Kinds::Type... arguments)
    {
        const bool damagesReply = Random(2) == 0;
        try
        {
            MessageWriter request(m_request.All(), Request);
            SendArguments(call, request, m_host, arguments...);
            request.Finish();
            MessageReader received(Arrived(m_request, !damagesReply));
            MessageWriter reply(m_reply.All(), Reply);
            Perform(call, FunctionFor(call), received, m_library, reply);
            reply.Finish();
            MessageReader answer(Arrived(m_reply, damagesReply));
            answer.Number<std::int32_t>();
            ReceiveArguments(call, answer, m_host, arguments...);
            ++m_taken;
        }
        catch (const MessageError&)
        {
            ++m_refused;
        }
    }

    std::mt19937 m_random{12345};
    int m_taken = 0;
    int m_refused = 0;
};

} // namespace

TEST_F(Fuzz, DamagedMessagesAreTakenOrRefusedAndHarmNeitherSide)
{
    using Runner = void (Fuzz::*)();
    const auto runners = []<std::size_t... Indices>(std::index_sequence<Indices...>) {
        return std::array{static_cast<Runner>(&Fuzz::Run<Indices>)...};
    }(AllIndices);
    for (int i = 0; i < FuzzedMessages; ++i)
    {
        (this->*runners[Random(static_cast<unsigned>(runners.size()))])();
    }
    EXPECT_GT(m_taken, FuzzedMessages / 20);
    EXPECT_GT(m_refused, FuzzedMessages / 4);
}
