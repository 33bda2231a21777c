// The in-process server: its four entry points and the class that it offers.
#pragma once

#include "shell/com.h"

namespace kest {

/// {6B1F3D52-8E0C-4B7A-9D64-2A7C51E0F3B8}
constexpr com::Guid CLSID_eKEST{0x6B1F3D52, 0x8E0C, 0x4B7A, {0x9D, 0x64, 0x2A, 0x7C, 0x51, 0xE0, 0xF3, 0xB8}};
/// {C4E97A10-53D8-4F26-8B1E-90D2A6F7415C}
constexpr com::Guid IID_IeKEST{0xC4E97A10, 0x53D8, 0x4F26, {0x8B, 0x1E, 0x90, 0xD2, 0xA6, 0xF7, 0x41, 0x5C}};

/// Zero-terminated UTF-16 text, passed by reference. The caller owns it.
using Text = char16_t*;

/// The interface of the class eKEST as a host sees it.
struct IeKEST : com::IUnknown {
    /// Shows the panel for a quote and returns when the user has closed it. Pass "0" and "0" if no quote is open.
    virtual com::HResult ShowKESTWindow(Text* sQTNNO, Text* sSubQuote) = 0;

protected:
    ~IeKEST() = default;
};

/// Registers the class in the settings store. Returns false if a key can't be written.
bool registerClass();

}  // namespace kest

extern "C" {
/// Registers the class in the settings store of the profile.
kest::com::HResult DllRegisterServer();
/// Removes what DllRegisterServer() has written.
kest::com::HResult DllUnregisterServer();
/// Stores the class object of CLSID_eKEST in `object`. The caller releases it.
kest::com::HResult DllGetClassObject(const kest::com::Guid& classId, const kest::com::Guid& iid, void** object);
/// Returns Ok if no object and no lock is left, otherwise False.
kest::com::HResult DllCanUnloadNow();
}
