#pragma once

#include "RunRoad.h"

/// Reads the series of the job, reduces and segments it, and sends it to a peer as one message; waits until the peer
/// has confirmed the content hash. Writes its pictures into `target`, unless that is empty.
KpResult sendRoad(const Job& job, const std::string& host, int port, const std::string& target,
                  KpProgressInterface& progress);

/// Waits for one peer at `port` of this machine (0: any free one, which is told on standard output), receives what it
/// sends, checks it against its content hash, and writes its pictures into `target`.
KpResult serveRoad(int port, const std::string& target);
