// The binary interfaces that an in-process server needs.
#pragma once

#include <QString>

#include <atomic>
#include <cstdint>
#include <cstring>

namespace kest::com {

/// The result of a call across the binary interface; 0 or greater is a success.
using HResult = std::int32_t;
constexpr HResult Ok = 0;
constexpr HResult False = 1;
constexpr HResult NoInterface = static_cast<HResult>(0x80004002);
constexpr HResult BadPointer = static_cast<HResult>(0x80004003);
constexpr HResult Fail = static_cast<HResult>(0x80004005);
constexpr HResult NoAggregation = static_cast<HResult>(0x80040110);
constexpr HResult ClassNotAvailable = static_cast<HResult>(0x80040111);
constexpr HResult OutOfMemory = static_cast<HResult>(0x8007000E);
constexpr HResult CannotWriteKey = static_cast<HResult>(0x80040201);

/// Identifies a class or an interface.
struct Guid {
    std::uint32_t data1;
    std::uint16_t data2;
    std::uint16_t data3;
    std::uint8_t data4[8];
};
inline bool operator==(const Guid& a, const Guid& b)
{
    return std::memcmp(&a, &b, sizeof(Guid)) == 0;
}
/// Returns for example "{00000000-0000-0000-C000-000000000046}".
QString text(const Guid& id);

constexpr Guid IID_IUnknown{0x00000000, 0, 0, {0xC0, 0, 0, 0, 0, 0, 0, 0x46}};
constexpr Guid IID_IClassFactory{0x00000001, 0, 0, {0xC0, 0, 0, 0, 0, 0, 0, 0x46}};

/// The interface of every object: its other interfaces and its reference count.
struct IUnknown {
    virtual HResult QueryInterface(const Guid& iid, void** object) = 0;
    virtual std::uint32_t AddRef() = 0;
    virtual std::uint32_t Release() = 0;

protected:
    ~IUnknown() = default;
};

/// Creates objects of one class.
struct IClassFactory : IUnknown {
    virtual HResult CreateInstance(IUnknown* outer, const Guid& iid, void** object) = 0;
    virtual HResult LockServer(std::int32_t lock) = 0;

protected:
    ~IClassFactory() = default;
};

/// The number of objects and locks that keep the server loaded.
std::atomic<long>& serverReferences();

}  // namespace kest::com
