#pragma once

#include <cstddef>
#include <string>

/// SHA-256 by Windows CNG. Throws `ArchiveFailure` when CNG fails.
class Sha256
{
public:
    Sha256();
    Sha256(const Sha256&) = delete;
    Sha256& operator=(const Sha256&) = delete;
    ~Sha256();

    void Add(const void* bytes, std::size_t size);

    /// The digest of everything added, as 64 lower-case hexadecimal digits. The object is not used after that.
    std::string Finish();

private:
    void* m_hash = nullptr;
};
