#pragma once

class IOrvixProvider;

/// @file
/// An optional fifth export of a plug-in: the files that its provider knows, on the disk or not. `IOrvixProvider` has
/// no operation that lists files, so without this export a host sees only what is on the disk.

/// Receives the full path of one file. `path` lives for the call. Returns without an exception. `callerData` is what
/// the host passed to `OrvixKnownFilesFunction`. [host, main-thread]
using OrvixKnownFileCallback = void (*)(void* callerData, const wchar_t* path);

/// The type of the export "GetOrvixKnownFiles", a plain C function with an undecorated name. It calls `callback` once
/// for each controlled file in `folder` and below, in any order, whether the file is on the disk or not. Not named
/// are files that are no longer under control, and those that the version-control system itself keeps out of the
/// working folder, as a sparse checkout does.
///
/// A host finds the export in the module that contains the provider's virtual table: `GetModuleHandleExW` with
/// `GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS` and the first pointer of the provider object. Providers of the library
/// itself, for MSSCCI libraries, have none.
///
/// `provider`: what `GetIOrvixProvider` of the same module returned; its project is open.
/// `folder`: full path of the project's folder or of one below it, with or without a backslash at its end. It lives for
/// the call. Each path that is named begins with it, in any letter case, and has backslashes only.
/// `callback`: not null. It is called only until the function returns. `callerData`: passed to it; may be null.
///
/// Returns `OrvixProviderResult::Success` when all files were named, and `OrvixProviderResult::Failure` otherwise; some
/// may have been named all the same. The user is told the reason through `IOrvixClientAccess::OutputText`. Lets no
/// exception out. [plug-in, main-thread, project-open]
using OrvixKnownFilesFunction = int(IOrvixProvider* provider, const wchar_t* folder, OrvixKnownFileCallback callback,
                                    void* callerData);
