#pragma once

#include "BraeHeapOperators.h"
#include "OrvixExport.h"

#include <cstdint>

/// How a provider's browse dialog behaves, with its file-type filters.
///
/// Created and owned by the host. Texts are copied in: a setter given null, or without memory left, leaves
/// the old text. A getter's text is valid until the field is set again or the record is destroyed. Nothing is checked.
/// All operations: [library, main-thread].
class ORVIX_API OrvixExploreProviderParams : public BraeHeapOperators
{
public:
    /// Makes a record with the default of each value; allocates nothing.
    OrvixExploreProviderParams();
    OrvixExploreProviderParams(const OrvixExploreProviderParams&) = delete;
    OrvixExploreProviderParams& operator=(const OrvixExploreProviderParams&) = delete;
    /// Frees the copies of the texts and filters.
    virtual ~OrvixExploreProviderParams();

    /// Title of the dialog; empty by default.
    virtual const wchar_t* GetTitle();
    /// Sets the title; a copy is kept.
    virtual void SetTitle(const wchar_t* title);

    /// Whether several files may be chosen; false by default.
    virtual bool GetMultipleSelections();
    /// Sets whether several files may be chosen.
    virtual void SetMultipleSelections(bool allowed);

    /// Whether the chosen files are downloaded; true by default.
    virtual bool GetDownloadFiles();
    /// Sets whether the chosen files are downloaded.
    virtual void SetDownloadFiles(bool download);

    /// Appends a file-type filter; both texts are copied unchanged. Returns the new number of filters, or 0
    /// with nothing added when a text is null or memory runs out.
    virtual std::uint32_t AddFilter(const wchar_t* name, const wchar_t* extensions);

    /// Number of filters.
    virtual std::uint32_t NumFilters();

    /// Name of the filter at `index`; null when `index` is not below `NumFilters()`. Valid as long as the record.
    virtual const wchar_t* GetFilterName(std::uint32_t index);
    /// Extensions of the filter at `index`, as `GetFilterName`.
    virtual const wchar_t* GetFilterExtensions(std::uint32_t index);

private:
    enum Flag : std::uint32_t
    {
        MultipleSelections = 0x1,
        DownloadFiles = 0x2
    };

    // The texts and filters; null until one is stored. The flags are a member, so that setting them cannot fail.
    struct State;
    State* m_state = nullptr;
    std::uint32_t m_flags = DownloadFiles;
};

static_assert(sizeof(OrvixExploreProviderParams) == 24, "host and library must agree about the size of a record");
