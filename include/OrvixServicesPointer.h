#pragma once

#include "IOrvixServices.h"

#include <memory>

/// Releases a services object.
struct OrvixServicesRelease
{
    /// Shuts the object down and destroys it; null does nothing. [library, main-thread]
    void operator()(IOrvixServices* services) const { ReleaseIOrvixServices(services); }
};

/// Owns a services object. At the end it is shut down, which saves the stored answers, and released. Call `Shutdown`
/// yourself where you want to know of a COM error in saving.
using OrvixServicesPointer = std::unique_ptr<IOrvixServices, OrvixServicesRelease>;

/// Makes a services object; null when memory runs out.
inline OrvixServicesPointer MakeOrvixServices()
{
    return OrvixServicesPointer(GetIOrvixServices());
}
