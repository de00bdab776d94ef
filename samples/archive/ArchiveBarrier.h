#pragma once

/// The exception barrier of both fronts: runs `work` and returns its result, or `onFailure` when anything is thrown. A
/// host is never to see an exception, exhausted memory included.
template <typename Result, typename Work>
Result Guarded(Result onFailure, Work work) noexcept
{
    try
    {
        return work();
    }
    catch (...)
    {
        return onFailure;
    }
}
