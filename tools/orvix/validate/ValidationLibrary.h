#pragma once

#include "IsolatedLoad.h"
#include "ValidationSubject.h"

/// The library under validation, loaded as OrvixCore loads it, and unloaded at the end.
class ValidationLibrary
{
public:
    /// `subject` must outlive this object. Throws `RuleSkipped` with the system's reason when the library does not
    /// load.
    explicit ValidationLibrary(ValidationSubject& subject);
    ValidationLibrary(const ValidationLibrary&) = delete;
    ValidationLibrary& operator=(const ValidationLibrary&) = delete;
    ~ValidationLibrary();

    /// Whether the library exports a function.
    bool Has(const char* name) const { return GetProcAddress(m_module.Get(), name) != nullptr; }

    /// An exported function. Throws `RuleSkipped` when the library does not export it.
    template <typename Function>
    Function* Need(const char* name) const
    {
        auto* const function =
            reinterpret_cast<Function*>(reinterpret_cast<void (*)()>(GetProcAddress(m_module.Get(), name)));
        if (function == nullptr)
        {
            throw RuleSkipped(std::string("it does not export ") + name);
        }
        return function;
    }

private:
    ValidationSubject& m_subject;
    UniqueModule m_module;
};
