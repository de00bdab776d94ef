#include "NarrowBuffer.h"

#include <windows.h>

#include <algorithm>

NarrowBuffer::NarrowBuffer(const wchar_t* text, std::size_t limit) noexcept
{
    limit = std::min(limit, m_bytes.size() - 1);
    for (std::size_t size = 0; *text;)
    {
        const int units = IS_SURROGATE_PAIR(text[0], text[1]) ? 2 : 1;
        std::array<char, 8> character = {};
        const int bytes = WideCharToMultiByte(CP_ACP, 0, text, units, character.data(),
                                              static_cast<int>(character.size()), nullptr, nullptr);
        if (bytes <= 0 || size + static_cast<std::size_t>(bytes) > limit)
        {
            break;
        }
        std::copy_n(character.begin(), bytes, m_bytes.begin() + static_cast<std::ptrdiff_t>(size));
        size += static_cast<std::size_t>(bytes);
        text += units;
    }
}
