#include "Program.h"

#include <kplib/log/KpLogFile.h>

#include <CLI/CLI.hpp>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <exception>

namespace {

int failed(const CLI::App& app, const std::string& what)
{
    std::fprintf(stderr, "%s: %s\n", app.get_name().c_str(), what.c_str());
    return ExitError;
}

}  // namespace

int runTool(CLI::App& app, int argc, char** argv, const std::function<Exit()>& work)
{
    getTheLogInstance().setLogLevel(KpLogOff);  // all messages for the user are the tool's own
    app.set_version_flag("--version", app.get_name() + " (kplib) " KPLIB_VERSION, "Print the version and exit");
    app.set_help_all_flag("--help-all", "Print the help of all commands and exit");
    try {
        app.parse(argc, argv);
        return work();
    } catch (const CLI::ParseError& e) {
        return e.get_exit_code() == 0 ? app.exit(e)
                                      : failed(app, std::string(e.what()) + "; see " + app.get_name() + " --help");
    } catch (const std::exception& e) {
        return failed(app, e.what());
    }
}

std::string readBytes(const std::string& path)
{
    std::FILE* const file = path == "-" ? stdin : std::fopen(path.c_str(), "rb");
    std::string bytes;
    char piece[65536];
    std::size_t n = 0;
    errno = 0;
    while (file && (n = std::fread(piece, 1, sizeof piece, file)) > 0)
        bytes.append(piece, n);
    const bool isRead = file && !std::ferror(file);
    const int cause = errno;
    if (file && file != stdin)
        std::fclose(file);
    if (!isRead)
        throw Failure("can't read '" + path + "': " + std::strerror(cause));
    return bytes;
}

void print(const std::string& text)
{
    const bool isWritten = std::fwrite(text.data(), 1, text.size(), stdout) == text.size();
    if (!isWritten || std::fflush(stdout) != 0)
        throw Failure(std::string("can't write to standard output: ") + std::strerror(errno));
}
