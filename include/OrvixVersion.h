#pragma once

// The version of the library is defined here alone; CMake reads these three lines.
#define ORVIX_VERSION_MAJOR 0 ///< changes when callers have to change
#define ORVIX_VERSION_MINOR 1 ///< changes with additions
#define ORVIX_VERSION_PATCH 0 ///< changes with corrections

/// Version of the provider plug-in contract. A plug-in's `GetOrvixVersion` must return it.
#define ORVIX_PLUGIN_CONTRACT_VERSION 200
