// Parsed once a build for all test programs (GCC only). Each source still includes what it uses.
#include "Precompiled.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>
#include <functional>
#include <map>
#include <sstream>
#include <thread>
