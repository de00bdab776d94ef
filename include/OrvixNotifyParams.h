#pragma once

#include "BraeHeapOperators.h"
#include "OrvixExport.h"

#include <cstdint>

class OrvixFileList;

/// One notification on its way through the listeners.
///
/// Created and owned by the sender. Values are stored unchanged and never checked.
/// All operations: [library, main-thread], no failure.
class ORVIX_API OrvixNotifyParams : public BraeHeapOperators
{
public:
    /// Makes a record with the default of each value; allocates nothing.
    OrvixNotifyParams();
    OrvixNotifyParams(const OrvixNotifyParams&) = delete;
    OrvixNotifyParams& operator=(const OrvixNotifyParams&) = delete;
    /// Frees nothing: all that the record names stays with its owner.
    virtual ~OrvixNotifyParams();

    /// The notification's identifier; 0 by default. The sender gives it its meaning.
    virtual std::uint32_t GetID();
    /// Sets the identifier.
    virtual void SetID(std::uint32_t id);

    /// Index of the provider that the notification concerns; 0 by default.
    virtual std::uint32_t GetProviderIndex();
    /// Sets the provider index.
    virtual void SetProviderIndex(std::uint32_t index);

    /// True once a listener has cancelled; false by default.
    virtual bool IsCancelled();
    /// Marks the notification as cancelled, or clears the mark.
    virtual void SetCancelled(bool cancelled);

    /// The files that the notification concerns; null by default. Not owned.
    virtual OrvixFileList* GetOrvixFileList();
    /// Sets the files; null for none.
    virtual void SetOrvixFileList(OrvixFileList* list);

private:
    std::uint32_t m_id = 0;
    std::uint32_t m_providerIndex = 0;
    bool m_cancelled = false;
    OrvixFileList* m_fileList = nullptr;
};

static_assert(sizeof(OrvixNotifyParams) == 32, "host and library must agree about the size of a record");
