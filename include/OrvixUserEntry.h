#pragma once

#include "BraeHeapOperators.h"
#include "OrvixExport.h"

/// A user: login name and person.
///
/// Created by an `OrvixUserList` (which then owns it) or by the host. Texts are copied in whole: a setter
/// given null (and any setter when memory runs out) leaves the old text. A getter's text is never null, empty by
/// default, and valid until the field is set again or the entry is destroyed.
/// All operations: [library, main-thread].
class ORVIX_API OrvixUserEntry : public BraeHeapOperators
{
public:
    /// Makes an entry without a name; allocates nothing.
    OrvixUserEntry();
    OrvixUserEntry(const OrvixUserEntry&) = delete;
    OrvixUserEntry& operator=(const OrvixUserEntry&) = delete;
    /// Frees the copies of the texts.
    virtual ~OrvixUserEntry();

    /// Login name. The getter's name ends in W so that no header's macro changes it.
    virtual const wchar_t* GetUserNameW();
    /// Sets the login name.
    virtual void SetUserName(const wchar_t* name);

    /// First name.
    virtual const wchar_t* GetFirstName();
    /// Sets the first name.
    virtual void SetFirstName(const wchar_t* name);

    /// Last name.
    virtual const wchar_t* GetLastName();
    /// Sets the last name.
    virtual void SetLastName(const wchar_t* name);

    /// E-mail address; stored as given.
    virtual const wchar_t* GetEmail();
    /// Sets the e-mail address.
    virtual void SetEmail(const wchar_t* email);

private:
    // What the library alone knows; null until something is stored.
    struct State;
    State* m_state = nullptr;
};

static_assert(sizeof(OrvixUserEntry) == 16, "host and library must agree about the size of a record");
