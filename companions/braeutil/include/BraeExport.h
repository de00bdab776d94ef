#pragma once

#if defined(BRAEUTIL_BUILD)
#define BRAE_API __declspec(dllexport)
#else
#define BRAE_API __declspec(dllimport)
#endif
