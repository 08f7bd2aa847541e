#pragma once

// Audio files through libsndfile, as the commands meet them: an input read
// as float frames, and an output written to a temporary file in its target
// folder, converted by the library, hashed, and renamed into place only once
// everything has been written.

#include <cstdint>
#include <stdexcept>
#include <string>
#include <vector>

#include <sndfile.h>

namespace kestcli {

// Bad usage: exit status 2.
struct UsageError : std::runtime_error {
    using std::runtime_error::runtime_error;
};
// A failure while working: exit status 1.
struct Failure : std::runtime_error {
    using std::runtime_error::runtime_error;
};

enum class SampleKind { Int16, Int24, Int32, Float };

// "16", "24", "32", "float"; throws UsageError otherwise.
SampleKind ParseBits(const std::string& text);
// The kind of a libsndfile subformat; Float for everything not an integer of 16, 24 or 32 bits.
SampleKind KindOfFormat(int format);
// A major format from a name or a file extension ("wav", "flac", "aiff", ...), 0 if unknown.
int MajorFormatNamed(std::string name);

class InputFile {
public:
    explicit InputFile(const std::string& path);
    ~InputFile();
    InputFile(const InputFile&) = delete;
    InputFile& operator=(const InputFile&) = delete;

    // Reads up to `frames` frames as float, +-1 at full scale; returns the count.
    std::size_t Read(float* interleaved, std::size_t frames);

    const SF_INFO& Info() const { return info; }
    const std::string& Path() const { return path; }

private:
    std::string path;
    SF_INFO info{};
    SNDFILE* file = nullptr;
    bool integer = false;
    std::vector<int> ints;
};

// Refuses an output that is the input (UsageError), whichever path names it.
void CheckDistinct(const std::string& input, const std::string& output);

class OutputFile {
public:
    // format: a libsndfile major format; kind: the samples stored.
    OutputFile(const std::string& path, int majorFormat, SampleKind kind, int rate, int channels);
    ~OutputFile();  // removes the temporary file unless Commit succeeded
    OutputFile(const OutputFile&) = delete;
    OutputFile& operator=(const OutputFile&) = delete;

    // Converts float frames (+-1 full scale, limited for integer kinds) and writes them.
    void Write(const float* interleaved, std::size_t frames);
    // Closes, syncs and renames into place; returns the SHA-256 of the samples in hex.
    std::string Commit();

private:
    void Discard();

    std::string path, temporary;
    SampleKind kind;
    int channels;
    int fd = -1;
    SNDFILE* file = nullptr;
    void* hash = nullptr;
    std::vector<float> limited;
    std::vector<short> shorts;
    std::vector<int> ints;
    std::vector<unsigned char> bytes;
};

// Writes text to path through a temporary file in the same folder.
void WriteTextFile(const std::string& path, const std::string& text);

// The temporary file being written, removed on SIGINT and SIGTERM.
void InstallSignalHandlers();

}  // namespace kestcli
