#pragma once

#include <net/Servers.h>
#include <support/TempFolder.h>

#include <kplib/net/KpSocket.h>

#include <csignal>
#include <filesystem>
#include <fstream>
#include <string>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

namespace kplib::test {

/// nginx on a free port, with a sparse file "volume" of 256 MiB that holds its own offset at each spot.
class Nginx {
public:
    Nginx()
    {
        const std::string volume = folder_.file("volume", "");
        std::filesystem::resize_file(volume, size);
        std::fstream file(volume, std::ios::in | std::ios::out | std::ios::binary);
        for (const long spot : spots)
            file.seekp(spot).write(reinterpret_cast<const char*>(&spot), sizeof spot);
        file.close();
        std::string conf = geteuid() == 0 ? "user root;" : "";  // the folder is this user's alone
        conf += "daemon off; worker_processes 1; pid pid; events {} http { access_log off; sendfile on; "
                "keepalive_requests 100000000; server { root .; listen 127.0.0.1:" +
                std::to_string(port) + "; }";
        for (const char* kind : {"client_body", "proxy", "fastcgi", "uwsgi", "scgi"})
            conf += std::string(kind) + "_temp_path temporary;";
        conf = folder_.file("conf", conf + "}");
        process_ = fork();
        if (process_ == 0) {
            prctl(PR_SET_PDEATHSIG, SIGTERM);
            execl(program, "nginx", "-p", folder_.path.c_str(), "-c", conf.c_str(), "-e", "log", nullptr);
            _exit(1);
        }
        for (int attempt = 0; attempt < 1000 && !isRunning && waitpid(process_, nullptr, WNOHANG) == 0; ++attempt) {
            usleep(10000);
            isRunning = KpSocket::close(KpSocket::connect("127.0.0.1", port, 0, 0, 0)) == 0;
        }
    }
    ~Nginx()
    {
        if (isRunning && kill(process_, SIGTERM) == 0)
            waitpid(process_, nullptr, 0);
    }
    static bool isInstalled() { return access(program, X_OK) == 0; }
    std::string url(const char* name = "volume") const
    {
        return "http://127.0.0.1:" + std::to_string(port) + '/' + name;
    }

    static constexpr long size = 256L << 20;
    static constexpr long spots[] = {0, 4097, (200L << 20) + 3, size - 100};
    const int port = Listener().port;
    bool isRunning = false;

private:
    static constexpr const char* program = "/usr/sbin/nginx";

    TempFolder folder_;
    pid_t process_ = -1;
};

}  // namespace kplib::test
