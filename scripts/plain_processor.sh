# shellcheck shell=bash
# Sourced before instructions are counted: otherwise the C library selects its string functions by the processor.

processor=-AVX512F,-AVX512VL,-AVX512BW,-AVX512DQ,-AVX2,-AVX,-BMI1,-BMI2,-LZCNT,-MOVBE,-SSE4_2,-SSE4_1,-SSSE3
processor+=,-ERMS,-FSRM,-RTM,-AVX_Fast_Unaligned_Load,-Fast_Unaligned_Copy,-Prefer_No_VZEROUPPER
export GLIBC_TUNABLES=glibc.cpu.hwcaps=$processor
