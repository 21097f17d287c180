/* Where the benchmark lays down what its tools print. */
#ifndef BENCH_ANSWERS_H
#define BENCH_ANSWERS_H

#define BENCH_ANSWERS "/run/zav_bench"

#endif
