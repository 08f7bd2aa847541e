#include "AudioFile.h"

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstring>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <openssl/evp.h>

#include <kestaccel/BasicMath.h>
#include <kestaccel/VectorUtils.h>

namespace kestcli {

namespace ku = kestaccel::utility;

namespace {

// The one temporary file of the process, for the signal handler.
char g_temporary[4096];

void OnSignal(int sig)
{
    if (g_temporary[0] != '\0') unlink(g_temporary);
    signal(sig, SIG_DFL);
    raise(sig);
}

std::string Directory(const std::string& path)
{
    const std::size_t slash = path.find_last_of('/');
    if (slash == std::string::npos) return ".";
    if (slash == 0) return "/";
    return path.substr(0, slash);
}

// A new file in path's folder, named after it: mkstemp's mode 0600 is
// widened to what the umask allows, as for a file created directly.
int CreateTemporary(const std::string& path, std::string& temporary)
{
    const std::string dir = Directory(path);
    std::string pattern = dir + "/.kestaccel-XXXXXX";
    std::vector<char> name(pattern.begin(), pattern.end());
    name.push_back('\0');
    const int fd = mkstemp(name.data());
    if (fd < 0) throw Failure("cannot write in the folder '" + dir + "': " + std::strerror(errno));
    temporary = name.data();
    if (temporary.size() < sizeof g_temporary) std::strcpy(g_temporary, temporary.c_str());
    const mode_t mask = umask(0);
    umask(mask);
    fchmod(fd, 0666 & ~mask);
    return fd;
}

void Finalise(int fd, const std::string& temporary, const std::string& path)
{
    const bool synced = fsync(fd) == 0;
    const int syncError = errno;
    if (close(fd) != 0 || !synced) {
        throw Failure("writing '" + path + "' failed: " + std::strerror(synced ? errno : syncError));
    }
    if (rename(temporary.c_str(), path.c_str()) != 0) {
        throw Failure("cannot create '" + path + "': " + std::strerror(errno));
    }
    g_temporary[0] = '\0';
}

}  // namespace

SampleKind ParseBits(const std::string& text)
{
    if (text == "16") return SampleKind::Int16;
    if (text == "24") return SampleKind::Int24;
    if (text == "32") return SampleKind::Int32;
    if (text == "float") return SampleKind::Float;
    throw UsageError("--bits takes 16, 24, 32 or float, not '" + text + "'");
}

SampleKind KindOfFormat(int format)
{
    switch (format & SF_FORMAT_SUBMASK) {
    case SF_FORMAT_PCM_16: return SampleKind::Int16;
    case SF_FORMAT_PCM_24: return SampleKind::Int24;
    case SF_FORMAT_PCM_32: return SampleKind::Int32;
    default: return SampleKind::Float;
    }
}

int MajorFormatNamed(std::string name)
{
    const std::size_t dot = name.find_last_of("./");
    if (dot != std::string::npos) {
        if (name[dot] == '/') return 0;
        name = name.substr(dot + 1);
    }
    std::transform(name.begin(), name.end(), name.begin(), [](unsigned char c) { return char(std::tolower(c)); });
    static const struct {
        const char* name;
        int format;
    } table[] = {{"wav", SF_FORMAT_WAV},   {"flac", SF_FORMAT_FLAC}, {"aiff", SF_FORMAT_AIFF}, {"aif", SF_FORMAT_AIFF},
                 {"au", SF_FORMAT_AU},     {"caf", SF_FORMAT_CAF},   {"w64", SF_FORMAT_W64},   {"rf64", SF_FORMAT_RF64}};
    for (const auto& e : table) {
        if (name == e.name) return e.format;
    }
    return 0;
}

InputFile::InputFile(const std::string& path_) : path(path_)
{
    // open() first, for the system's own reason when the file cannot be read.
    const int fd = open(path.c_str(), O_RDONLY);
    if (fd < 0) throw Failure("cannot open '" + path + "': " + std::strerror(errno));
    struct stat st;
    if (fstat(fd, &st) == 0 && S_ISDIR(st.st_mode)) {
        close(fd);
        throw Failure("cannot read '" + path + "': it is a folder");
    }
    file = sf_open_fd(fd, SFM_READ, &info, SF_TRUE);
    if (file == nullptr) {
        throw Failure("'" + path + "' is not an audio file that libsndfile can read (" + sf_strerror(nullptr) + ")");
    }
    if (info.channels <= 0 || info.samplerate <= 0) {
        sf_close(file);
        throw Failure("'" + path + "' declares no channels or no sample rate");
    }
    const SampleKind kind = KindOfFormat(info.format);
    integer = kind != SampleKind::Float;
}

InputFile::~InputFile() { sf_close(file); }

std::size_t InputFile::Read(float* interleaved, std::size_t frames)
{
    sf_count_t got;
    if (integer) {
        // libsndfile left-justifies integer samples in 32 bits.
        ints.resize(frames * info.channels);
        got = sf_readf_int(file, ints.data(), sf_count_t(frames));
        if (got > 0) ku::Convert(unsigned(got * info.channels), ints.data(), interleaved, 31);
    } else {
        got = sf_readf_float(file, interleaved, sf_count_t(frames));
    }
    if (got < 0 || (got == 0 && sf_error(file) != SF_ERR_NO_ERROR)) {
        throw Failure("reading '" + path + "' failed: " + sf_strerror(file));
    }
    return std::size_t(got);
}

void CheckDistinct(const std::string& input, const std::string& output)
{
    struct stat a, b;
    if (stat(input.c_str(), &a) == 0 && stat(output.c_str(), &b) == 0 && a.st_dev == b.st_dev &&
        a.st_ino == b.st_ino) {
        throw UsageError("the output '" + output + "' is the input file");
    }
}

OutputFile::OutputFile(const std::string& path_, int majorFormat, SampleKind kind_, int rate, int channels_)
    : path(path_), kind(kind_), channels(channels_)
{
    SF_INFO info{};
    info.samplerate = rate;
    info.channels = channels;
    const int sub = kind == SampleKind::Int16   ? SF_FORMAT_PCM_16
                    : kind == SampleKind::Int24 ? SF_FORMAT_PCM_24
                    : kind == SampleKind::Int32 ? SF_FORMAT_PCM_32
                                                : SF_FORMAT_FLOAT;
    info.format = majorFormat | sub;
    if (!sf_format_check(&info)) {
        SF_FORMAT_INFO named{};
        named.format = majorFormat;
        sf_command(nullptr, SFC_GET_FORMAT_INFO, &named, sizeof named);
        throw UsageError(std::string(named.name ? named.name : "this format") + " cannot hold " +
                         (kind == SampleKind::Float ? "float" : std::to_string(kind == SampleKind::Int16 ? 16 : kind == SampleKind::Int24 ? 24 : 32) + "-bit") +
                         " samples at " + std::to_string(rate) + " Hz with " + std::to_string(channels) + " channels");
    }
    fd = CreateTemporary(path, temporary);
    file = sf_open_fd(fd, SFM_WRITE, &info, SF_FALSE);
    if (file == nullptr) {
        const std::string why = sf_strerror(nullptr);
        Discard();
        throw Failure("cannot write '" + path + "': " + why);
    }
    EVP_MD_CTX* ctx = EVP_MD_CTX_new();
    EVP_DigestInit_ex(ctx, EVP_sha256(), nullptr);
    hash = ctx;
}

OutputFile::~OutputFile()
{
    Discard();
    EVP_MD_CTX_free(static_cast<EVP_MD_CTX*>(hash));
}

void OutputFile::Discard()
{
    if (file != nullptr) sf_close(file);
    file = nullptr;
    if (fd >= 0) close(fd);
    fd = -1;
    if (!temporary.empty()) unlink(temporary.c_str());
    temporary.clear();
    g_temporary[0] = '\0';
}

void OutputFile::Write(const float* interleaved, std::size_t frames)
{
    const std::size_t n = frames * channels;
    if (n == 0) return;
    // The hash covers the samples as stored, little-endian: 2, 3 or 4 bytes
    // of each integer, the 4 bytes of each float.
    bytes.clear();
    auto put = [&](std::uint32_t v, int width) {
        for (int b = 0; b < width; ++b) bytes.push_back((unsigned char)(v >> (8 * b)));
    };
    sf_count_t written;
    errno = 0;
    if (kind == SampleKind::Float) {
        for (std::size_t i = 0; i < n; ++i) {
            std::uint32_t v;
            std::memcpy(&v, &interleaved[i], 4);
            put(v, 4);
        }
        written = sf_writef_float(file, interleaved, sf_count_t(frames));
    } else {
        // Convert limits its source to +-1, and +1 would wrap to the most
        // negative integer: the top is limited to the largest code first.
        limited.assign(interleaved, interleaved + n);
        const int bits = kind == SampleKind::Int16 ? 16 : kind == SampleKind::Int24 ? 24 : 32;
        const float top = bits == 32 ? 1.0f - 0x1p-24f : 1.0f - std::ldexp(1.0f, 1 - bits);
        ku::Trim(unsigned(n), limited.data(), -1.0f, top);
        if (kind == SampleKind::Int16) {
            shorts.resize(n);
            ku::Convert(unsigned(n), limited.data(), shorts.data(), -15, true);
            for (short s : shorts) put(std::uint16_t(s), 2);
            written = sf_writef_short(file, shorts.data(), sf_count_t(frames));
        } else {
            ints.resize(n);
            ku::Convert(unsigned(n), limited.data(), ints.data(), 1 - bits, true);
            for (int& v : ints) {
                put(std::uint32_t(v), bits / 8);
                if (bits == 24) v = int(std::uint32_t(v) << 8);  // libsndfile takes 24 bits left-justified
            }
            written = sf_writef_int(file, ints.data(), sf_count_t(frames));
        }
    }
    EVP_DigestUpdate(static_cast<EVP_MD_CTX*>(hash), bytes.data(), bytes.size());
    if (written != sf_count_t(frames)) {
        const std::string why = errno != 0 ? std::strerror(errno) : sf_strerror(file);
        throw Failure("writing '" + path + "' failed: " + why);
    }
}

std::string OutputFile::Commit()
{
    errno = 0;
    sf_write_sync(file);
    const int status = sf_close(file);
    file = nullptr;
    if (status != 0) throw Failure("writing '" + path + "' failed: " + sf_error_number(status));
    const int descriptor = fd;
    fd = -1;
    try {
        Finalise(descriptor, temporary, path);
    } catch (...) {
        unlink(temporary.c_str());
        temporary.clear();
        throw;
    }
    temporary.clear();
    unsigned char digest[EVP_MAX_MD_SIZE];
    unsigned int length = 0;
    EVP_DigestFinal_ex(static_cast<EVP_MD_CTX*>(hash), digest, &length);
    static const char hex[] = "0123456789abcdef";
    std::string text;
    for (unsigned int i = 0; i < length; ++i) {
        text += hex[digest[i] >> 4];
        text += hex[digest[i] & 15];
    }
    return text;
}

void WriteTextFile(const std::string& path, const std::string& text)
{
    std::string temporary;
    const int fd = CreateTemporary(path, temporary);
    std::size_t done = 0;
    while (done < text.size()) {
        const ssize_t n = write(fd, text.data() + done, text.size() - done);
        if (n <= 0) {
            const std::string why = std::strerror(errno);
            close(fd);
            unlink(temporary.c_str());
            g_temporary[0] = '\0';
            throw Failure("writing '" + path + "' failed: " + why);
        }
        done += std::size_t(n);
    }
    try {
        Finalise(fd, temporary, path);
    } catch (...) {
        unlink(temporary.c_str());
        g_temporary[0] = '\0';
        throw;
    }
}

void InstallSignalHandlers()
{
    signal(SIGINT, OnSignal);
    signal(SIGTERM, OnSignal);
    signal(SIGHUP, OnSignal);
    // A file-size limit then fails the write (EFBIG) as a full disk does,
    // instead of killing the process with the file half-written.
    signal(SIGXFSZ, SIG_IGN);
}

}  // namespace kestcli
