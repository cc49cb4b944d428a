#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

#include <concepts>
#include <memory>

class KpFilename;

/// A shared object that is loaded at run time: a plug-in package, by its short name.
///
/// A loaded object stays in the process, also after close() and destruction. One thread at a time;
/// set the static members before the first load.
class KPLIB_API KpDSO {
public:
    /// Folders to search, the last one first. The application owns the texts.
    static KpDArray<char*> dsoSearchPath;
    /// Any value but 0 writes more lines to the log.
    static int verbose;

    /// Opens `name` unless it is null; check isOpen() for success.
    explicit KpDSO(const char* name);
    KpDSO(const KpDSO&) = delete;
    KpDSO& operator=(const KpDSO&) = delete;
    ~KpDSO();

    /// Loads the object with the name that fixPath() makes of `name`: an absolute path as it is,
    /// otherwise below the folders of the search path, and last by the system's own search. Calls
    /// its function orlinpackage_NAME_init(), if there is one; NAME is the file's name without
    /// "lib" and without the part from its last dot. Returns 0, or -1 with a line in the log
    /// unless `quiet`.
    int open(const char* name, bool quiet);
    /// Closes the object, which stays loaded.
    void close();
    /// Whether an object is open.
    bool isOpen() const;

    /// Changes NAME to "libNAME.so". A name with a dot stays unchanged.
    static void fixPath(KpFilename& name);
    /// Loads the file `path`; 0, or -1. `message` receives the outcome in words.
    int tryOpen(const char* path, KpString& message);

    /// The address of a symbol, with or without a leading '_'. Null if there is none or no object
    /// is open.
    void* getSymbol(const char* name) const;

    // Call a function of the object with zero to five pointers. Without an object or such a symbol nothing is called,
    // and the result is 0.

    /// Calls a function without a result.
    template <std::convertible_to<void*>... Arguments>
    requires(sizeof...(Arguments) <= 5) void execute(const char* name, Arguments... arguments) const
    {
        call<void>(name, static_cast<void*>(arguments)...);
    }
    /// Calls a function that returns an int.
    template <std::convertible_to<void*>... Arguments>
    requires(sizeof...(Arguments) <= 5) int executeInt(const char* name, Arguments... arguments) const
    {
        return call<int>(name, static_cast<void*>(arguments)...);
    }
    /// Calls a function that returns a pointer.
    template <std::convertible_to<void*>... Arguments>
    requires(sizeof...(Arguments) <= 5) void* executePtr(const char* name, Arguments... arguments) const
    {
        return call<void*>(name, static_cast<void*>(arguments)...);
    }

private:
    struct Private;

    template <typename Result, typename... Pointers>
    Result call(const char* name, Pointers... pointers) const
    {
        void* const symbol = isOpen() ? getSymbol(name) : nullptr;
        return symbol ? reinterpret_cast<Result (*)(Pointers...)>(symbol)(pointers...) : Result();
    }
    int load(const KpFilename& name, KpString& messages);
    void initPackage(const KpFilename& name) const;

    std::unique_ptr<Private> private_;
};
