#include "JobLog.h"

#include <kplib/log/KpLogFile.h>

JobLog::JobLog(const std::string& folder)
{
    KpLogFile& log = getTheLogInstance();
    log.setBaseFolder(folder);
    log.setMaxNumLogFiles(0);
    log.setMaxLogFileSizeInBytes(8000);
    log.setDateTimeFormat(KpLogFile::DateAndTime);
    log.setDefaultModule("Road");
    log.setLogLevel(KpLogInfo);
    log.open(false);
}

JobLog::~JobLog()
{
    getTheLogInstance().setLogLevel(KpLogOff);
    getTheLogInstance().close();
}
