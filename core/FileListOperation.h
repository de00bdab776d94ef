#pragma once

#include <cstdint>

class IOrvixProvider;
class OrvixFileList;
class OrvixFileListDialogParams;
class StoredAnswers;
class UserInterface;

/// One run of `IOrvixServices::RunFileListOperation`: source-control operations on the active entries of a
/// file list. Lives for that call; owns nothing.
class FileListOperation
{
public:
    FileListOperation(StoredAnswers& answers, UserInterface& userInterface, void* dialogArgument,
                      OrvixFileListDialogParams& params, OrvixFileList& list, IOrvixProvider* provider,
                      std::uint32_t operations);

    /// Runs all steps; the result is that of `RunFileListOperation`.
    std::int32_t Run(bool callProviderFirst, std::uint32_t flagsOutMask);

private:
    /// The result is one of `OrvixOperationResult`; `run` says whether the provider is to be called.
    struct Confirmation
    {
        std::int32_t result;
        bool run;
    };

    bool KeepFittingEntries(std::uint32_t flagsOutMask);
    void RemoveClearedEntries();
    Confirmation Confirm();
    Confirmation ShowDialog(bool locked);
    void StoreAnswers(std::int32_t result);
    bool HasOption(std::uint32_t bit);
    unsigned long OfferedOption();
    void CallProvider();
    bool NotifyBefore(bool cancelled);
    void NotifyAfter();

    StoredAnswers& m_answers;
    UserInterface& m_userInterface;
    void* m_dialogArgument;
    OrvixFileListDialogParams& m_params;
    OrvixFileList& m_list;
    IOrvixProvider* m_provider;
    std::uint32_t m_operations;
    std::uint32_t m_dialogPrompt;
    std::uint32_t m_optionPrompt;
    unsigned long m_mode = 0; ///< bits of `OrvixProviderOption` for the provider's operations
};
