#pragma once

#include <objbase.h>

/// Keeps this thread in a single-threaded apartment of COM while this object lives, so that no library can take the
/// thread into another one.
class ComApartment
{
public:
    ComApartment() : m_result(CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED)) {}
    ComApartment(const ComApartment&) = delete;
    ComApartment& operator=(const ComApartment&) = delete;
    ~ComApartment()
    {
        if (SUCCEEDED(m_result))
        {
            CoUninitialize();
        }
    }

private:
    HRESULT m_result;
};
