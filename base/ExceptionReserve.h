#pragma once

/// Makes GCC's run-time allocate now what it needs to throw when memory runs out: the lock of its emergency
/// pool, made on the pool's first use, and the state of the calling thread. Without them the first exception in
/// a process without memory ends it. Called once, when the process loads the library. Other run-times need
/// nothing.
void ReserveForExceptions();

/// Frees what the run-time has reserved for exceptions, 73 KB in GCC's emergency pool. Without it, each unloading of
/// the library leaves that memory allocated. Called once, when the library is unloaded from a process that goes on.
void FreeExceptionReserve();
