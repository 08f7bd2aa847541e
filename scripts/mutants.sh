#!/usr/bin/env bash
# Mutation check of the test suite: plants one fault at a time in the
# library's sources, rebuilds incrementally, runs the GoogleTest suite
# (ctest -L bitexact) and records whether any test failed. Every fault is a
# literal edit that must match exactly once; an edit that no longer matches
# is reported as stale instead of being run. The edited file is restored
# with git after each mutant, also on failure or interrupt.
#
#   scripts/mutants.sh                 every mutant
#   scripts/mutants.sh fir- fft-       the mutants whose names contain a word
#   scripts/mutants.sh --check         only check that every edit applies
#   scripts/mutants.sh --list          the table
#
# KESTACCEL_MUTANT_BUILD names the build folder (default build-mutants); the
# summary is also written to <build>/mutants-summary.txt.
set -uo pipefail
cd "$(dirname "$0")/.."

build=${KESTACCEL_MUTANT_BUILD:-build-mutants}
jobs=2

names=() descriptions=() files=() froms=() tos=()
# m NAME DESCRIPTION FILE FROM TO: replace the one occurrence of FROM by TO.
m() { names+=("$1"); descriptions+=("$2"); files+=("$3"); froms+=("$4"); tos+=("$5"); }

real=src/utility/BasicMath/RealArithmeticKernels.h
m real-sub-operands "Sub gives a - b" $real 'dst[i] = b[i] - a[i]' 'dst[i] = a[i] - b[i]'
m real-div-operands "Div gives a / b" $real 'dst[i] = b[i] / a[i]' 'dst[i] = a[i] / b[i]'
m real-subrev-operands "SubConstantRev gives src - c" $real 'dst[i] = constant - src[i]' 'dst[i] = src[i] - constant'
m real-addproduct-fma "AddProduct fused" $real \
  'srcDst[i] = (a[i] * b[i]) + srcDst[i]' 'srcDst[i] = std::fma(a[i], b[i], srcDst[i])'
m real-divconst-reciprocal "DivConstant multiplies by 1/c" $real \
  'dst[i] = src[i] / constant' 'dst[i] = src[i] * (T(1) / constant)'
m real-divconst-zero "DivConstant_InPlace divides by a zero constant" $real \
  $'if (constant == T(0)) return;\n    for (std::size_t i = 0; i < count; ++i) srcDst[i] = srcDst[i] / constant;' \
  'for (std::size_t i = 0; i < count; ++i) srcDst[i] = srcDst[i] / constant;'
m real-short-tie "short MulConstant rounds ties up" $real \
  'frac > 0.5f || (frac == 0.5f && (t & 1) != 0)' 'frac >= 0.5f'

complex=src/utility/BasicMath/ComplexArithmeticKernels.h
m complex-product-fma "complex product fused" $complex 're = xr * yr - xi * yi;' 're = std::fma(xr, yr, -(xi * yi));'
m complex-sub-operands "complex Sub gives a - b" $complex 'out[i] = y[i] - x[i]' 'out[i] = x[i] - y[i]'
m complex-divconst-zero "complex DivConstant skips a constant with one zero part" $complex \
  'constant.real() == T(0) && constant.imag() == T(0)' 'constant.real() == T(0) || constant.imag() == T(0)'
m complex-smith-tie "Smith's first form on equal sizes" src/utility/BasicMath/ComplexQuotient.h \
  'std::fabs(vr) > std::fabs(vi)' 'std::fabs(vr) >= std::fabs(vi)'

elementwise=src/utility/BasicMath/ElementwiseKernels.h
runtime=src/utility/BasicMath/RuntimeMath.h
m abs-fabs "Abs clears the sign of -0 and NaN" $elementwise 'dst[i] = T(0) > x ? -x : x;' 'dst[i] = std::fabs(x);'
m exp-widened "float Exp through double exp" $runtime \
  'inline float Exp(float x) { return ::expf(x); }' \
  'inline float Exp(float x) { return static_cast<float>(::exp(static_cast<double>(x))); }'
m round-to-even "Round ties to even" $runtime \
  'inline float Round(float x) { return ::roundf(x); }' 'inline float Round(float x) { return ::nearbyintf(x); }'
m pow-operands "Pow takes b as the base" $elementwise 'runtime::Pow(a[i], b[i])' 'runtime::Pow(b[i], a[i])'
m powerspectr-fma "PowerSpectr fused" src/utility/BasicMath/PolarKernels.h \
  'dst[i] = re * re + im * im;' 'dst[i] = std::fma(re, re, im * im);'

reductions=src/utility/BasicMath/ReductionKernels.h
m sum-reversed "Sum from the last element" $reductions \
  'for (std::size_t i = 0; i < count; ++i) acc += src[i];' 'for (std::size_t i = count; i-- > 0;) acc += src[i];'
m norml2-square-double "float NormL2 squares in double" $reductions \
  'const float square = src[i] * src[i];' 'const double square = double(src[i]) * src[i];'
m stddev-population "StandardDeviation divides by n" $reductions \
  'acc / static_cast<T>(count - 1)' 'acc / static_cast<T>(count)'
m dot-fma "DotProduct fused" src/utility/DSP/DotProductKernels.h 'acc += product;' 'acc = std::fma(a[i], b[i], acc);'

extrema=src/utility/BasicMath/ExtremaKernels.h
m max-last-of-equals "Max/MaxIndex keep the last of equals" $extrema \
  'if (src[i] > src[best]) best = i;' 'if (src[i] >= src[best]) best = i;'
m minmax-first-max "MinMaxIndex keeps the first largest" $extrema \
  'if (!(hiValue > src[larger])) {' 'if (src[larger] > hiValue) {'
m minmax-last-min "MinMaxIndex keeps the last smallest" $extrema \
  'if (loValue > src[smaller]) {' 'if (loValue >= src[smaller]) {'
m maxevery-tie "MaxEvery takes the second on ties and NaN" $extrema \
  'dst[i] = b[i] > a[i] ? b[i] : a[i];' 'dst[i] = a[i] > b[i] ? a[i] : b[i];'

thresholds=src/utility/BasicMath/ThresholdKernels.h
m threshold-lt-inclusive "Threshold_LT replaces equal elements (-0 by +0)" $thresholds \
  'srcDst[i] = level > srcDst[i] ? level : srcDst[i];' 'srcDst[i] = level >= srcDst[i] ? level : srcDst[i];'
m threshold-gtval-nan "Threshold_GTVal replaces NaN" $thresholds \
  'dst[i] = src[i] > level ? value : src[i];' 'dst[i] = !(src[i] <= level) ? value : src[i];'
m trim-high-first "Trim tests the high side first" $thresholds \
  'srcDst[i] = low > x ? low : (high < x ? high : x);' 'srcDst[i] = high < x ? high : (low > x ? low : x);'
m slope-running-sum "VectorSlope by a running sum" $thresholds \
  'for (unsigned int i = 0; i < count; ++i) dst[i] = static_cast<T>(i) * slope + offset;' \
  'T v = offset; for (unsigned int i = 0; i < count; ++i, v += slope) dst[i] = v;'
m slope-fma "VectorSlope fused" $thresholds \
  'dst[i] = static_cast<T>(i) * slope + offset;' 'dst[i] = std::fma(static_cast<T>(i), slope, offset);'

layout=src/utility/BasicMath/LayoutKernels.h
m interleave-swapped "two-channel Interleave swaps the channels" $layout \
  $'dst[2 * i] = a[i];\n        dst[2 * i + 1] = b[i];' $'dst[2 * i] = b[i];\n        dst[2 * i + 1] = a[i];'
m interleave-channel-outer "Interleave walks channels outer" $layout \
  $'for (std::size_t f = 0; f < frames; ++f) {\n        for (std::size_t c = 0; c < channels; ++c) dst[next++] = sources[c][f];' \
  $'for (std::size_t c = 0; c < channels; ++c) {\n        for (std::size_t f = 0; f < frames; ++f) dst[f * channels + c] = sources[c][f];'

half=src/utility/BasicMath/HalfPrecisionKernels.h
m half-rounds "float to half rounds the fraction" $half \
  'const std::uint32_t fraction = (u >> 13) & 0x3FFu;' 'const std::uint32_t fraction = ((u + 0x1000u) >> 13) & 0x3FFu;'
m half-negative-zero "half 8000 gives -0" $half 'return word == 0 ? 0u : bits;' \
  'return (word & 0x7FFFu) == 0 ? std::uint32_t(word) << 16 : bits;'

buffers=src/utility/VectorUtils/BufferKernels.h
m copy-bytes-64 "Copy forms its byte count in 64 bits" $buffers \
  $'const unsigned int bytes = ByteCount32<T>(count);\n    if (bytes != 0) {\n        std::memcpy' \
  $'const std::size_t bytes = std::size_t(count) * sizeof(T);\n    if (bytes != 0) {\n        std::memcpy'
m set-keeps-negative-zero "Set stores -0 as it is" $buffers \
  'if (value == T(0)) {' 'if (value == T(0) && !std::signbit(value)) {'
m modes-stored "the denormal switches are stored" src/utility/FloatingPointModes.cpp \
  $'inline bool GetDenormalMode() { return false; }\ninline void SetDenormalMode(bool /*enable*/) {}' \
  $'inline bool& DenormalMode() { static bool mode = false; return mode; }\ninline bool GetDenormalMode() { return DenormalMode(); }\ninline void SetDenormalMode(bool enable) { DenormalMode() = enable; }'
m swap64-halves "64-bit SwapBytes keeps the halves in place" src/utility/VectorUtils/ByteOrderKernels.h \
  'return (low << 32) | high;' 'return (high << 32) | low;'

conversion=src/utility/VectorUtils/ConversionKernels.h
m convert-nearbyint "float to int rounds ties to even" $conversion \
  'const int rounded = whole + (fraction >= 0.5f ? 1 : 0) - (fraction <= -0.5f ? 1 : 0);' \
  'const int rounded = static_cast<int>(std::nearbyint(x));'
m convert-scaled-tie "scaled rounding takes negative halves up" $conversion \
  'const int value = kRound ? (t + (t > 0 ? 1 : 0)) >> 1 : t;' 'const int value = kRound ? (t + 1) >> 1 : t;'
m convert-limit-sign "the limit's sign dropped one scale early" $conversion \
  'm >= static_cast<float>(1u << (8 * sizeof(Dst) - 1))' 'm >= static_cast<float>(1u << (8 * sizeof(Dst) - 2))'
m convert-int-multiplier-float "integer to real multiplier from powf" $conversion \
  'return std::pow(2.0, static_cast<double>(negated));' \
  'return static_cast<double>(std::pow(2.0f, static_cast<float>(negated)));'
m convert-double-product-float "double to int scales in float" $conversion \
  'const int inside = ToInt32<kRound>(scale * x);' \
  'const int inside = ToInt32<kRound>(static_cast<double>(static_cast<float>(x) * m));'
m pack-wraps "24-bit store wraps instead of saturating" src/utility/VectorUtils/PackedBlocks.h \
  'for (std::size_t i = 0; i < n; ++i) dst[start + i] = int24_t(block[i]);' \
  'for (std::size_t i = 0; i < n; ++i) dst[start + i] = int24_t(((block[i] + 8388608) & 0xFFFFFF) - 8388608);'
m pack-overlap "24-bit packing in blocks over overlapping buffers" src/utility/VectorUtils/PackedBlocks.h \
  'if (!Disjoint(src, sizeof(Src) * count, dst, sizeof(int24_t) * count)) {' 'if (false) {'
m truncate-saturates "out-of-range float truncation saturates" src/common/FloatToInt.h \
  $'static_cast<int>(inRange ? value : 0.0f);\n    return inRange ? truncated : INT_MIN;' \
  $'static_cast<int>(inRange ? value : 0.0f);\n    return inRange ? truncated : (value > 0.0f ? INT_MAX : INT_MIN);'

dsp=src/utility/DSP/ConvolutionKernels.h
m convolve-reordered "Convolve adds two terms out of order" $dsp \
  $'acc = acc + b[t] * a0;\n                acc = acc + b[t - 1] * a1;' \
  $'acc = acc + b[t - 1] * a1;\n                acc = acc + b[t] * a0;'
m convolve-fma "Convolve fused" $dsp 'out[j] = out[j] + bm * a[j];' 'out[j] = std::fma(bm, a[j], out[j]);'
m upsample-phase-modulo "UpSample reduces the phase modulo the factor" $dsp 'if (j == *phase) {' 'if (j == *phase % factor) {'
m downsample-count "DownSample drops the last sample" $dsp \
  'const unsigned int count = (n - p + factor - 1u) / factor;' 'const unsigned int count = (n - p) / factor;'
m downsample-phase "DownSample moves the phase the wrong way" $dsp \
  '*phase = (p - n % factor + factor) % factor;' '*phase = (p + n % factor) % factor;'

matrix=src/utility/MatrixUtils/MatrixKernels.h
m matrix-colmajor-as-row "column-major read as row-major" $matrix \
  'MultiplyMapped<T, Eigen::ColMajor>' 'MultiplyMapped<T, Eigen::RowMajor>'
m matrix-noalias "the product written straight into c" $matrix 'result = lhs * rhs;' 'result.noalias() = lhs * rhs;'

window=src/utility/Window/WindowKernels.h
m window-mirror-factor "the mirror sample gets its own factor" $window \
  $'const unsigned int mirror = n - 1u - i;\n        dst[mirror] = w * src[mirror];' \
  $'const unsigned int mirror = n - 1u - i;\n        dst[mirror] = factor(mirror) * src[mirror];'
m window-angle-reassoc "window angle as i * (2pi / (n - 1))" $window \
  'static_cast<T>(i) * WindowConstants<T>::kTwoPi / static_cast<T>(n - 1u)' \
  'static_cast<T>(i) * (WindowConstants<T>::kTwoPi / static_cast<T>(n - 1u))'
m blackman-double-cos "double Blackman takes double cosines" $window \
  'const double cos1 = static_cast<double>(std::cos(static_cast<float>(x)));' 'const double cos1 = std::cos(x);'
m kaiser-centre-twice "Kaiser writes an odd centre twice" $window 'if (i < pairs) {' 'if (i <= pairs) {'

lowpass=src/filter/FIR/LowpassDesignKernels.h
m lowpass-cutoff "lowpass design with c = cutoff" $lowpass \
  'WriteSinc(cutoff + cutoff, tapCount, taps);' 'WriteSinc(cutoff, tapCount, taps);'
m lowpass-window-swap "Hamming design gets the Hann window" $lowpass \
  'case utility::kDSPWindowHamming: utility::cpp::WindowHamming' 'case utility::kDSPWindowHamming: utility::cpp::WindowHann'
m lowpass-even-offset "even designs sampled on whole multiples of pi" $lowpass \
  'double x = 1.5707963267948966;' 'double x = 3.141592653589793;'

fir=src/filter/FIR/FIRKernels.h
m fir-chunk-256 "FIR overlap chunks of 256" src/filter/FIR/FIRState.h \
  'constexpr unsigned int FIRChunkSize = 512;' 'constexpr unsigned int FIRChunkSize = 256;'
m fir-single-newest-first "single-sample FIR adds the newest product first" $fir \
  $'float sum = 0.0f;\n    for (std::size_t j = 0; j < m; ++j) sum += taps[m - j] * delay[j];\n    return sum + sample * taps[0];' \
  $'float sum = sample * taps[0];\n    for (std::size_t j = 0; j < m; ++j) sum += taps[m - j] * delay[j];\n    return sum;'
m fir-lanes-fma "FIR eight-output body fused" src/filter/FIR/FIROutputKernels.h \
  $'const float* x = src + (i0 + j - m);\n        for (std::size_t l = 0; l < W; ++l) sum[l] += tap * x[l];' \
  $'const float* x = src + (i0 + j - m);\n        for (std::size_t l = 0; l < W; ++l) sum[l] = std::fma(tap, x[l], sum[l]);'
m fir-delay-split "short FIR block lands one place early in the delay line" $fir \
  'utility::cpp::Copy(count, src, delay + (d - count));' 'utility::cpp::Copy(count, src, delay + (d - count) - 1);'
m fir-overlap-equal-only "FIR treats only equal pointers as overlapping" $fir \
  'const bool overlap = srcBegin < dstBegin + bytes && dstBegin < srcBegin + bytes;' \
  'const bool overlap = srcBegin == dstBegin;'
# Needs a processor with FMA: the file is built with contraction switched on.
m fir-contract-flag "FIR.cpp built with -mfma -ffp-contract=fast" src/KernelFlags.cmake \
  'kestaccel_kernel_flags(filter/FIR/FIR.cpp -O2)' 'kestaccel_kernel_flags(filter/FIR/FIR.cpp -O2 -mfma -ffp-contract=fast)'

iir=src/filter/IIR/IIRKernels.h
m iir-section-sum-order "IIR section adds d[i+1] - a y first" $iir \
  'd[i] = b[i + 1] * x + d[i + 1] - a[i + 1] * y;' 'd[i] = b[i + 1] * x + (d[i + 1] - a[i + 1] * y);'
m iir-biquad-sum-order "biquad block subtracts before adding the state" $iir \
  $'d0 = b1 * x + d1 - a1 * y;\n        d1 = b2 * x - a2 * y;\n        dst[i] = y;' \
  $'d0 = b1 * x - a1 * y + d1;\n        d1 = b2 * x - a2 * y;\n        dst[i] = y;'
m iir-pair-fma "biquad pair fused" $iir 'const T z = c0 * y + f0;' 'const T z = std::fma(c0, y, f0);'
m iir-init-divides "IIR init divides by a0 instead of multiplying by 1/a0" $iir \
  'record->taps[i] = r * taps[i];' 'record->taps[i] = taps[i] / leading;'
m iir-null-delay-clears-all "IIRSetDlyLine(null) clears every section" $iir \
  'utility::cpp::Zero(state->order, state->delayLine.data());' \
  'utility::cpp::Zero(state->order * state->sectionCount, state->delayLine.data());'

mrf=src/filter/MultiRate/MultiRateKernels.h
poly=src/filter/MultiRate/PolyphaseKernels.h
m mrf-seamless-rebase "multi-rate rebases by the samples consumed" $mrf \
  'static_cast<std::uint32_t>(state->inputIndex) - cycleCount);' 'static_cast<std::uint32_t>(state->inputIndex) - consumed);'
m mrf-history-shift "multi-rate history one sample late" $mrf \
  'const std::int64_t e = std::int64_t(consumed) - i - 1;' 'const std::int64_t e = std::int64_t(consumed) - i;'
m mrf-same-buffer "multi-rate writes over its source" $mrf 'const bool sameBuffer = src == dst;' 'const bool sameBuffer = false;'
m mrf-phase-floor "negative start position not floored" $mrf \
  $'phase += upFactor;\n        inputIndex -= 1;' 'phase += upFactor;'
m mrf-lanes-fma "multi-rate lanes fused" $poly 'acc[k] += row[k] * tap;' 'acc[k] = std::fma(row[k], tap, acc[k]);'
m mrf-block-reversed "multi-rate single output summed newest first" $poly \
  'for (std::size_t j = 0; j < length; ++j) sum += window[j] * branch[j];' \
  'for (std::size_t j = length; j-- > 0;) sum += window[j] * branch[j];'
m mrf-tile-history "multi-rate tile reads history one off" $poly \
  'row[k] = s >= 0 ? src[s] : history[-s - 1];' 'row[k] = s >= 0 ? src[s] : history[-s];'

fft=src/transform/FFT
m fft-butterfly-fma "FFT butterfly fused" $fft/Butterflies.h 'const E tr = yr * wr - yi * wi;' \
  'const E tr = std::fma(yr, wr, -(yi * wi));'
m fft-minus-i "FFT second stage turns by +i" $fft/Butterflies.h \
  $'xr = ar + bi;\n    xi = ai - br;\n    yr = ar - bi;\n    yi = ai + br;' \
  $'xr = ar - bi;\n    xi = ai + br;\n    yr = ar + bi;\n    yi = ai - br;'
m fft-twiddle-sign "complex twiddles of the inverse sign" $fft/PlanKernels.h \
  'Rotation r{1.0, 0.0, std::cos(theta), std::sin(theta)};' 'Rotation r{1.0, 0.0, std::cos(theta), -std::sin(theta)};'
m fft-dc-negative-zero "real spectrum has -0 at DC's imaginary part" $fft/RealKernels.h \
  'dst[1] = E(0) + E(0);' 'dst[1] = -E(0);'
m fft-combine-reassoc "real combine step reassociated" $fft/RealKernels.h \
  'dst[2 * k] = (wr * v.oRe + v.eRe) - v.oIm * wi;' 'dst[2 * k] = wr * v.oRe + (v.eRe - v.oIm * wi);'
m fft-pairs-overlap "interleaved transform sees only equal pointers as overlap" $fft/FFTInterfaceKernels.h \
  'if (!Overlap(from, to, count)) {' 'if (from != to) {'
m fft-scratch-short "real plan reserves too little scratch" $fft/PlanKernels.h \
  'plan.forwardScratch.Reserve(2 * size + 2);' 'plan.forwardScratch.Reserve(size);'
m fft-impl-ceil "FFTImpl rounds the length up" $fft/FFTImpl.cpp \
  'TruncateToInt64(std::log2(static_cast<double>(fftSize)) + 0.5)' \
  'TruncateToInt64(std::ceil(std::log2(static_cast<double>(fftSize))))'

# ---------------------------------------------------------------------------

list_only=0 check_only=0 filters=()
for arg in "$@"; do
    case "$arg" in
    --list) list_only=1 ;;
    --check) check_only=1 ;;
    -h | --help) sed -n '2,16p' "$0"; exit 0 ;;
    *) filters+=("$arg") ;;
    esac
done

selected=()
for i in "${!names[@]}"; do
    keep=$(( ${#filters[@]} == 0 ))
    for f in "${filters[@]}"; do [[ ${names[$i]} == *"$f"* ]] && keep=1; done
    (( keep )) && selected+=("$i")
done
if [ ${#selected[@]} -eq 0 ]; then
    echo "no mutant matches: ${filters[*]}" >&2
    exit 2
fi

if (( list_only )); then
    for i in "${selected[@]}"; do printf '%-28s %-48s %s\n' "${names[$i]}" "${files[$i]}" "${descriptions[$i]}"; done
    exit 0
fi

# The edited files are restored with git checkout: they must hold nothing
# that is not committed.
mutated_files=$(printf '%s\n' "${files[@]}" | sort -u)
# shellcheck disable=SC2086
if ! git diff --quiet HEAD -- $mutated_files; then
    echo "uncommitted changes in the files that mutants edit; commit or stash them first" >&2
    exit 2
fi

current=""
restore() {
    if [ -n "$current" ]; then
        git checkout -- "$current"
        current=""
    fi
}
trap 'restore' EXIT
trap 'restore; echo "interrupted" >&2; exit 130' INT TERM

# Replaces the one occurrence of $FROM in the file; exit status 3 when it
# occurs another number of times.
apply_edit() {
    FROM="$2" TO="$3" perl -0777 -i -pe '
        my $n = () = /\Q$ENV{FROM}\E/g;
        if ($n != 1) { print STDERR "matches $n times\n"; exit 3 }
        s/\Q$ENV{FROM}\E/$ENV{TO}/;' "$1"
}

if (( check_only )); then
    stale=0
    for i in "${selected[@]}"; do
        current=${files[$i]}
        if ! apply_edit "${files[$i]}" "${froms[$i]}" "${tos[$i]}" 2>/dev/null; then
            echo "stale: ${names[$i]} (${files[$i]})"
            stale=$((stale + 1))
        fi
        restore
    done
    echo "${#selected[@]} mutants, $stale stale"
    exit $(( stale > 0 ))
fi

generator=()
command -v ninja >/dev/null && generator=(-G Ninja)
if [ ! -f "$build/CMakeCache.txt" ]; then
    cmake -S . -B "$build" "${generator[@]}" -DCMAKE_BUILD_TYPE=Release -DKESTACCEL_BUILD_TESTS=ON \
        -DKESTACCEL_BUILD_BENCHMARKS=OFF -DKESTACCEL_BUILD_EXAMPLES=OFF -DKESTACCEL_INSTALL=OFF >/dev/null || exit 1
fi
logs="$build/mutant-logs"
mkdir -p "$logs"

build_and_test() {  # $1: log name; prints the failing tests, returns ctest's status (99: no build)
    if ! cmake --build "$build" -j "$jobs" >"$logs/$1.build.log" 2>&1; then
        return 99
    fi
    ctest --test-dir "$build" -L bitexact -j "$jobs" --timeout 300 >"$logs/$1.test.log" 2>&1
    local status=$?
    sed -n 's/^[[:space:]]*[0-9]* - \([A-Za-z0-9_]*\) (.*/\1/p' "$logs/$1.test.log" | paste -sd, -
    return $status
}

echo "baseline: building and running the suite on the unchanged sources"
if ! build_and_test baseline >/dev/null; then
    echo "the suite does not pass on the unchanged sources (see $logs/baseline.*.log)" >&2
    exit 1
fi

has_fma=1
grep -qw fma /proc/cpuinfo 2>/dev/null || has_fma=0

results=() caught=0 missed=0 other=0
for i in "${selected[@]}"; do
    name=${names[$i]}
    printf '%-28s ' "$name"
    if [[ $name == *-flag && $has_fma == 0 ]]; then
        result="skipped (no FMA here)" failing=""
    else
        current=${files[$i]}
        if ! apply_edit "${files[$i]}" "${froms[$i]}" "${tos[$i]}" 2>/dev/null; then
            result="STALE" failing=""
        else
            failing=$(build_and_test "$name")
            case $? in
            0) result="MISSED" ;;
            99) result="NO BUILD" ;;
            *) result="caught" ;;
            esac
        fi
        restore
    fi
    case $result in
    caught) caught=$((caught + 1)) ;;
    MISSED) missed=$((missed + 1)) ;;
    *) other=$((other + 1)) ;;
    esac
    echo "$result ${failing:+($failing)}"
    results+=("$(printf '%-28s %-9s %-52s %s' "$name" "$result" "${descriptions[$i]}" "$failing")")
done

echo "restoring the build of the unchanged sources"
cmake --build "$build" -j "$jobs" >"$logs/restore.build.log" 2>&1 || echo "rebuild failed (see $logs/restore.build.log)" >&2

{
    printf '%-28s %-9s %-52s %s\n' mutant result fault "failing tests"
    printf '%s\n' "${results[@]}"
    echo "total ${#selected[@]}: caught $caught, missed $missed, other $other"
} | tee "$build/mutants-summary.txt"
(( missed == 0 && other == 0 ))
