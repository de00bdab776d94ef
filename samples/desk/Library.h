#pragma once

#include "Arguments.h"
#include "IOrvixClientAccess.h"
#include "OrvixClientInfo.h"
#include "OrvixServicesPointer.h"

#include <windows.h>

#include <cstdint>
#include <optional>
#include <string>

/// The services object of this program, with its client information and its prompts. At the end it is shut down, which
/// saves the stored answers.
class Library
{
public:
    /// `access` and `window`, the parent of the providers' windows, outlive this object. Throws `Failure` when memory
    /// runs out.
    Library(const Arguments& arguments, IOrvixClientAccess& access, HWND window);

    // Both are valid as long as this object.
    IOrvixServices& Services() const { return *m_services; }
    OrvixClientInfo& Client() { return m_client; }

    /// The index of the provider with this name, in any letter case; nothing when there is none.
    std::optional<std::uint32_t> FindProvider(const std::wstring& name) const;

    /// The provider for a project: the one with the name or, with an empty name, the one that was used last or the
    /// first that the user lets the program use. Throws `Failure` when there is none.
    std::uint32_t ChooseProvider(const std::wstring& name) const;

private:
    void RegisterPrompts() const;

    OrvixClientInfo m_client;
    OrvixServicesPointer m_services;
};
