#pragma once

/// Marks what braeutil.dll exports. The utility library defines BRAEUTIL_BUILD; everybody else imports.
#if defined(BRAEUTIL_BUILD)
#define BRAE_API __declspec(dllexport)
#else
#define BRAE_API __declspec(dllimport)
#endif
