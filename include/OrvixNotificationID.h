#pragma once

#include <cstdint>

/// The notifications that the library sends: `OrvixNotifyParams::GetID`. A host may send its own with other numbers.
namespace OrvixNotificationID
{

inline constexpr std::uint32_t BeforeCheckIn = 13;      ///< a listener may veto each "before"
inline constexpr std::uint32_t AfterCheckIn = 14;       ///< each "after" is sent whatever the provider returned
inline constexpr std::uint32_t BeforeCheckOut = 15;     ///< may be vetoed
inline constexpr std::uint32_t AfterCheckOut = 16;      ///< has been tried
inline constexpr std::uint32_t BeforeUndoCheckOut = 17; ///< may be vetoed
inline constexpr std::uint32_t AfterUndoCheckOut = 18;  ///< has been tried
inline constexpr std::uint32_t BeforeAdd = 19;          ///< may be vetoed
inline constexpr std::uint32_t AfterAdd = 20;           ///< has been tried
inline constexpr std::uint32_t BeforeGetLatest = 21;    ///< may be vetoed
inline constexpr std::uint32_t AfterGetLatest = 22;     ///< has been tried
inline constexpr std::uint32_t FilesConfirmed = 27;     ///< the user confirmed the files in the dialog

} // namespace OrvixNotificationID

/// What `IOrvixNotifyCallback::Notify` returns, and with it `OrvixNotification::BroadcastOrvixNotification`.
namespace OrvixListenerAnswer
{

inline constexpr std::uint32_t Accept = 0; ///< the next listener is called
inline constexpr std::uint32_t Veto = 1;   ///< the record is marked as cancelled and the earlier listeners are notified
inline constexpr std::uint32_t Stop = 2;   ///< ends the delivery without a veto, as any other value does

} // namespace OrvixListenerAnswer
