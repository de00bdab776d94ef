#pragma once

#include "ExceptionBarrier.h"

#include <string>

/// The private state of records, which is made when something is stored for the first time. Templates, since the
/// classes of the states are private; free functions, since an exported class exports its members.

/// The state, made on first use. Throws std::bad_alloc.
template <typename State>
State& StateOf(State*& state)
{
    if (state == nullptr)
    {
        state = new State;
    }
    return *state;
}

/// A text of the state; empty without one. Never null.
template <typename State>
const wchar_t* TextOf(const State* state, std::wstring State::*field)
{
    return state != nullptr ? (state->*field).c_str() : L"";
}

/// Copies `text` into a field of the state. Null, and exhausted memory, leave the old text.
template <typename State>
void SetText(State*& state, std::wstring State::*field, const wchar_t* text)
{
    if (text != nullptr)
    {
        Completes([&] { StateOf(state).*field = text; });
    }
}

/// True when a setter that was given `wanted` has stored it: setters leave the old, empty text without memory.
inline bool IsStored(const wchar_t* wanted, const wchar_t* stored)
{
    return wanted == nullptr || *wanted == L'\0' || *stored != L'\0';
}
