#pragma once

#include "OutputStyle.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <ostream>
#include <string>
#include <vector>

/// What `orvix doctor` has found; docs/doctor.md says what each code means.
struct DoctorReport
{
    struct Finding
    {
        bool isProblem = false; ///< else a note: what is so on purpose, or does no harm
        std::string code;       ///< stable, for scripts
        std::wstring text;
    };

    /// A place that the library looks at.
    struct Place
    {
        std::string kind;
        std::wstring location;
        std::vector<Finding> findings;

        void AddProblem(const char* code, std::wstring text) { findings.push_back({true, code, std::move(text)}); }
        void AddNote(const char* code, std::wstring text) { findings.push_back({false, code, std::move(text)}); }
    };

    /// Something that may be a provider.
    struct Candidate : Place
    {
        std::optional<std::wstring> name; ///< of the provider, as far as it is known
        bool listed = false;
        std::optional<std::int32_t> contractVersion; ///< of a plug-in that could be asked
    };

    std::vector<Place> places;
    std::vector<Candidate> candidates;

    std::size_t NumListed() const;
    std::size_t NumProblems() const;

    /// Prints everything for people, with the summary as the last line.
    void PrintText(std::ostream& stream, const OutputStyle& style) const;

    /// Prints everything as one JSON object.
    void PrintJson(std::ostream& stream) const;
};
