#pragma once

#include <cstdint>

/// The host's side of the library: what the library may ask of the host while it works.
///
/// Implemented by: host. Handed over in `OrvixClientInfo`; it must outlive the services object that was
/// initialised with it. The library never deletes it. All operations are called on the host's
/// user-interface thread.
class IOrvixClientAccess
{
public:
    /// Shows one line of a provider's output (history, progress, messages). `text` carries no line end and
    /// lives only for the call; `kind` is 0 for everything the library sends itself. [host, main-thread]
    virtual void OutputText(const wchar_t* text, int kind) = 0;

    /// Relay of the user-interface library; the library hands the four values through and returns the
    /// result unchanged. Their meaning lies between the user-interface library and the host.
    /// [host, main-thread]
    virtual std::intptr_t RelayA(void* a, void* b, void* c, void* d) = 0;

    /// The host's colour for a system colour index (COLOR_*), as 0x00BBGGRR. [host, main-thread]
    virtual std::uint32_t GetColor(std::int32_t index) = 0;

    /// True when nobody can answer: stored prompt answers are then used without a dialog.
    /// [host, main-thread]
    virtual bool IsUnattended() = 0;

    /// Second relay of the user-interface library, as `RelayA`. [host, main-thread]
    virtual std::intptr_t RelayB(void* a, void* b, void* c, void* d) = 0;

protected:
    ~IOrvixClientAccess() = default;
};
