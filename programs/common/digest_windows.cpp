#include <stdexcept>

#include "programs/common/digest.h"

#include <windows.h>
#include <wincrypt.h>

namespace velmora::hosts {
namespace {

// The system's hashing service, opened once for the process.
class Provider {
  public:
    Provider() {
        if (!CryptAcquireContextW(&m_handle, nullptr, nullptr, PROV_RSA_FULL, CRYPT_VERIFYCONTEXT)) {
            throw std::runtime_error("the system offers no MD5 digest");
        }
    }
    ~Provider() { CryptReleaseContext(m_handle, 0); }
    Provider(const Provider&) = delete;
    Provider& operator=(const Provider&) = delete;

    [[nodiscard]] HCRYPTPROV Handle() const { return m_handle; }

  private:
    HCRYPTPROV m_handle = 0;
};

class Hash {
  public:
    explicit Hash(const Provider& provider) {
        if (!CryptCreateHash(provider.Handle(), CALG_MD5, 0, 0, &m_handle)) {
            throw std::runtime_error("the system offers no MD5 digest");
        }
    }
    ~Hash() { CryptDestroyHash(m_handle); }
    Hash(const Hash&) = delete;
    Hash& operator=(const Hash&) = delete;

    void Add(const std::uint8_t* bytes, std::size_t count) {
        if (!CryptHashData(m_handle, bytes, static_cast<DWORD>(count), 0)) {
            throw std::runtime_error("the MD5 digest failed");
        }
    }

    std::string Finish() {
        std::uint8_t sum[16];
        DWORD size = sizeof sum;
        if (!CryptGetHashParam(m_handle, HP_HASHVAL, sum, &size, 0)) {
            throw std::runtime_error("the MD5 digest failed");
        }
        return HexOf(sum, size);
    }

  private:
    HCRYPTHASH m_handle = 0;
};

}  // namespace

std::string FrameDigest(const std::uint8_t* pixels, std::int32_t width, std::int32_t height,
                        std::ptrdiff_t strideBytes) {
    static const Provider provider;
    Hash hash(provider);
    for (std::int32_t y = 0; y < height; ++y) {
        hash.Add(pixels + y * strideBytes, static_cast<std::size_t>(width) * 4);
    }
    return hash.Finish();
}

}  // namespace velmora::hosts
