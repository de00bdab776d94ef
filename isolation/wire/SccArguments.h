#pragma once

#include "CommandBlocks.h"
#include "MSSCCI.h"
#include "Message.h"

#include <algorithm>
#include <atomic>
#include <bit>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

/// True for the kinds of text output whose first argument is a structure of the library's process. They do not cross.
constexpr bool IsBackgroundKind(LONG kind)
{
    return kind >= 8 && kind <= 11;
}

/// What the arguments of a function need to know in the host's process.
struct HostSide
{
    std::atomic<LPTEXTOUTPROC> output = nullptr; ///< of the last SccOpenProject
    POPLISTFUNC populate = nullptr;              ///< of the running SccPopulateList
    LPVOID populateData = nullptr;
    HWND window = nullptr; ///< of the last call that has one among its arguments; it may be null there
    CommandBlocks blocks;

    // What SccAddFromScc returned last.
    std::vector<std::string> addedTexts;
    std::vector<LPCSTR> added;

    LONG count = 0;     ///< of files in the running call
    LONG sentCount = 0; ///< the same, as the host has given it to SccAddFromScc
};

/// What they need to know in the library's process.
struct LibrarySide
{
    LPVOID context = nullptr; ///< the library's own
    LPTEXTOUTPROC output = nullptr;
    POPLISTFUNC populate = nullptr;
    LPCSTR* added = nullptr; ///< the library's array of SccAddFromScc
    bool isFreeing = false;  ///< the running SccAddFromScc frees that array

    LONG count = 0;         ///< of files in the running call
    SCCRTN result = SCC_OK; ///< of the running call, once the function has returned
};

/// One class for each kind of argument, which both processes use. An object lives in the library's process and is the
/// argument there.
///
/// - `Type`: the argument's type.
/// - `Send`: in the host, writes the argument into the request.
/// - the constructor: in the library's process, makes the argument from the request.
/// - `Get`: the argument that the library gets.
/// - `Answer`: writes into the reply what the library stored through it.
/// - `Receive`: in the host, stores that for the caller.
///
/// Each constructor reads what `Send` writes, and each `Receive` what `Answer` writes. They throw MessageError.
namespace SccArguments
{

// A library may write beyond its texts and arrays by this much, in its own process, without harm.
constexpr std::size_t SlackBytes = 4096;

/// The number of elements in an array of `count`.
inline std::size_t Elements(LONG count)
{
    return static_cast<std::size_t>(std::max<LONG>(count, 0));
}

/// A pointer as a number of the request.
template <typename Pointer>
Pointer PointerOf(MessageReader& request)
{
    return std::bit_cast<Pointer>(static_cast<std::uintptr_t>(request.Number<std::uint64_t>()));
}

/// An argument that the library only reads.
template <typename ArgumentType>
struct Input
{
    using Type = ArgumentType;
    void Answer(MessageWriter&, const LibrarySide&) const {}
    static void Receive(MessageReader&, HostSide&, Type) {}
};

/// The library's context. The host's is a pointer of another kind, which does not cross.
class Context : public Input<LPVOID>
{
public:
    static void Send(MessageWriter&, HostSide&, LPVOID) {}
    Context(MessageReader&, LibrarySide& side) : m_context(side.context) {}
    LPVOID Get() const { return m_context; }

private:
    LPVOID m_context;
};

/// The place where the library stores its context.
class NewContext : public Input<LPVOID*>
{
public:
    static void Send(MessageWriter&, HostSide&, LPVOID*) {}
    NewContext(MessageReader&, LibrarySide& side) : m_context(&side.context) { side.context = nullptr; }
    LPVOID* Get() const { return m_context; }

private:
    LPVOID* m_context;
};

/// A number of 32 bits.
template <typename ArgumentType>
class Number : public Input<ArgumentType>
{
public:
    static void Send(MessageWriter& request, HostSide&, ArgumentType value)
    {
        request.Number(static_cast<std::int32_t>(value));
    }
    Number(MessageReader& request, LibrarySide&) : m_value(static_cast<ArgumentType>(request.Number<std::int32_t>())) {}
    ArgumentType Get() const { return m_value; }

private:
    ArgumentType m_value;
};

/// The number of files, which the arguments after it use.
class Count : public Number<LONG>
{
public:
    static void Send(MessageWriter& request, HostSide& side, LONG count)
    {
        side.count = count;
        Number<LONG>::Send(request, side, count);
    }
    Count(MessageReader& request, LibrarySide& side) : Number<LONG>(request, side) { side.count = Get(); }
};

/// A window. Its handle means the same in every process.
class Window : public Input<HWND>
{
public:
    static void Send(MessageWriter& request, HostSide& side, HWND window)
    {
        side.window = window;
        request.Number(std::uint64_t{reinterpret_cast<std::uintptr_t>(window)});
    }
    Window(MessageReader& request, LibrarySide&) : m_window(PointerOf<HWND>(request)) {}
    HWND Get() const { return m_window; }

private:
    HWND m_window;
};

/// The host's data for a callback. The library gets the number and only hands it back.
class CallerData : public Input<LPVOID>
{
public:
    static void Send(MessageWriter& request, HostSide& side, LPVOID data)
    {
        side.populateData = data;
        request.Number(std::uint64_t{reinterpret_cast<std::uintptr_t>(data)});
    }
    CallerData(MessageReader& request, LibrarySide&) : m_data(PointerOf<LPVOID>(request)) {}
    LPVOID Get() const { return m_data; }

private:
    LPVOID m_data;
};

/// The host's function for text output; the library gets one that reaches it.
class Output : public Input<LPTEXTOUTPROC>
{
public:
    static void Send(MessageWriter& request, HostSide& side, LPTEXTOUTPROC output)
    {
        side.output = output;
        request.Flag(output != nullptr);
    }
    Output(MessageReader& request, LibrarySide& side) : m_output(request.Flag() ? side.output : nullptr) {}
    LPTEXTOUTPROC Get() const { return m_output; }

private:
    LPTEXTOUTPROC m_output;
};

/// The same for the list of SccPopulateList.
class Populate : public Input<POPLISTFUNC>
{
public:
    static void Send(MessageWriter& request, HostSide& side, POPLISTFUNC populate)
    {
        side.populate = populate;
        request.Flag(populate != nullptr);
    }
    Populate(MessageReader& request, LibrarySide& side) : m_populate(request.Flag() ? side.populate : nullptr) {}
    POPLISTFUNC Get() const { return m_populate; }

private:
    POPLISTFUNC m_populate;
};

/// A text that the library reads. What it writes there stays in its process.
class Text : public Input<LPCSTR>
{
public:
    static void Send(MessageWriter& request, HostSide&, LPCSTR text) { request.Text(text); }
    Text(MessageReader& request, LibrarySide&)
    {
        if (const char* const text = request.Text())
        {
            const std::size_t size = std::strlen(text);
            m_bytes.resize(size + SlackBytes);
            std::copy_n(text, size, m_bytes.begin());
        }
    }
    LPCSTR Get() const { return m_bytes.empty() ? nullptr : m_bytes.data(); }

private:
    std::vector<char> m_bytes;
};

/// A text that the library reads and may write, with a terminator at most `Size` bytes. The host may pass `Size` bytes
/// without a terminator. What the host gets has one.
template <std::size_t Size>
class Buffer
{
public:
    using Type = LPSTR;

    static void Send(MessageWriter& request, HostSide&, LPSTR text)
    {
        if (text == nullptr)
        {
            request.Text(nullptr);
        }
        else
        {
            request.Text(std::string_view(text, strnlen(text, Size)));
        }
    }
    Buffer(MessageReader& request, LibrarySide&)
    {
        if (const char* const text = request.Text())
        {
            m_bytes.resize(Size + SlackBytes);
            std::copy_n(text, strnlen(text, Size), m_bytes.begin());
        }
    }
    LPSTR Get() { return m_bytes.empty() ? nullptr : m_bytes.data(); }
    void Answer(MessageWriter& reply, const LibrarySide&) const
    {
        if (!m_bytes.empty())
        {
            reply.Text(std::string_view(m_bytes.data(), strnlen(m_bytes.data(), Size)));
        }
    }
    static void Receive(MessageReader& reply, HostSide&, LPSTR text)
    {
        std::string written;
        if (text == nullptr)
        {
            return;
        }
        MessageReader::Check(reply.CopyText(written) && written.size() <= Size);
        if (written != std::string_view(text, strnlen(text, Size))) // a caller may pass a text that cannot be written
        {
            written.resize(std::min(written.size(), Size - 1));
            std::memcpy(text, written.c_str(), written.size() + 1);
        }
    }

private:
    std::vector<char> m_bytes;
};

/// A number that the library reads and may write.
template <typename Value>
class NumberPlace
{
public:
    using Type = Value*;

    static void Send(MessageWriter& request, HostSide&, const Value* place)
    {
        request.Flag(place != nullptr);
        request.Number(place != nullptr ? static_cast<std::int32_t>(*place) : 0);
    }
    NumberPlace(MessageReader& request, LibrarySide&)
        : m_isPresent(request.Flag()), m_value(static_cast<Value>(request.Number<std::int32_t>()))
    {
    }
    Value* Get() { return m_isPresent ? &m_value : nullptr; }
    void Answer(MessageWriter& reply, const LibrarySide&) const { reply.Number(static_cast<std::int32_t>(m_value)); }
    static void Receive(MessageReader& reply, HostSide&, Value* place)
    {
        const auto value = reply.Number<std::int32_t>();
        if (place != nullptr)
        {
            *place = static_cast<Value>(value);
        }
    }

private:
    bool m_isPresent;
    Value m_value;
};

/// The names of files.
class Names : public Input<LPCSTR*>
{
public:
    static void Send(MessageWriter& request, HostSide& side, LPCSTR* names)
    {
        request.Flag(names != nullptr);
        for (std::size_t i = 0; names != nullptr && i < Elements(side.count); ++i)
        {
            request.Text(names[i]);
        }
    }
    Names(MessageReader& request, LibrarySide& side) : m_isPresent(request.Flag())
    {
        if (!m_isPresent)
        {
            return;
        }
        const std::size_t count = Elements(side.count);
        MessageReader::Check(count <= request.Rest() / sizeof(std::uint32_t)); // each has at least that
        m_names.reserve(count + SlackBytes / sizeof(LPCSTR));
        for (std::size_t i = 0; i < count; ++i)
        {
            m_names.push_back(request.Text());
        }
    }
    LPCSTR* Get() { return m_isPresent ? m_names.data() : nullptr; }

private:
    bool m_isPresent;
    std::vector<LPCSTR> m_names;
};

/// One word for each file, in memory of the library's process.
class WordArray
{
public:
    static void Send(MessageWriter& request, HostSide& side, const LONG* words)
    {
        request.Flag(words != nullptr);
        if (words != nullptr)
        {
            request.Bytes(words, Elements(side.count) * sizeof(LONG));
        }
    }
    WordArray(MessageReader& request, LibrarySide& side)
    {
        if (request.Flag())
        {
            const std::size_t count = Elements(side.count);
            MessageReader::Check(count <= request.Rest() / sizeof(LONG));
            m_words.resize(count + SlackBytes / sizeof(LONG));
            request.Bytes(m_words.data(), count * sizeof(LONG));
        }
    }
    LONG* Get() { return m_words.empty() ? nullptr : m_words.data(); }

protected:
    std::vector<LONG> m_words;
};

/// The option words of files, which the library reads.
class Options : public WordArray
{
public:
    using Type = LONG*;
    using WordArray::WordArray;
    void Answer(MessageWriter&, const LibrarySide&) const {}
    static void Receive(MessageReader&, HostSide&, LONG*) {}
};

/// The status words of files, which the library reads and may write.
class Statuses : public WordArray
{
public:
    using Type = LPLONG;
    using WordArray::WordArray;
    void Answer(MessageWriter& reply, const LibrarySide& side) const
    {
        if (!m_words.empty())
        {
            reply.Bytes(m_words.data(), Elements(side.count) * sizeof(LONG));
        }
    }
    static void Receive(MessageReader& reply, HostSide& side, LPLONG words)
    {
        if (words != nullptr)
        {
            reply.Bytes(words, Elements(side.count) * sizeof(LONG));
        }
    }
};

/// A block of command options that the library made before.
class Block : public Input<LPCMDOPTS>
{
public:
    static void Send(MessageWriter& request, HostSide& side, LPCMDOPTS block)
    {
        request.Number(side.blocks.Address(block));
    }
    Block(MessageReader& request, LibrarySide&) : m_block(PointerOf<LPCMDOPTS>(request)) {}
    LPCMDOPTS Get() const { return m_block; }

protected:
    LPCMDOPTS m_block;
};

/// The place of such a block, which may be null.
class BlockPlace
{
public:
    using Type = LPCMDOPTS*;

    static void Send(MessageWriter& request, HostSide& side, LPCMDOPTS* place)
    {
        request.Flag(place != nullptr);
        request.Number(place != nullptr ? side.blocks.Address(*place) : 0);
    }
    BlockPlace(MessageReader& request, LibrarySide&)
        : m_isPresent(request.Flag()), m_block(PointerOf<LPCMDOPTS>(request))
    {
    }
    LPCMDOPTS* Get() { return m_isPresent ? &m_block : nullptr; }
    void Answer(MessageWriter& reply, const LibrarySide&) const
    {
        reply.Number(std::uint64_t{reinterpret_cast<std::uintptr_t>(m_block)});
    }
    static void Receive(MessageReader& reply, HostSide& side, LPCMDOPTS* place)
    {
        const auto address = reply.Number<std::uint64_t>();
        if (place != nullptr)
        {
            *place = side.blocks.Handle(address);
        }
    }

private:
    bool m_isPresent;
    LPCMDOPTS m_block;
};

/// The number of the files of SccAddFromScc; null asks the library to free their names.
class AddedCount
{
public:
    using Type = LPLONG;

    static void Send(MessageWriter& request, HostSide& side, const LONG* count)
    {
        NumberPlace<LONG>::Send(request, side, count);
        side.count = count != nullptr ? *count : 0;
        side.sentCount = side.count;
    }
    AddedCount(MessageReader& request, LibrarySide& side) : m_side(&side)
    {
        side.isFreeing = !request.Flag();
        side.count = request.Number<std::int32_t>();
    }
    LPLONG Get() { return m_side->isFreeing ? nullptr : &m_side->count; }
    void Answer(MessageWriter& reply, const LibrarySide& side) const
    {
        reply.Number(static_cast<std::int32_t>(side.count));
    }
    static void Receive(MessageReader& reply, HostSide& side, LPLONG count)
    {
        side.count = reply.Number<std::int32_t>();
        if (count != nullptr)
        {
            *count = side.count;
        }
    }

private:
    LibrarySide* m_side;
};

/// The names of those files, which the library allocates. On entry, with a count of 1: the destination folder.
class AddedNames
{
public:
    using Type = LPCSTR**;

    static void Send(MessageWriter& request, HostSide& side, LPCSTR** names)
    {
        request.Flag(names != nullptr);
        const bool hasFolder = names != nullptr && *names != nullptr && side.count == 1;
        request.Text(hasFolder ? **names : nullptr);
    }
    AddedNames(MessageReader& request, LibrarySide& side)
        : m_isPresent(request.Flag()), m_folder(request.Text()), m_side(&side)
    {
    }
    LPCSTR** Get()
    {
        if (!m_side->isFreeing)
        {
            m_side->added = m_folder != nullptr ? &m_folder : nullptr;
        }
        return m_isPresent ? &m_side->added : nullptr;
    }
    void Answer(MessageWriter& reply, const LibrarySide& side) const
    {
        const bool isSame = side.isFreeing || side.added == &m_folder;
        reply.Number(side.added == nullptr ? NoNames : isSame ? SameNames : NewNames);
        for (std::size_t i = 0; side.added != nullptr && !isSame && i < Elements(side.count); ++i)
        {
            reply.Text(side.added[i]);
        }
        if (side.added == &m_folder)
        {
            m_side->added = nullptr;
        }
    }
    static void Receive(MessageReader& reply, HostSide& side, LPCSTR** names)
    {
        side.addedTexts.clear();
        side.added.clear();
        const auto state = reply.Number<std::uint32_t>();
        MessageReader::Check(state <= NewNames);
        MessageReader::Check(state == NewNames || side.count <= side.sentCount); // the host's own array has no more
        const std::size_t count = state == NewNames ? Elements(side.count) : 0;
        MessageReader::Check(count <= reply.Rest() / sizeof(std::uint32_t)); // each has at least that
        std::vector<bool> isPresent;
        isPresent.reserve(count);
        side.addedTexts.resize(count);
        for (std::string& text : side.addedTexts)
        {
            isPresent.push_back(reply.CopyText(text));
        }
        for (std::size_t i = 0; i < count; ++i)
        {
            side.added.push_back(isPresent[i] ? side.addedTexts[i].c_str() : nullptr);
        }
        if (names != nullptr && state != SameNames)
        {
            *names = state == NewNames ? side.added.data() : nullptr;
        }
    }

private:
    static constexpr std::uint32_t NoNames = 0;
    static constexpr std::uint32_t SameNames = 1; ///< as on entry
    static constexpr std::uint32_t NewNames = 2;

    bool m_isPresent;
    LPCSTR m_folder;
    LibrarySide* m_side;
};

} // namespace SccArguments
