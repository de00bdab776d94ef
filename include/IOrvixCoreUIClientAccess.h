#pragma once

#include <cstdint>

/// What the user-interface library may ask of the services object. Requests go on to the host's
/// `IOrvixClientAccess`; without one the system answers.
///
/// Implemented by: library. Given to `IOrvixCoreUI::SetClientAccess`; valid until `ReleaseIOrvixCoreUI`.
class IOrvixCoreUIClientAccess
{
public:
    /// Forwards to `IOrvixClientAccess::RelayA`; 0 without client access. [library, main-thread]
    virtual std::intptr_t ClientRelayA(void* a, void* b, void* c, void* d) = 0;

    /// The host's colour for a system colour index (COLOR_*) as 0x00BBGGRR; without client access the
    /// system's (`GetSysColor`). [library, main-thread]
    virtual std::uint32_t GetColor(std::int32_t index) = 0;

    /// Forwards to `IOrvixClientAccess::RelayB`; 0 without client access. [library, main-thread]
    virtual std::intptr_t ClientRelayB(void* a, void* b, void* c, void* d) = 0;

protected:
    /// Not public: nobody deletes the object through this interface.
    ~IOrvixCoreUIClientAccess() = default;
};
