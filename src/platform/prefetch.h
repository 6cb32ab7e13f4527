#ifndef MCOBNQRT_PREFETCH_H
#define MCOBNQRT_PREFETCH_H

/// Tells the processor that memory is soon written to, so that it fetches it in the meantime. It is only a hint:
/// `address` may be any, and with a compiler that knows no such instruction nothing is done.
inline void PrefetchForWriting([[maybe_unused]] const void* address)
{
#if defined(__GNUC__)
    __builtin_prefetch(address, 1);
#endif
}

#endif
