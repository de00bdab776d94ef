#pragma once

/// Marks what braeutil exports. BRAEUTIL_BUILD is defined only while braeutil itself is built.
#if defined(BRAEUTIL_BUILD)
#define BRAE_API __declspec(dllexport)
#else
#define BRAE_API __declspec(dllimport)
#endif
