// The few pieces of the C++ runtime that the Windows builds need, in place of the library's: those
// bring exceptions and locale code along, more than a hundred kilobytes for what a dozen lines do.
#include <cstdlib>
#include <new>

const std::nothrow_t std::nothrow{};

// NOLINTBEGIN(misc-new-delete-overloads): the program has the nothrow forms of new alone.
void* operator new(size_t size, const std::nothrow_t&) noexcept {
  return malloc(size != 0 ? size : 1);
}
void* operator new[](size_t size, const std::nothrow_t&) noexcept {
  return malloc(size != 0 ? size : 1);
}
void operator delete(void* block) noexcept {
  free(block);
}
void operator delete[](void* block) noexcept {
  free(block);
}
void operator delete(void* block, size_t) noexcept {
  free(block);
}
void operator delete[](void* block, size_t) noexcept {
  free(block);
}
void operator delete(void* block, const std::nothrow_t&) noexcept {
  free(block);
}
void operator delete[](void* block, const std::nothrow_t&) noexcept {
  free(block);
}

// Called through the slot of an abstract operation, which no finished object has.
extern "C" void __cxa_pure_virtual() {
  abort();
}

// Called by new[] for a count whose size no size_t holds. The counts here are below 2^31 and small.
extern "C" void __cxa_throw_bad_array_new_length() {
  abort();
}
