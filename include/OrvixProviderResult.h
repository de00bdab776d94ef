#pragma once

/// What an operation of `IOrvixProvider` returns.
namespace OrvixProviderResult
{

inline constexpr int Success = 0;     ///< done
inline constexpr int Failure = -1;    ///< also for a file operation without an active entry
inline constexpr int NotOffered = -2; ///< the provider does not have the operation
inline constexpr int ReloadFiles = 1; ///< `ShowHistory` only: a file on the disk changed, so load it again

} // namespace OrvixProviderResult
