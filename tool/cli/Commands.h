#pragma once

#include <string>
#include <vector>

namespace kestcli {

// Each takes the arguments after the subcommand's name and returns the exit
// status; usage errors and failures are thrown (AudioFile.h).
int Resample(const std::vector<std::string>& args);
int Filter(const std::vector<std::string>& args);
int Convert(const std::vector<std::string>& args);
int Spectrum(const std::vector<std::string>& args);
int Generate(const std::vector<std::string>& args);
int Tone(const std::vector<std::string>& args);

}  // namespace kestcli
