// What the machine can do with arrays.
#ifndef ZARVO_BENCH_CALLS_BYTEORDER_LOOPS_H
#define ZARVO_BENCH_CALLS_BYTEORDER_LOOPS_H

#include <cstddef>
#include <cstdint>

namespace bench {

void reverse_each(uint16_t* data, size_t count);
void reverse_each(uint32_t* data, size_t count);
void reverse_each(uint64_t* data, size_t count);

// Reads and writes everything once.
void pass_over(uint64_t* data, size_t count);

}  // namespace bench

#endif
