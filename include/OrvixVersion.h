#pragma once

// The version of the library stands here and nowhere else; CMake reads these three lines.
#define ORVIX_VERSION_MAJOR 0
#define ORVIX_VERSION_MINOR 1
#define ORVIX_VERSION_PATCH 0

/// Version of the provider plug-in contract. A plug-in's `GetOrvixVersion` must return it.
#define ORVIX_PLUGIN_CONTRACT_VERSION 200
