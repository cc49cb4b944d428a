#include "Chunks.h"

#include "Entry.h"

#include <support/Program.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <system_error>

namespace fs = std::filesystem;

namespace {

struct Chunk {
    std::string file;
    std::string before;  // the file that it continues, empty for none
};

// Files may have been moved since they were written, so only their names are compared.
bool isSame(const std::string& a, const std::string& b)
{
    return fs::path(a).filename() == fs::path(b).filename();
}

// The file that this one continues; empty if there is none, or this one cannot be read.
std::string fileBefore(const std::string& file)
{
    std::ifstream in(file);
    std::string line;
    std::getline(in, line);
    const std::string before = continuedFile(line);
    return isSame(before, file) ? "" : before;
}

Chunk chunkOf(const std::string& file)
{
    if (file == "-")
        return {file, ""};
    const bool isFolder = fs::is_directory(file);
    if (isFolder || !std::ifstream(file))
        throw Failure("can't read '" + file + "': " + std::strerror(isFolder ? EISDIR : errno));
    return {file, fileBefore(file)};
}

bool contains(const std::vector<Chunk>& chunks, const std::string& file)
{
    return std::any_of(chunks.begin(), chunks.end(), [&](const Chunk& chunk) { return isSame(chunk.file, file); });
}

// Puts the files that the chunks continue before them.
void addEarlier(std::vector<Chunk>& chunks)
{
    for (std::size_t i = 0; i < chunks.size(); ++i) {
        const Chunk chunk = chunks[i];
        const fs::path beside = fs::path(chunk.file).parent_path() / fs::path(chunk.before).filename();
        if (!chunk.before.empty() && !contains(chunks, chunk.before) && fs::exists(beside))
            chunks.push_back(chunkOf(beside));
    }
}

// Moves the chunk after the one that it continues, together with its continuations.
void appendWithLater(const std::vector<Chunk>& chunks, const Chunk& first, std::vector<std::string>& files)
{
    if (std::find(files.begin(), files.end(), first.file) != files.end())
        return;
    files.push_back(first.file);
    for (const Chunk& chunk : chunks) {
        if (!chunk.before.empty() && isSame(chunk.before, first.file))
            appendWithLater(chunks, chunk, files);
    }
}

}  // namespace

std::vector<std::string> orderedChunks(const std::vector<std::string>& files, bool withEarlier)
{
    std::vector<Chunk> chunks;
    chunks.reserve(files.size());
    for (const std::string& file : files)
        chunks.push_back(chunkOf(file));
    if (withEarlier)
        addEarlier(chunks);
    std::vector<std::string> ordered;
    for (const Chunk& chunk : chunks) {
        if (chunk.before.empty() || !contains(chunks, chunk.before))
            appendWithLater(chunks, chunk, ordered);
    }
    for (const Chunk& chunk : chunks)  // of a circle, which only copied files can form
        appendWithLater(chunks, chunk, ordered);
    return ordered;
}

std::string nextChunk(const std::string& file)
{
    const fs::path folder = fs::path(file).parent_path();
    std::error_code ignored;
    for (const auto& entry : fs::directory_iterator(folder.empty() ? "." : folder, ignored)) {
        const fs::path path = folder / entry.path().filename();
        if (path.extension() != ".log" || isSame(path, file) || !entry.is_regular_file(ignored))
            continue;
        if (isSame(fileBefore(path), file))
            return path;
    }
    return "";
}
