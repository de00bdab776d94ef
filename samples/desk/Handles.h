#pragma once

#include <windows.h>

#include <commctrl.h>

#include <memory>
#include <type_traits>

/// Closes a handle of Windows with a function.
template <auto Close>
struct HandleCloser
{
    template <typename Handle>
    void operator()(Handle* handle) const
    {
        Close(handle);
    }
};

/// Owns a handle of Windows that is a pointer, null for none.
template <typename Handle, auto Close>
using UniqueHandleOf = std::unique_ptr<std::remove_pointer_t<Handle>, HandleCloser<Close>>;

using UniqueFont = UniqueHandleOf<HFONT, &DeleteObject>;
using UniqueBrush = UniqueHandleOf<HBRUSH, &DeleteObject>;
using UniqueIcon = UniqueHandleOf<HICON, &DestroyIcon>;
using UniqueWindow = UniqueHandleOf<HWND, &DestroyWindow>;
using UniqueImageList = UniqueHandleOf<HIMAGELIST, &ImageList_Destroy>;
using UniqueSystemHandle = UniqueHandleOf<HANDLE, &CloseHandle>;
