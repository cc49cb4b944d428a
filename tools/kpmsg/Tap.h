#pragma once

#include <string>

struct TapJob {
    std::string listen;   ///< [ADDRESS:]PORT
    std::string peer;     ///< HOST:PORT
    std::string folder;   ///< for the files
    int connections = 0;  ///< after how many to end; 0 for none
    bool isJson = false;
};

/// Stands between two peers: passes on what they send and writes it to files, one a direction and connection; existing
/// files stay. Returns after the last connection, or on SIGINT or SIGTERM with the files of open connections complete.
/// False if a connection to the peer failed. Throws Failure.
bool tap(const TapJob& job);
