#pragma once

#include "IsolatedLibrary.h"
#include "SystemLock.h"

#include <memory>
#include <mutex>
#include <vector>

/// The contexts that the host has started, each with a library process of its own, and the process that serves the
/// calls without a context: it was started before SccInitialize and becomes the next context's.
class Contexts
{
public:
    /// `make` makes a library whose process is not started.
    explicit Contexts(std::shared_ptr<IsolatedLibrary> (*make)()) noexcept : m_make(make) {}

    /// The library of a context, or the one without a context for null. Null for a pointer that is no context.
    std::shared_ptr<IsolatedLibrary> Find(LPVOID context);

    /// All started ones; the one without a context when there are none.
    std::vector<std::shared_ptr<IsolatedLibrary>> All();

    /// Takes the library without a context, for a start.
    std::shared_ptr<IsolatedLibrary> Take();

    /// Makes a started library a context.
    LPVOID Add(const std::shared_ptr<IsolatedLibrary>& library);

    /// Puts a library back that was taken and has not started. Another one that serves meanwhile stays.
    void PutBack(const std::shared_ptr<IsolatedLibrary>& library);

    /// Forgets a context and returns its library; null for a pointer that is no context.
    std::shared_ptr<IsolatedLibrary> Remove(LPVOID context);

private:
    std::shared_ptr<IsolatedLibrary>& WithoutContext();
    std::vector<std::shared_ptr<IsolatedLibrary>>::iterator FindStarted(LPVOID context);

    SystemLock m_lock;
    std::shared_ptr<IsolatedLibrary> (*m_make)();
    std::shared_ptr<IsolatedLibrary> m_withoutContext;
    std::vector<std::shared_ptr<IsolatedLibrary>> m_started; ///< a context is the address of its library
};
