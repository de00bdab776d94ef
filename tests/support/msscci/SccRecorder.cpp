#include "SccRecorder.h"

std::vector<std::string> SccRecorder::Take()
{
    std::vector<std::string> taken;
    taken.swap(calls);
    std::erase_if(taken,
                  [](const std::string& call) { return call.starts_with("load ") || call.starts_with("unload "); });
    return taken;
}

SccRecorder* TheSccRecorder()
{
    static SccRecorder recorder;
    return &recorder;
}
