#pragma once

#include <windows.h>

#include <algorithm>
#include <cstdint>
#include <deque>

/// The command option blocks of one isolated library, as the host sees them: pointers that mean something only here.
/// A block of a process that has ended is unknown and becomes null.
class CommandBlocks
{
public:
    /// The host's pointer for a block at `address` in the library's process; null for 0.
    LPVOID Handle(std::uint64_t address)
    {
        if (address == 0)
        {
            return nullptr;
        }
        const auto found = std::find(m_addresses.begin(), m_addresses.end(), address);
        return found != m_addresses.end() ? &*found : &m_addresses.emplace_back(address);
    }

    /// The address in the library's process; 0 for null and for a pointer that is none of these.
    std::uint64_t Address(const void* handle) const
    {
        const auto found = std::find_if(m_addresses.begin(), m_addresses.end(),
                                        [handle](const std::uint64_t& address) { return &address == handle; });
        return found != m_addresses.end() ? *found : 0;
    }

private:
    std::deque<std::uint64_t> m_addresses; // keeps its elements in place
};
