#pragma once

#include <string>

/// While it lives, what the job and the library log goes into files in a folder, a few pages each.
class JobLog {
public:
    explicit JobLog(const std::string& folder);
    JobLog(const JobLog&) = delete;
    JobLog& operator=(const JobLog&) = delete;
    ~JobLog();
};
