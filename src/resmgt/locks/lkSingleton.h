#pragma once

#include "lkSingletonState.h"

namespace Orv {

/// The one instance of @p T in the process, made when it is first asked for, whichever library
/// asks.
///
///     class Table {
///         friend class LkSingleton<Table>;
///         Table();  // or: static ObjPtrRet<Table> createInstance();
///     };
///     Table& table = LkSingleton<Table>::getInstance();
///
/// It is destroyed by InPackageInit::shutdownAll() alone, the last made first, and is still there
/// in static destructors otherwise. @p T is known by its name: give it one that other libraries do
/// not use, and keep the library that asked first loaded.
///
/// - Threads: any thread may ask; one of them makes the instance while the others wait.
template <class T>
class LkSingleton {
public:
    LkSingleton() = delete;

    /// @throws AssertionFailed inside the constructor of T and after its destruction; what that
    ///   constructor throws, after which a later call tries again; ExSysError.
    static T& getInstance();

private:
    static void* create();
    static void destroy(void* instance);
};

}  // namespace Orv

#include "lkSingleton.imp"
