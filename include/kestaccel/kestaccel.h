#pragma once

// The whole interface of kestaccel.

#include "kestaccel/Common.h"
#include "kestaccel/VectorUtils.h"
#include "kestaccel/BasicMath.h"
#include "kestaccel/DSP.h"
#include "kestaccel/MatrixUtils.h"
#include "kestaccel/Window.h"
#include "kestaccel/FFT.h"
#include "kestaccel/FIR.h"
#include "kestaccel/IIR.h"
#include "kestaccel/MultiRate.h"
