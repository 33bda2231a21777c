// The in-process server: the four entry points, and the class that they offer.
#pragma once

#include "shell/com.h"

namespace kest {

/// {6B1F3D52-8E0C-4B7A-9D64-2A7C51E0F3B8}
constexpr com::Guid CLSID_eKEST{0x6B1F3D52, 0x8E0C, 0x4B7A, {0x9D, 0x64, 0x2A, 0x7C, 0x51, 0xE0, 0xF3, 0xB8}};
/// {C4E97A10-53D8-4F26-8B1E-90D2A6F7415C}
constexpr com::Guid IID_IeKEST{0xC4E97A10, 0x53D8, 0x4F26, {0x8B, 0x1E, 0x90, 0xD2, 0xA6, 0xF7, 0x41, 0x5C}};

/// A text by reference: UTF-16, closed by a zero; it stays the caller's.
using Text = char16_t*;

/// What a host sees of the class eKEST.
struct IeKEST : com::IUnknown {
    /// Shows the panel on a quote, "0" and "0" for none, and returns when it has been closed.
    virtual com::HResult ShowKESTWindow(Text* sQTNNO, Text* sSubQuote) = 0;

protected:
    ~IeKEST() = default;
};

/// Enters the class into the settings store; false if a key can't be written.
bool registerClass();

}  // namespace kest

extern "C" {
/// Enters the class into the settings store of the profile.
kest::com::HResult DllRegisterServer();
kest::com::HResult DllUnregisterServer();
/// The class object of CLSID_eKEST.
kest::com::HResult DllGetClassObject(const kest::com::Guid& classId, const kest::com::Guid& iid, void** object);
/// Ok while no object and no lock is left.
kest::com::HResult DllCanUnloadNow();
}
