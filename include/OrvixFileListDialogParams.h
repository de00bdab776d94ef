#pragma once

#include "BraeHeapOperators.h"
#include "OrvixExport.h"
#include "OrvixPrompt.h"

#include <cstdint>

class OrvixFileList;

/// What a file-list dialog shows and what it returns.
///
/// Created and owned by the host. Texts are copied in: a setter given null, or without memory left, leaves
/// the old text. A getter's text is never null and is valid until the field is set again or the record is
/// destroyed. Nothing is checked. All operations: [library, main-thread].
class ORVIX_API OrvixFileListDialogParams : public BraeHeapOperators
{
public:
    /// Makes a record with the default of each value; allocates nothing.
    OrvixFileListDialogParams();
    OrvixFileListDialogParams(const OrvixFileListDialogParams&) = delete;
    OrvixFileListDialogParams& operator=(const OrvixFileListDialogParams&) = delete;
    /// Frees the copies of the texts; the file list stays with its owner.
    virtual ~OrvixFileListDialogParams();

    /// Sets the options, bits of `OrvixDialogOption`. The setter comes first: that order is part of the published
    /// table.
    virtual void SetOptions(std::uint32_t options);

    /// The options, bits of `OrvixDialogOption`, which the dialog and `IOrvixServices::RunFileListOperation` read and
    /// write; 0 by default.
    virtual std::uint32_t GetOptions();

    /// Title of the dialog; empty by default.
    virtual const wchar_t* GetTitle();
    /// Sets the title; a copy is kept.
    virtual void SetTitle(const wchar_t* title);

    /// Message above the files; empty by default. The name ends in W so that no header's macro changes it.
    virtual const wchar_t* GetMessageW();
    /// Sets the message; a copy is kept.
    virtual void SetMessage(const wchar_t* message);

    /// The files; the dialog shows the active entries. Null by default. Not owned.
    virtual OrvixFileList* GetOrvixFileList();
    /// Sets the files, which must stay alive as long as the record names them; null for none.
    virtual void SetOrvixFileList(OrvixFileList* list);

    /// Comment for the operation; empty by default.
    virtual const wchar_t* GetComment();
    /// Sets the comment; a copy is kept.
    virtual void SetComment(const wchar_t* comment);

    /// Prompt whose stored answer may replace the dialog; `OrvixPromptID::Unset` (no prompt) by default.
    virtual std::int32_t GetDialogPromptID();
    /// Sets the prompt of the dialog; `OrvixPromptID::Unset` for none.
    virtual void SetDialogPromptID(std::int32_t id);

    /// Prompt whose stored answer sets the dialog's option; `OrvixPromptID::Unset` (no prompt) by default.
    virtual std::int32_t GetOptionPromptID();
    /// Sets the prompt of the option; `OrvixPromptID::Unset` for none.
    virtual void SetOptionPromptID(std::int32_t id);

private:
    // The texts; null until one is stored. Numbers and pointers are members, so that setting them cannot fail.
    struct State;
    State* m_state = nullptr;
    OrvixFileList* m_fileList = nullptr;
    std::uint32_t m_options = 0;
    std::int32_t m_dialogPromptID = OrvixPromptID::Unset;
    std::int32_t m_optionPromptID = OrvixPromptID::Unset;
};

static_assert(sizeof(OrvixFileListDialogParams) == 40, "host and library must agree about the size of a record");
