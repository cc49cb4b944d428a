#pragma once

#include <string>

// Ways out of the program that do not wait for the work under way.

/// What is to be removed if the program ends early: a folder or file that is not finished. One object a path.
class Unfinished {
public:
    Unfinished() = default;
    Unfinished(const Unfinished&) = delete;
    Unfinished& operator=(const Unfinished&) = delete;
    ~Unfinished() { forget(); }

    void remember(const std::string& path);
    /// The path is finished, or its owner removes it.
    void forget();

private:
    std::string path_;
};

/// While one exists, SIGINT and SIGTERM wait: what is being published is published as a whole. Later ones are ignored:
/// the program is about to end.
class Publishing {
public:
    Publishing();
    Publishing(const Publishing&) = delete;
    Publishing& operator=(const Publishing&) = delete;
    ~Publishing();
};

/// Starts the thread that waits for SIGINT and SIGTERM; called before any other thread is started. On a signal the work
/// is asked to stop at its next step. If the program is still running a moment later, everything unfinished is removed
/// and the program ends with 128 + the number of the signal.
void watchSignals();
/// The signal that has asked the program to stop; 0 if none has.
int signalReceived();
/// Exit code of a program that stops for a signal.
int exitCodeOfSignal();

/// Ends the program if nothing is heard of a peer: removes everything unfinished, prints `message` and exits with 2.
///
///     Silence silence(30, "the server was silent for 30 s");
///     while (receivePiece()) silence.heard();
class Silence {
public:
    /// Never ends the program if `seconds` is 0.
    Silence(int seconds, const std::string& message);
    Silence(const Silence&) = delete;
    Silence& operator=(const Silence&) = delete;
    ~Silence();
    void heard();

private:
    struct Watch;
    Watch* watch_;
};
