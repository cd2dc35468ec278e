// Function attributes for the x86-64 kernels of each instruction-set level,
// in one place so that every family compiles a level for the same features:
// those common/cpu.cpp requires before it offers the level (AVX2 comes with
// BMI1 and BMI2, and every CPU with AVX2 has POPCNT; AVX-512 is F, BW, VL
// and DQ; VBMI and VBMI2 are asked for separately). SSSE3 has no POPCNT:
// some CPUs with SSSE3 lack it.
#pragma once

#if defined(__x86_64__) || defined(_M_X64)
#define ZUL_SSSE3 __attribute__((target("ssse3")))
#define ZUL_AVX2 __attribute__((target("avx2,bmi,bmi2,popcnt")))
#define ZUL_AVX512 \
  __attribute__((target("avx2,bmi,bmi2,popcnt,avx512f,avx512bw,avx512vl,avx512dq")))
#define ZUL_AVX512_VBMI2                                                           \
  __attribute__((                                                                  \
      target("avx2,bmi,bmi2,popcnt,avx512f,avx512bw,avx512vl,avx512dq,avx512vbmi," \
             "avx512vbmi2")))
#endif
