#pragma once

#include "FileBytes.h"
#include "OrvixFileIO.h"

class OrvixPromptTable;
struct FileDiagnostics;

inline constexpr wchar_t PromptFileName[] = L"OrvixPrompts.xml";
inline constexpr wchar_t PromptFileRoot[] = L"OrvixPrompts"; ///< as it is written; any other is read as well

/// Fills the empty table from a file. The table stays empty when the file is missing or broken
/// (false). Prompts without one of their five elements are dropped; texts are cut to 1024 characters.
/// Exhausted memory leaves the table empty and throws std::bad_alloc or `_com_error`. `diagnostics` and `content`,
/// which receives what the file is, may be null.
bool ReadPromptFile(OrvixPromptTable& table, const wchar_t* path, FileDiagnostics* diagnostics = nullptr,
                    OrvixFileIO::Content* content = nullptr);

/// Writes the table to a file. An empty table is never written, so that a host without prompts keeps the user's answers
/// (true). False when the document cannot be made whole or cannot be saved, with the file left as it is.
bool WritePromptFile(OrvixPromptTable& table, const wchar_t* path,
                     FileBytes::Previous previous = FileBytes::Previous::Replaced);
