#include <kplib/log/detail/ResultTexts.h>

#include <kplib/log/KpResult.h>

namespace {

struct Row {
    int code;
    kplib::detail::ResultTexts texts;
};

constexpr Row rows[] = {
    {KpResult::Ok, {"operation successful", "operation successful"}},
    {KpResult::InternalError, {"internal error", "internal error"}},
    {KpResult::DataExpected, {"data expected", "data expected"}},
    {KpResult::NotSupported, {"not supported", "not supported"}},
    {KpResult::ReadOnly, {"read only", "read only"}},
    {KpResult::OutOfRange, {"out of range", "out of range"}},
    {KpResult::NotImplemented, {"not implemented", "not implemented"}},
    {KpResult::OutOfMemory, {"out of memory", "out of memory"}},
    {KpResult::False, {"false", "false"}},
    {KpResult::Interrupted, {nullptr, "operation interrupted"}},
    {KpResult::WriteFileFailed, {"failed to write file", nullptr}},
    {KpResult::ReadFileFailed, {"failed to read file", nullptr}},
    {KpResult::InvalidArgument, {"one of the arguments is invalid", "one of the arguments is invalid"}},
    {KpResult::ReportStartFailed, {nullptr, "Could not start Microsoft Word to create report document"}},
    {KpResult::ReportWriteFailed, {nullptr, "Error writing report document"}},
    {KpResult::SnapshotSaveFailed, {nullptr, "Could not save snapshot image!"}},
    {KpResult::GlInvalidEnum,
     {nullptr, "OpenGL Error GL_INVALID_ENUM - An unacceptable value is specified for an enumerated argument. The "
               "offending function is ignored, having no side effect other than to set the error flag."}},
    {KpResult::GlInvalidValue,
     {nullptr, "OpenGL Error GL_INVALID_VALUE - A numeric argument is out of range. The offending function is "
               "ignored, having no side effect other than to set the error flag."}},
    {KpResult::GlInvalidOperation,
     {nullptr, "OpenGL Error GL_INVALID_OPERATION - The specified operation is not allowed in the current state. "
               "The offending function is ignored, having no side effect other than to set the error flag."}},
    {KpResult::GlStackOverflow,
     {nullptr, "OpenGL Error GL_STACK_OVERFLOW - This function would cause a stack overflow. The offending function "
               "is ignored, having no side effect other than to set the error flag."}},
    {KpResult::GlStackUnderflow,
     {nullptr, "OpenGL Error GL_STACK_UNDERFLOW - This function would cause a stack underflow. The offending "
               "function is ignored, having no side effect other than to set the error flag."}},
    {KpResult::GlOutOfMemory,
     {nullptr, "OpenGL Error GL_OUT_OF_MEMORY - There is not enough memory left to execute the function. The state "
               "of OpenGL is undefined, except for the state of the error flags, after this error is recorded."}},
    {KpResult::SysNoEntry,
     {nullptr, "No such file or directory. The specified file or directory does not exist or cannot be found. This "
               "message can occur whenever a specified file does not exist or a component of a path does not "
               "specify an existing directory."}},
    {KpResult::SysArgumentListTooLong, {nullptr, "Argument list too long."}},
    {KpResult::SysExecFormat,
     {nullptr, "Exec format error. An attempt was made to execute a file that is not executable or that has an "
               "invalid executable-file format. "}},
    {KpResult::SysBadFile,
     {nullptr, "Bad file number. There are two possible causes: 1) The specified file descriptor is not a valid "
               "value or does not refer to an open file. 2) An attempt was made to write to a file or device opened "
               "for read-only access."}},
    {KpResult::SysNoChild, {nullptr, "No spawned processes."}},
    {KpResult::SysNoMoreProcesses,
     {nullptr, "No more processes. An attempt to create a new process failed because there are no more process "
               "slots, or there is not enough memory, or the maximum nesting level has been reached."}},
    {KpResult::SysNoMemory,
     {nullptr, "Not enough core. Not enough memory is available for the attempted operator. For example, this "
               "message can occur when insufficient memory is available to execute a child process, or when the "
               "allocation request in a _getcwd call cannot be satisfied."}},
    {KpResult::SysPermission,
     {nullptr, "Permission denied. The file's permission setting does not allow the specified access. This error "
               "signifies that an attempt was made to access a file (or, in some cases, a directory) in a way that "
               "is incompatible with the file's attributes. For example, the error can occur when an attempt is "
               "made to read from a file that is not open, to open an existing read-only file for writing, or to "
               "open a directory instead of a file. Under MS-DOS operating system versions 3.0 and later, EACCES "
               "may also indicate a locking or sharing violation. The error can also occur in an attempt to rename "
               "a file or directory or to remove an existing directory."}},
    {KpResult::SysBusy, {nullptr, "Resource busy."}},
    {KpResult::SysExists,
     {nullptr, "Files exist. An attempt has been made to create a file that already exists. For example, the "
               "_O_CREAT and _O_EXCL flags are specified in an _open call, but the named file already exists."}},
    {KpResult::SysCrossDevice,
     {nullptr, "Cross-device link. An attempt was made to move a file to a different device (using the rename "
               "function)."}},
    {KpResult::SysInvalidArgument,
     {nullptr, "Invalid argument. An invalid value was given for one of the arguments to a function. For example, "
               "the value given for the origin when positioning a file pointer (by means of a call to fseek) is "
               "before the beginning of the file."}},
    {KpResult::SysTooManyFiles,
     {nullptr, "Too many open files. No more file descriptors are available, so no more files can be opened."}},
    {KpResult::SysNoSpace,
     {nullptr, "No space left on device. No more space for writing is available on the device (for example, when "
               "the disk is full)."}},
    {KpResult::SysMathArgument, {nullptr, "Math argument."}},
    {KpResult::SysResultTooLarge,
     {nullptr, "Result too large. An argument to a math function is too large, resulting in partial or total loss "
               "of significance in the result. This error can also occur in other functions when an argument is "
               "larger than expected (for example, when the buffer argument to _getcwd is longer than expected)."}},
    {KpResult::SysDeadlock,
     {nullptr, "Resource deadlock would occur. The argument to a math function is not in the domain of the function."}},
};

}  // namespace

kplib::detail::ResultTexts kplib::detail::resultTexts(int code)
{
    for (const Row& row : rows) {
        if (row.code == code)
            return row.texts;
    }
    return {nullptr, nullptr};
}
