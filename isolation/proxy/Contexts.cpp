#include "Contexts.h"

#include <algorithm>
#include <utility>

std::shared_ptr<IsolatedLibrary> Contexts::Find(LPVOID context)
{
    const std::lock_guard lock(m_lock);
    if (context == nullptr)
    {
        return WithoutContext();
    }
    const auto found = FindStarted(context);
    return found != m_started.end() ? *found : nullptr;
}

std::vector<std::shared_ptr<IsolatedLibrary>> Contexts::All()
{
    const std::lock_guard lock(m_lock);
    return m_started.empty() ? std::vector{WithoutContext()} : m_started;
}

std::shared_ptr<IsolatedLibrary> Contexts::Take()
{
    const std::lock_guard lock(m_lock);
    return std::exchange(WithoutContext(), nullptr);
}

LPVOID Contexts::Add(const std::shared_ptr<IsolatedLibrary>& library)
{
    const std::lock_guard lock(m_lock);
    m_started.push_back(library);
    return library.get();
}

void Contexts::PutBack(const std::shared_ptr<IsolatedLibrary>& library)
{
    const std::lock_guard lock(m_lock);
    if (!m_withoutContext)
    {
        m_withoutContext = library;
    }
}

std::shared_ptr<IsolatedLibrary> Contexts::Remove(LPVOID context)
{
    const std::lock_guard lock(m_lock);
    const auto found = FindStarted(context);
    std::shared_ptr<IsolatedLibrary> library;
    if (found != m_started.end())
    {
        library = *found;
        m_started.erase(found);
    }
    return library;
}

std::vector<std::shared_ptr<IsolatedLibrary>>::iterator Contexts::FindStarted(LPVOID context)
{
    return std::find_if(m_started.begin(), m_started.end(),
                        [context](const auto& library) { return library.get() == context; });
}

std::shared_ptr<IsolatedLibrary>& Contexts::WithoutContext()
{
    if (!m_withoutContext || m_withoutContext->IsLost())
    {
        m_withoutContext = m_make();
    }
    return m_withoutContext;
}
