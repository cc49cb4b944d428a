#pragma once

#include "../dicom/Series.h"

#include <optional>
#include <string>

/// What a command is asked to do. Each command uses some of it.
struct Job {
    Choice choice;                    ///< a series in DICOM files, or else
    std::string url;                  ///< of a volume that was exported, on an HTTP server
    std::optional<double> threshold;  ///< displayed value from which on voxels belong to the object
    std::string derived;              ///< folder for the reduced volume as a DICOM series; none if empty
    std::string target;               ///< folder or file to write
    std::string describe;             ///< file for a description of an exported volume; none if empty
    std::string source;               ///< a file to read
    std::string other;                ///< a file to compare the source with
    bool isDiff = false;              ///< whether it is compared
    int sourceVolume = 1;             ///< of a source with several volumes
    std::string address;              ///< of the peer, or to listen at
    int port = 0;
    int timeout = 0;  ///< s that a peer may be silent; 0 for ever
    bool isJson = false;
};
