// Paths of logs: opening a file of any name below a folder of its own either works or leaves the log as it was.

#include "Fuzz.h"

#include <kplib/foundation/KpString.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/system/KpFilename.h>
#include <kplib/system/KpTmpDir.h>

#include <memory>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    getTheLogInstance().setLogLevel(KpLogOff);
    static const KpTmpDir folder("kplib-fuzz", true, true);
    Input input(data, size);
    std::string name = input.line();
    for (char& c : name)
        c = c == '/' || c == '\0' ? '_' : c;  // within the folder
    const std::unique_ptr<KpLogFile> log(KpLogFile::createInstance());
    const std::string base = folder.path().c_str();
    log->setBaseFolder(base);
    log->setMaxNumLogFiles(3);
    log->setMaxLogFileSizeInBytes(input.number<std::uint8_t>());
    log->setDefaultModule(input.line().c_str());
    if (log->append(KpString((base + "/" + name).c_str()))) {
        log->print(nullptr, input.rest().c_str());
        check(log->isOpen());
    } else {
        check(!log->isOpen());
    }
    log->close();
    return 0;
}
