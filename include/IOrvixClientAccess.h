#pragma once

#include <cstdint>

/// The host's side of the library: what the library may ask of the host while it works.
///
/// Implemented by: host. Handed over in `OrvixClientInfo`; it must outlive the services object that was
/// initialised with it. The library never deletes it. All operations except `OutputText` are called on
/// the host's user-interface thread.
class IOrvixClientAccess
{
public:
    /// Shows one line of a provider's output (history, progress, messages). `text` has no line end and lives only for
    /// the call; `kind` is 0 for everything that the library sends.
    ///
    /// The one operation that may come from another thread: an MSSCCI library may send text from a thread of its own,
    /// also after an operation has returned. [host, any-thread]
    virtual void OutputText(const wchar_t* text, int kind) = 0;

    /// A call of the user-interface library for the host. The library passes the four values and the result through
    /// unchanged; host and user-interface library agree about them. [host, main-thread]
    virtual std::intptr_t RelayA(void* a, void* b, void* c, void* d) = 0;

    /// The host's colour for a system colour index (COLOR_*), as 0x00BBGGRR. [host, main-thread]
    virtual std::uint32_t GetColor(std::int32_t index) = 0;

    /// True when nobody can answer: stored prompt answers are then used without a dialog.
    /// [host, main-thread]
    virtual bool IsUnattended() = 0;

    /// A second call of the user-interface library, as `RelayA`. [host, main-thread]
    virtual std::intptr_t RelayB(void* a, void* b, void* c, void* d) = 0;

protected:
    /// Not public: nobody deletes the object through this interface.
    ~IOrvixClientAccess() = default;
};
