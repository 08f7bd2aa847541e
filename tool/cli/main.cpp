// kestaccel: resampling, filtering, format conversion and spectra of audio
// files, on the kestaccel library.

#include <cstdio>
#include <cstring>
#include <exception>
#include <new>
#include <string>
#include <vector>

#include "AudioFile.h"
#include "Commands.h"

namespace {

const char* const kUsage =
    "usage: kestaccel COMMAND [ARGS] [--help]\n"
    "  resample IN OUT --rate R [--quality fast|default|best]   change the sample rate\n"
    "  filter IN OUT --lowpass F | --highpass F | --bandpass F1 F2 [--fir N | --biquads K]\n"
    "  convert IN OUT [--format wav|flac|aiff|...] [--bits 16|24|32|float]\n"
    "  spectrum IN OUT.svg                                         draw the spectrum\n"
    "  generate OUT                                                write the test signal\n"
    "  tone IN --frequency F                                       measure a sine's level and SNR\n"
    "Audio is read and written with libsndfile. Commands that write audio print the SHA-256\n"
    "of the output samples. Exit status: 0 success, 2 bad usage, 1 failure while working.\n";

}  // namespace

int main(int argc, char** argv)
{
    if (argc < 2) {
        std::fputs(kUsage, stderr);
        return 2;
    }
    const std::string command = argv[1];
    if (command == "--help" || command == "-h" || command == "help") {
        std::fputs(kUsage, stdout);
        return 0;
    }
    const std::vector<std::string> args(argv + 2, argv + argc);
    kestcli::InstallSignalHandlers();
    try {
        if (command == "resample") return kestcli::Resample(args);
        if (command == "filter") return kestcli::Filter(args);
        if (command == "convert") return kestcli::Convert(args);
        if (command == "spectrum") return kestcli::Spectrum(args);
        if (command == "generate") return kestcli::Generate(args);
        if (command == "tone") return kestcli::Tone(args);
        std::fprintf(stderr, "kestaccel: unknown command '%s'\n%s", command.c_str(), kUsage);
        return 2;
    } catch (const kestcli::UsageError& e) {
        std::fprintf(stderr, "kestaccel %s: %s\n", command.c_str(), e.what());
        return 2;
    } catch (const kestcli::Failure& e) {
        std::fprintf(stderr, "kestaccel %s: %s\n", command.c_str(), e.what());
        return 1;
    } catch (const std::bad_alloc&) {
        std::fprintf(stderr, "kestaccel %s: out of memory\n", command.c_str());
        return 1;
    } catch (const std::exception& e) {
        std::fprintf(stderr, "kestaccel %s: %s\n", command.c_str(), e.what());
        return 1;
    }
}
