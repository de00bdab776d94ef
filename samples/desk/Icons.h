#pragma once

#include "Handles.h"

/// The pictures of the program. The number is the index in the image list.
enum class Icon
{
    // of commands
    Add,
    CheckOut,
    CheckIn,
    Undo,
    GetLatest,
    History,
    Refresh,
    // of files
    NotControlled,
    CheckedIn,
    CheckedOut,
    CheckedOutByOther,
    Modified,
    OutOfDate,
    Deleted,
    Excluded,
    Unknown,
    // of the tree
    Folder
};

/// Draws all pictures with `size` pixels in each direction. GDI+ must be running.
UniqueImageList MakeIcons(int size);

/// Keeps GDI+ running while it lives.
class DrawingSession
{
public:
    DrawingSession();
    DrawingSession(const DrawingSession&) = delete;
    DrawingSession& operator=(const DrawingSession&) = delete;
    ~DrawingSession();

private:
    ULONG_PTR m_token = 0;
};
