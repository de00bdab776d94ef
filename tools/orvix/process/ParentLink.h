#pragma once

#include <windows.h>

#include <cstddef>
#include <string>
#include <string_view>

/// The link of a process that `ChildProcess` started to the process that started it. Each line that goes over it is a
/// word, and after a blank a text. Thread-safe.
namespace ParentLink
{

// Words that every child sends.
inline constexpr std::string_view Step = "step";     ///< a call of a library begins; the text names it
inline constexpr std::string_view Return = "return"; ///< it is over
inline constexpr std::string_view Alive = "alive";   ///< it goes on
inline constexpr std::string_view Crash = "crash";   ///< the process crashes; the text says where

/// The beginning of the arguments of a child that writes to this pipe.
std::wstring Arguments(HANDLE pipe);

/// Links this process, when its arguments begin as `Arguments` has them; these are removed then. Also makes a crash
/// end the process at once, without a message box or a debugger, and send where it was. False when this process is no
/// child.
bool Attach(int& count, wchar_t**& arguments);

/// Sends a line. Does nothing in a process that is no child. Control characters of the text are replaced.
void Send(std::string_view word, const std::string& text = {});

/// Sends `Alive` with the first and every 256th step of work of this process that may take long, such as a look at each
/// file of a slow share. `step` counts from 0.
void SendAliveAt(std::size_t step);

} // namespace ParentLink
