// The CAD host's interface, as far as this library uses it.
//
// Nothing here comes from a vendor SDK: this header declares exactly the types and operations the
// library calls, and devhost/ implements them. The library binds every operation at load time by its
// export name from the modules of the process that loaded it (host/hostbind.cpp), into one table.
// Every name is listed once, in ORVEX_HOST_OPERATIONS below.
//
// ABI assumptions (both sides are built with the same mingw-w64 g++ for x86-64):
//  - Plain operations are exported by the host as extern "C" functions under the names listed here, with
//    the one x86-64 Windows calling convention. Variadic ones (acutPrintf, acutBuildList) follow the
//    Microsoft x64 varargs rules: doubles are passed as 8 bytes, shorts and ints widened to int.
//  - Objects that cross the boundary (document manager, its reactor, system registry, dynamic linker,
//    module object) are C++ classes with virtual functions only, single inheritance, no data members in
//    the interface, so their vtables are laid out in declaration order by the Itanium C++ ABI that
//    mingw-w64 uses. A virtual destructor takes two slots (complete, deleting); none of the interfaces
//    below declares one before its operations, so slot numbers are the declaration order.
//  - resbuf is laid out as the host's result buffer: next pointer, 16-bit type code, then an 8-byte
//    aligned value union of 24 bytes (three doubles for points).
//  - Text crossing the boundary is wide (wchar_t, UTF-16); resbuf strings are allocated by the host's C
//    runtime heap (malloc from msvcrt.dll, shared by every module of the process) and freed by acutRelRb.
//  - HWND is the Windows handle type; the header declares it itself so that portable code can include it
//    without <windows.h>.
#pragma once

#include <cstddef>
#include <cstdint>

#ifndef _WINDEF_
struct HWND__;
typedef HWND__* HWND;
#endif

// ---- Status codes ----------------------------------------------------------------------------------
enum : int {
    RTNORM = 5100, // request succeeded
    RTNONE = 5000, // no result
    RTERROR = -5001,
    RTCAN = -5002,
    RTREJ = -5003,
    RTFAIL = -5004,
    RTKWORD = -5005,
};

// Result-buffer type codes of the LISP interface.
enum : short {
    RTREAL = 5001,  // real number
    RTSHORT = 5003, // short integer
    RTSTR = 5005,   // string
    RTENAME = 5006, // entity name
    RTPOINT = 5009, // 2D or 3D point
    RTLONG = 5010,  // 32-bit integer
    RTLB = 5016,    // list begin
    RTLE = 5017,    // list end
    RTNIL = 5019,   // nil
};

// Entry-point message codes of the host's extension interface.
namespace AcRx {
enum AppMsgCode : int {
    kNullMsg = 0,
    kInitAppMsg = 1,
    kUnloadAppMsg = 2,
    kLoadDwgMsg = 3,
    kUnloadDwgMsg = 4,
    kInvkSubrMsg = 5,
};
enum AppRetCode : int { kRetOK = 0, kRetError = 3 };
} // namespace AcRx

typedef double ads_real;
typedef ads_real ads_point[3];
typedef std::int64_t ads_name[2];

union ads_u_val {
    ads_real rreal;
    ads_real rpoint[3];
    short rint;
    wchar_t* rstring;
    std::int64_t rlname[2];
    std::int32_t rlong;
};

struct resbuf {
    resbuf* rbnext;
    short restype;
    ads_u_val resval;
};

// ---- Objects the host hands out ----------------------------------------------------------------------

class AcApDocument; // opaque: only its address is used, as a key

// A document manager reactor: the host calls these on its user-interface thread.
class AcApDocManagerReactor {
public:
    virtual void documentCreated(AcApDocument*) {}
    virtual void documentToBeDestroyed(AcApDocument*) {}
    virtual void documentActivated(AcApDocument*) {}

protected:
    ~AcApDocManagerReactor() = default; // owned and destroyed by whoever created it, never by the host
};

class AcApDocManager {
public:
    virtual void addReactor(AcApDocManagerReactor* reactor) = 0;
    virtual void removeReactor(AcApDocManagerReactor* reactor) = 0;
    virtual AcApDocument* curDocument() = 0;

protected:
    ~AcApDocManager() = default;
};

class AcRxClass; // run-time class descriptor; compared by address only

class AcRxObject {
public:
    virtual bool isKindOf(const AcRxClass* cls) const = 0;

protected:
    ~AcRxObject() = default;
};

// The host's dynamic linker: the service "DynamicLinker" of the system registry.
class AcRxDynamicLinker : public AcRxObject {
public:
    virtual bool unlockApplication(void* appId) = 0;
    virtual bool registerAppMDIAware(void* appId) = 0;

protected:
    ~AcRxDynamicLinker() = default;
};

// The system registry: named service objects.
class AcRxDictionary : public AcRxObject {
public:
    virtual AcRxObject* at(const wchar_t* key) = 0;

protected:
    ~AcRxDictionary() = default;
};

// A wide string returned by value from the module object (the file name of the module).
// Fixed storage keeps it a plain value with the same layout on both sides of the boundary.
class OdString {
public:
    enum { kCapacity = 260 };
    OdString() { m_text[0] = 0; }
    explicit OdString(const wchar_t* text) {
        std::size_t i = 0;
        for (; text && text[i] && i + 1 < kCapacity; ++i)
            m_text[i] = text[i];
        m_text[i] = 0;
    }
    const wchar_t* c_str() const { return m_text; }

private:
    wchar_t m_text[kCapacity];
};

// Base of the module object that odrxCreateModuleObject returns. Slot order is the contract.
class OdRxObject {
public:
    virtual bool isKindOf(const AcRxClass* cls) const { return false; }

protected:
    ~OdRxObject() = default;
};

class OdRxModule : public OdRxObject {
public:
    virtual void addRef() = 0;
    virtual void release() = 0;
    virtual long numRefs() const = 0;
    virtual void* sysData() = 0;     // the module's instance handle
    virtual void deleteModule() = 0; // destroys the module object (frees it with odrxFree)
    virtual OdString moduleName() const = 0;
    virtual void initApp() = 0;   // load notification
    virtual void uninitApp() = 0; // unload notification

protected:
    ~OdRxModule() = default;
};

// ---- Operations --------------------------------------------------------------------------------------
// X(return type, export name, parameter list). This is the one list of names the library binds.
#define ORVEX_HOST_OPERATIONS(X)                                                                             \
    X(int, acedDefun, (const wchar_t* name, int funcNumber))                                                 \
    X(int, acedUndef, (const wchar_t* name, int funcNumber))                                                 \
    X(int, acedGetFunCode, ())                                                                               \
    X(resbuf*, acedGetArgs, ())                                                                              \
    X(int, acedRetList, (const resbuf* list))                                                                \
    X(int, acedRetNil, ())                                                                                   \
    X(int, acedRetVoid, ())                                                                                  \
    X(resbuf*, acutBuildList, (int restype, ...))                                                            \
    X(resbuf*, acutNewRb, (int restype))                                                                     \
    X(int, acutRelRb, (resbuf * rb))                                                                         \
    X(int, acutPrintf, (const wchar_t* format, ...))                                                         \
    X(int, acedAlert, (const wchar_t* text))                                                                 \
    X(void, acdbFail, (const wchar_t* text))                                                                 \
    X(AcApDocManager*, acDocManagerPtr, ())                                                                  \
    X(AcRxDictionary*, acrxSysRegistry, ())                                                                  \
    X(const AcRxClass*, acrxDynamicLinkerDesc, ())                                                           \
    X(HWND, acedGetAcadFrame, ())                                                                            \
    X(HWND, acedGetAcadWinApp, ())                                                                           \
    X(HWND, acedGetAcadDwgView, ())                                                                          \
    X(bool, acdbGetLayerColor, (const wchar_t* layerName, int* colorIndex))                                  \
    X(bool, acedSetColorDialog, (int* colorIndex, bool allowMetaColor, int currentLayerColor))               \
    X(std::uint32_t, acedGetRGB, (int colorIndex))                                                           \
    X(bool, acdbDisplayPreviewFromDwg, (const wchar_t* fileName, HWND window, const std::uint32_t* bgColor)) \
    X(int, onLoadArxApp, (const wchar_t* moduleFileName))                                                    \
    X(int, onUnloadArxApp, (const wchar_t* moduleFileName))                                                  \
    X(void*, odrxAlloc, (std::size_t size))                                                                  \
    X(void, odrxFree, (void* block))

// Meanings, for the host's implementer:
//  acedDefun/acedUndef   define/undefine a LISP function of this library in the current document;
//                        the code is given back by acedGetFunCode when the function is invoked.
//  acedGetArgs           the arguments of the running call (owned by the host; the caller may release it
//                        with acutRelRb, after which the host must not use it again).
//  acedRetList/Nil/Void  set the call's value: a copy of the list, nil, or no value at all.
//  acutBuildList         builds a chain from (type, value) pairs ended by 0; strings are copied.
//  acutNewRb/acutRelRb   allocate one node / release a whole chain with its strings.
//  acutPrintf            prints on the command line (wide printf format).
//  acedAlert             the host's alert box. acdbFail: the host's failure report.
//  acdbGetLayerColor     the colour index of a layer of the working drawing; false when there is none.
//  acedSetColorDialog    the host's colour dialog; true when the user confirmed a colour.
//  acedGetRGB            0x00BBGGRR of an index of the host's 256-colour palette.
//  acdbDisplayPreviewFromDwg  draws the preview stored in a drawing file into the window; false when the
//                        file has none. A relative name is resolved against the current directory.
//  acrxDynamicLinkerDesc the class descriptor that identifies the dynamic linker (isKindOf argument).

// The library's own entry points, which the host finds by name in the loaded library.
extern "C" {
typedef AcRx::AppRetCode (*AcrxEntryPointFn)(AcRx::AppMsgCode msg, void* appId);
typedef int (*AcrxGetApiVersionFn)(std::uint32_t* major, std::uint32_t* minor, std::uint32_t* build,
                                   std::uint32_t* patch);
typedef OdRxModule* (*OdrxCreateModuleObjectFn)();
}
