#pragma once

#include "ExceptionBarrier.h"

#include <string>

/// Copies `text` into a record's field. Null, and exhausted memory, leave the old value and give false.
inline bool AssignText(std::wstring& field, const wchar_t* text)
{
    return text != nullptr && WithBarrier(false, [&] {
               field = text;
               return true;
           });
}

/// True when a setter that was given `wanted` has stored it: setters leave the old, empty text without memory.
inline bool IsStored(const wchar_t* wanted, const wchar_t* stored)
{
    return wanted == nullptr || *wanted == L'\0' || *stored != L'\0';
}
