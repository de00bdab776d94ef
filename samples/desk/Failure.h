#pragma once

#include <string>

/// Thrown: what cannot be done, as a sentence for the user.
struct Failure
{
    std::wstring text;
};
