#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <exception>
#include <limits>
#include <span>
#include <string>
#include <string_view>
#include <type_traits>

/// A message does not fit, or what arrived breaks the rules of messages.
class MessageError : public std::exception
{
public:
    const char* what() const noexcept override { return "message error"; }
};

enum class MessageKind : std::uint32_t
{
    Load = 1, ///< host: load the library
    Call,     ///< host: call a function
    Quit,     ///< host: unload the library and end
    Reply,    ///< library: the result of any of these
    Output,   ///< library: text output, which waits for the host's answer
    Populate  ///< library: a file for the list of SccPopulateList, which waits for the host's answer
};

/// The start of every message. All numbers are in the byte order of the processor and need no alignment.
struct MessageHeader
{
    std::uint32_t size; ///< of the message in bytes, with this header
    MessageKind kind;
    std::uint32_t number;   ///< counts the requests; a reply has the number of its request
    std::uint32_t function; ///< that a `Call` is for, an index of `SccCalls::All`; otherwise 0
};
static_assert(sizeof(MessageHeader) == 16 && offsetof(MessageHeader, kind) == 4 &&
              offsetof(MessageHeader, number) == 8 && offsetof(MessageHeader, function) == 12);
static_assert(std::is_trivially_copyable_v<MessageHeader>);

/// Writes one message into an area.
class MessageWriter
{
public:
    /// `header` gets its size in `Finish`. Throws MessageError when the area is too small, as does every operation.
    MessageWriter(std::span<std::byte> area, const MessageHeader& header) : m_area(area), m_header(header)
    {
        Advance(sizeof header);
    }

    template <typename Value>
    void Number(Value value)
    {
        static_assert(std::is_same_v<Value, std::int32_t> || std::is_same_v<Value, std::uint32_t> ||
                      std::is_same_v<Value, std::uint64_t>);
        Bytes(&value, sizeof value);
    }

    void Flag(bool flag) { Number(static_cast<std::uint32_t>(flag)); }

    /// Bytes without their number.
    void Bytes(const void* bytes, std::size_t size)
    {
        std::byte* const place = Advance(size);
        if (size > 0)
        {
            std::memcpy(place, bytes, size);
        }
    }

    /// A text, which may be null.
    void Text(const char* text)
    {
        if (text == nullptr)
        {
            Number(NullText);
        }
        else
        {
            Text(std::string_view(text));
        }
    }
    void Text(std::string_view text)
    {
        const auto size = static_cast<std::uint32_t>(Checked(text.size()));
        std::byte* const place = Advance(sizeof size + size + 1);
        std::memcpy(place, &size, sizeof size);
        std::copy_n(text.data(), size, reinterpret_cast<char*>(place) + sizeof size);
        place[sizeof size + size] = std::byte{0};
    }

    void Text(std::wstring_view text)
    {
        Number(static_cast<std::uint32_t>(Checked(text.size())));
        Bytes(text.data(), text.size() * sizeof(wchar_t));
    }

    /// Completes the message. Call it last.
    void Finish()
    {
        m_header.size = static_cast<std::uint32_t>(m_size);
        std::memcpy(m_area.data(), &m_header, sizeof m_header);
    }

    static constexpr std::uint32_t NullText = std::numeric_limits<std::uint32_t>::max();

private:
    std::size_t Checked(std::size_t size) const
    {
        if (size > m_area.size())
        {
            throw MessageError();
        }
        return size;
    }

    std::byte* Advance(std::size_t size)
    {
        if (size > m_area.size() - m_size)
        {
            throw MessageError();
        }
        std::byte* const place = m_area.data() + m_size;
        m_size += size;
        return place;
    }

    std::span<std::byte> m_area;
    MessageHeader m_header;
    std::size_t m_size = 0;
};

/// Reads one message from an area. The other process may change the area at any time, so every number is read once and
/// checked after that, and only the process of the library keeps pointers into it.
class MessageReader
{
public:
    /// Throws MessageError when there is no message, as every operation does when the message ends too early.
    explicit MessageReader(std::span<std::byte> area) : m_rest(area)
    {
        std::memcpy(&m_header, Advance(sizeof m_header), sizeof m_header);
        if (m_header.size < sizeof m_header || m_header.size > area.size())
        {
            throw MessageError();
        }
        m_rest = m_rest.first(m_header.size - sizeof m_header);
    }

    const MessageHeader& Header() const { return m_header; }

    template <typename Value>
    Value Number()
    {
        static_assert(std::is_same_v<Value, std::int32_t> || std::is_same_v<Value, std::uint32_t> ||
                      std::is_same_v<Value, std::uint64_t>);
        Value value;
        Bytes(&value, sizeof value);
        return value;
    }

    bool Flag()
    {
        const auto flag = Number<std::uint32_t>();
        Check(flag <= 1);
        return flag == 1;
    }

    void Bytes(void* bytes, std::size_t size)
    {
        const std::byte* const place = Advance(size);
        if (size > 0)
        {
            std::memcpy(bytes, place, size);
        }
    }

    /// A text in the message; null for none. It is terminated until the other process changes it.
    char* Text()
    {
        const auto size = Number<std::uint32_t>();
        if (size == MessageWriter::NullText)
        {
            return nullptr;
        }
        Check(size < m_rest.size());
        char* const text = reinterpret_cast<char*>(Advance(std::size_t{size} + 1));
        Check(text[size] == '\0');
        return text;
    }

    /// A copy of a text, up to its first null character. False for null; the copy is then empty.
    bool CopyText(std::string& copy)
    {
        copy.clear();
        const auto size = Number<std::uint32_t>();
        if (size == MessageWriter::NullText)
        {
            return false;
        }
        Check(size < m_rest.size());
        copy.assign(reinterpret_cast<const char*>(Advance(std::size_t{size} + 1)), size);
        copy.resize(std::strlen(copy.c_str()));
        return true;
    }

    std::wstring WideText()
    {
        const auto size = Number<std::uint32_t>();
        Check(size <= m_rest.size() / sizeof(wchar_t));
        std::wstring text(size, L'\0');
        Bytes(text.data(), size * sizeof(wchar_t));
        return text;
    }

    /// Throws MessageError unless the whole message was read.
    void End() const { Check(m_rest.empty()); }

    /// The number of bytes that were not read yet.
    std::size_t Rest() const { return m_rest.size(); }

    static void Check(bool isValid)
    {
        if (!isValid)
        {
            throw MessageError();
        }
    }

private:
    std::byte* Advance(std::size_t size)
    {
        Check(size <= m_rest.size());
        std::byte* const place = m_rest.data();
        m_rest = m_rest.subspan(size);
        return place;
    }

    std::span<std::byte> m_rest;
    MessageHeader m_header{};
};
