#pragma once

#include "IOrvixServices.h"

#include <memory>

struct ServicesDeleter
{
    void operator()(IOrvixServices* services) const { ReleaseIOrvixServices(services); }
};

/// A services object that is handed back at the end.
using ServicesPointer = std::unique_ptr<IOrvixServices, ServicesDeleter>;
