#pragma once

#include <comdef.h>

#include <utility>

/// The barrier at the exported edge: runs `body` and gives its result, or `onFailure` when anything is thrown.
template <typename Result, typename Body>
Result WithBarrier(Result onFailure, Body&& body)
{
    try
    {
        return std::forward<Body>(body)();
    }
    catch (...)
    {
        return onFailure;
    }
}

/// Runs `body`, which returns nothing; false when anything is thrown.
template <typename Body>
bool Completes(Body&& body)
{
    try
    {
        std::forward<Body>(body)();
        return true;
    }
    catch (...)
    {
        return false;
    }
}

/// The barrier around what reads or writes an XML file: a COM error (`_com_error`) travels on to the host.
template <typename Result, typename Body>
Result WithXmlBarrier(Result onFailure, Body&& body)
{
    try
    {
        return std::forward<Body>(body)();
    }
    catch (const _com_error&)
    {
        throw;
    }
    catch (...)
    {
        return onFailure;
    }
}
