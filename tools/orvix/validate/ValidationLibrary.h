#pragma once

#include "IsolatedLoad.h"
#include "ValidationSubject.h"

/// The library under validation, loaded as OrvixCore loads it, and freed at the end.
class ValidationLibrary
{
public:
    /// Throws `RuleSkipped` with the system's reason when it does not load.
    explicit ValidationLibrary(ValidationSubject& subject);
    ValidationLibrary(const ValidationLibrary&) = delete;
    ValidationLibrary& operator=(const ValidationLibrary&) = delete;
    ~ValidationLibrary();

    /// An exported function; null when the library lacks it.
    template <typename Function>
    Function* Find(const char* name) const
    {
        return reinterpret_cast<Function*>(reinterpret_cast<void (*)()>(GetProcAddress(m_module.Get(), name)));
    }

    /// An exported function that a rule needs. Throws `RuleSkipped` when the library lacks it.
    template <typename Function>
    Function* Need(const char* name) const
    {
        Function* const function = Find<Function>(name);
        if (function == nullptr)
        {
            throw RuleSkipped(std::string("it lacks ") + name);
        }
        return function;
    }

private:
    ValidationSubject& m_subject;
    UniqueModule m_module;
};
