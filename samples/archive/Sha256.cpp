#include "Sha256.h"

#include "ArchiveFailure.h"

#include <windows.h>

#include <bcrypt.h>

namespace
{

void Check(NTSTATUS status)
{
    if (status < 0)
    {
        throw ArchiveFailure{ArchiveError::Access, L"SHA-256 is not available", {}};
    }
}

class Algorithm
{
public:
    Algorithm() { Check(BCryptOpenAlgorithmProvider(&m_handle, BCRYPT_SHA256_ALGORITHM, nullptr, 0)); }
    Algorithm(const Algorithm&) = delete;
    Algorithm& operator=(const Algorithm&) = delete;
    ~Algorithm() { BCryptCloseAlgorithmProvider(m_handle, 0); }

    BCRYPT_ALG_HANDLE Get() const { return m_handle; }

private:
    BCRYPT_ALG_HANDLE m_handle = nullptr;
};

} // namespace

Sha256::Sha256()
{
    static const Algorithm algorithm;
    Check(BCryptCreateHash(algorithm.Get(), &m_hash, nullptr, 0, nullptr, 0, 0));
}

Sha256::~Sha256()
{
    BCryptDestroyHash(m_hash);
}

void Sha256::Add(const void* bytes, std::size_t size)
{
    // The argument is not const, but CNG only reads the bytes.
    Check(BCryptHashData(m_hash, static_cast<UCHAR*>(const_cast<void*>(bytes)), static_cast<ULONG>(size), 0));
}

std::string Sha256::Finish()
{
    UCHAR digest[32];
    Check(BCryptFinishHash(m_hash, digest, sizeof digest, 0));
    constexpr char Digits[] = "0123456789abcdef";
    std::string text;
    for (const UCHAR part : digest)
    {
        text += Digits[part >> 4];
        text += Digits[part & 15];
    }
    return text;
}
