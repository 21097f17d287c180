/* The smallest library: what loading any costs. */
int zav_bench_nothing(void);

int zav_bench_nothing(void) {
    return 0;
}
