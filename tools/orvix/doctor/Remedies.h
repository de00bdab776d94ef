#pragma once

#include <string_view>

/// What to do about a finding of the doctor, in one sentence; empty for a note that only explains.
std::string_view RemedyFor(std::string_view code);
