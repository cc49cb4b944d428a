#pragma once

#include "../dicom/Series.h"

#include <string>

/// Reads an exported volume from an HTTP server, slice by slice by ranges, on a thread of its own. Of the planes of the
/// series only the number and the frame of reference are known. Cancelling ends a read that waits. If the server is
/// silent for `timeout` seconds, the program ends (see Silence); 0 waits for ever.
KpResult readRemote(const std::string& url, int timeout, KpProgressInterface& progress, Series& series, Volume& volume,
                    HxParamBundle& root);
