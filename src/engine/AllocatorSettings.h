#pragma once

namespace vtr {

// Settles how the C library's allocator treats what a verification frees, before the first
// one. A verification loads sequence after sequence, each asking for the same large
// buffers again and freeing them, and builds and then frees tens of thousands of small
// objects per run:
//   - large buffers come from the process's own heap and freed memory stays with the
//     process for the next load, instead of going back to the system and coming back one
//     page fault at a time;
//   - small blocks are not parked in the allocator's fast lists, whose merging at the next
//     large request walks every parked block: with the objects of a run of hundreds of
//     shows parked there, that walk grows faster than the run.
//   - the heap grows 64 MB at a time, and the first such room is backed by huge pages
//     where the system gives them on request: a run over many thousands of channels
//     takes some eight hundred page faults instead of thirteen thousand. Memory never
//     touched is never taken from the system, so a small run stays small.
// Does nothing where the allocator has no such settings.
void SettleAllocator();

}  // namespace vtr
