#pragma once

#include "zelctl_export.h"

#include <QString>

#include <cstdint>

// The four entry points of an in-process component library, with C linkage so a host can
// find them with dlsym after dlopen.

extern "C" {

typedef int32_t HRESULT;

// Same layout as the platform GUID and as QUuid.
typedef struct GUID
{
    uint32_t Data1;
    uint16_t Data2;
    uint16_t Data3;
    uint8_t Data4[8];
} GUID;

// Registers every public class in the per-user registration file. S_OK, or
// SELFREG_E_CLASS when the file cannot be written.
ZELCTL_EXPORT HRESULT DllRegisterServer(void);

// Removes the registration file. S_OK also when there was none.
ZELCTL_EXPORT HRESULT DllUnregisterServer(void);

// Puts the class factory (a zelctl::ClassFactory, owned by the library) of a class into *ppv.
// riid must be IID_IClassFactory or IID_IUnknown. Answers CLASS_E_CLASSNOTAVAILABLE for an
// identity the library does not serve, E_NOINTERFACE for another interface, E_POINTER for
// null arguments.
ZELCTL_EXPORT HRESULT DllGetClassObject(const GUID *rclsid, const GUID *riid, void **ppv);

// S_OK when no object of the library is alive and no factory is locked, otherwise S_FALSE.
ZELCTL_EXPORT HRESULT DllCanUnloadNow(void);
}

namespace zelctl {

inline constexpr HRESULT S_OK = 0;
inline constexpr HRESULT S_FALSE = 1;
inline constexpr HRESULT E_NOINTERFACE = static_cast<HRESULT>(0x80004002u);
inline constexpr HRESULT E_POINTER = static_cast<HRESULT>(0x80004003u);
inline constexpr HRESULT CLASS_E_CLASSNOTAVAILABLE = static_cast<HRESULT>(0x80040111u);
inline constexpr HRESULT SELFREG_E_CLASS = static_cast<HRESULT>(0x80040201u);

inline constexpr GUID IID_IUnknown = { 0x00000000, 0x0000, 0x0000, { 0xC0, 0, 0, 0, 0, 0, 0, 0x46 } };
inline constexpr GUID IID_IClassFactory = { 0x00000001, 0x0000, 0x0000, { 0xC0, 0, 0, 0, 0, 0, 0, 0x46 } };

// Where DllRegisterServer writes the registration (under the XDG data folder).
ZELCTL_EXPORT QString registrationFile();

} // namespace zelctl
