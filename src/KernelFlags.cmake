# Per-file compile flags for kernels that need other optimisation settings
# than the library's default (-O3). Each entry says why.
