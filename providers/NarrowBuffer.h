#pragma once

#include <array>
#include <cstddef>

/// A text in the ANSI code page that a provider may read and overwrite. Whatever the text's own limit, the memory holds
/// the longest text that the interface lets a provider write, and a zero after it.
class NarrowBuffer
{
public:
    static constexpr std::size_t Unlimited = static_cast<std::size_t>(-1);

    /// Converts at most 260 characters of `text`, cut to `limit` bytes but never within a character.
    NarrowBuffer(const wchar_t* text, std::size_t limit) noexcept;

    char* Get() noexcept { return m_bytes.data(); }

private:
    // 260 characters take at most four bytes each in any code page, and a provider's longest text takes 301.
    std::array<char, 4 * 260 + 1> m_bytes = {};
};
