#pragma once

#include "OutputStyle.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <ostream>
#include <string>
#include <vector>

/// The findings of `orvix doctor`. docs/doctor.md says what each code means.
struct DoctorReport
{
    struct Finding
    {
        bool isProblem = false; ///< else a note: an explanation, or something harmless
        std::string code;       ///< stable, for scripts
        std::wstring text;
        int line = 0; ///< in the file, from 1; 0 when the finding has no place
        int column = 0;
    };

    /// Something that was examined.
    struct Subject
    {
        std::string kind;
        std::wstring location; ///< path of a file, folder or key; for a value of the registry list its name
        std::vector<Finding> findings;

        void AddProblem(const char* code, std::wstring text) { Add(true, code, std::move(text)); }
        void AddNote(const char* code, std::wstring text) { Add(false, code, std::move(text)); }

    private:
        void Add(bool isProblem, const char* code, std::wstring text)
        {
            findings.push_back({.isProblem = isProblem, .code = code, .text = std::move(text)});
        }
    };

    /// Something that may be a provider.
    struct Candidate : Subject
    {
        std::optional<std::wstring> name; ///< of the provider, if it is known
        bool listed = false;
        std::optional<std::int32_t> contractVersion; ///< of a plug-in that could be asked
        std::optional<std::wstring> library;         ///< path of an MSSCCI library that was found
    };

    std::vector<Subject> locations; ///< where the library reads: files, a folder, a key of the registry
    std::vector<Candidate> candidates;

    std::size_t NumListed() const;
    std::size_t NumProblems() const;

    /// Prints everything for people. The last line is the summary.
    void PrintText(std::ostream& stream, const OutputStyle& style) const;

    /// Prints everything as one JSON object.
    void PrintJson(std::ostream& stream) const;
};
