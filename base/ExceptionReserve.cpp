#include "ExceptionReserve.h"

#if defined(__MINGW32__)

#include <cstddef>

namespace
{

bool failNext = false;

} // namespace

// The linker sends this module's calls of malloc here (--wrap=malloc), and __real_malloc to the C run-time.
extern "C" void* __real_malloc(std::size_t size); // NOLINT(readability-identifier-naming)

extern "C" void* __wrap_malloc(std::size_t size) // NOLINT(readability-identifier-naming)
{
    if (!failNext)
    {
        return __real_malloc(size);
    }
    failNext = false;
    return nullptr;
}

namespace __gnu_cxx // of GCC's run-time, declared in no header
{

void __freeres(); // NOLINT(bugprone-reserved-identifier,readability-identifier-naming)

} // namespace __gnu_cxx

void FreeExceptionReserve()
{
    __gnu_cxx::__freeres();
}

void ReserveForExceptions()
{
    failNext = true; // the exception object's allocation, so that the pool has to help out
    try
    {
        throw 0;
    }
    catch (int)
    {
    }
}

#else

void ReserveForExceptions()
{
}

void FreeExceptionReserve()
{
}

#endif
