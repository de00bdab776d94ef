// Parsed once a build for all sources of the product (GCC only). Each source still includes what it uses; lint reads
// them without this file. <iostream> is not for here: it puts an object into every source, which leaves handles open
// whenever a DLL is unloaded.
#include <windows.h>

#include <comdef.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <filesystem>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>
