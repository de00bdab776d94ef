#include "FileStateText.h"

#include "OrvixFileFlags.h"

namespace
{

struct Fact
{
    const char* key;
    const wchar_t* words;
};

/// The facts, the most important one first.
std::vector<Fact> Facts(unsigned long flags, bool exists)
{
    const auto has = [flags](unsigned long bit) { return (flags & bit) != 0; };
    if (!has(OrvixFileState::Controlled) && has(OrvixFileState::NotControlled))
    {
        return exists ? std::vector<Fact>{{"not-controlled", L"not controlled"}}
                      : std::vector<Fact>{{"not-controlled", L"no such file"}, {"missing", nullptr}};
    }
    std::vector<Fact> facts;
    const auto addWhen = [&facts](bool condition, const Fact& fact) {
        if (condition)
        {
            facts.push_back(fact);
        }
    };
    const bool outToMe = has(OrvixFileState::CheckedOut);
    const bool outToOther = has(OrvixFileState::CheckedOutByOther);
    addWhen(outToMe, {"checked-out", L"checked out"});
    addWhen(outToOther, {"checked-out-by-other", outToMe ? L"also by another user" : L"checked out by another user"});
    addWhen(!outToMe && !outToOther && has(OrvixFileState::Controlled), {"checked-in", L"checked in"});
    addWhen(has(OrvixFileState::Modified), {"modified", L"modified"});
    addWhen(has(OrvixFileState::OutOfDate), {"out-of-date", L"out of date"});
    addWhen(has(OrvixFileState::Deleted), {"deleted", L"deleted in the project"});
    addWhen(facts.empty(), {"unknown", L"unknown"});
    addWhen(!exists, {"missing", L"missing on disk"});
    return facts;
}

} // namespace

std::vector<const char*> FileStateText::Keys(unsigned long flags, bool exists)
{
    std::vector<const char*> keys;
    for (const Fact& fact : Facts(flags, exists))
    {
        keys.push_back(fact.key);
    }
    return keys;
}

std::wstring FileStateText::InWords(unsigned long flags, bool exists)
{
    std::wstring text;
    for (const Fact& fact : Facts(flags, exists))
    {
        if (fact.words != nullptr)
        {
            text += (text.empty() ? L"" : L", ") + std::wstring(fact.words);
        }
    }
    return text;
}
