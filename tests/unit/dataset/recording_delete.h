#ifndef KESTREL_TESTS_DATASET_RECORDING_DELETE_H_
#define KESTREL_TESTS_DATASET_RECORDING_DELETE_H_

#include <cstddef>
#include <vector>

// The binary that links recording_delete.cc has the global operator new and
// delete replaced over malloc and free; the sized delete records the size
// with which each block is freed.
namespace recording_delete {

// Forgets what was recorded so far and records every sized delete from now.
void start();

// Stops recording; the sizes with which address was freed since start().
std::vector<std::size_t> frees_of(const void* address);

}  // namespace recording_delete

#endif  // KESTREL_TESTS_DATASET_RECORDING_DELETE_H_
