#pragma once

#include <cstdint>

/// Where `IOrvixServices::Initialize` looks for providers: bits of its `sources`.
namespace OrvixProviderSource
{

inline constexpr std::uint32_t Plugins = 0x1;         ///< plug-ins in the client's plug-in folder
inline constexpr std::uint32_t InstalledMSSCCI = 0x2; ///< MSSCCI libraries registered on this machine

} // namespace OrvixProviderSource
