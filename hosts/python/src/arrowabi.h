#ifndef MCBINNING_ARROWABI_H
#define MCBINNING_ARROWABI_H

// The structures of the Arrow C data and C stream interfaces, as their definition prints them for copying. The guards
// are its own, so that another copy in the same source does no harm.

#include <cstdint>

#ifndef ARROW_C_DATA_INTERFACE
#define ARROW_C_DATA_INTERFACE

extern "C"
{
    struct ArrowSchema
    {
        const char* format;
        const char* name;
        const char* metadata;
        std::int64_t flags;
        std::int64_t n_children;
        struct ArrowSchema** children;
        struct ArrowSchema* dictionary;
        void (*release)(struct ArrowSchema*);
        void* private_data;
    };

    struct ArrowArray
    {
        std::int64_t length;
        std::int64_t null_count;
        std::int64_t offset;
        std::int64_t n_buffers;
        std::int64_t n_children;
        const void** buffers;
        struct ArrowArray** children;
        struct ArrowArray* dictionary;
        void (*release)(struct ArrowArray*);
        void* private_data;
    };
}

#endif

#ifndef ARROW_C_STREAM_INTERFACE
#define ARROW_C_STREAM_INTERFACE

extern "C"
{
    struct ArrowArrayStream
    {
        int (*get_schema)(struct ArrowArrayStream*, struct ArrowSchema* out);
        int (*get_next)(struct ArrowArrayStream*, struct ArrowArray* out);
        const char* (*get_last_error)(struct ArrowArrayStream*);
        void (*release)(struct ArrowArrayStream*);
        void* private_data;
    };
}

#endif

/// The one owner of such a structure, which it moves out of the place where it was made. Releases it at the end.
template<class Structure>
class ArrowOwner
{
public:
    ArrowOwner() = default;
    explicit ArrowOwner(Structure& source) : fStructure(source) { source.release = nullptr; }
    ArrowOwner(ArrowOwner&& other) noexcept : ArrowOwner(other.fStructure) {}

    ArrowOwner& operator=(ArrowOwner&& other) noexcept
    {
        if (this != &other)
        {
            Release();
            fStructure = other.fStructure;
            other.fStructure.release = nullptr;
        }
        return *this;
    }

    ~ArrowOwner() { Release(); }

    bool IsEmpty() const { return fStructure.release == nullptr; }
    Structure* operator->() { return &fStructure; }
    const Structure* operator->() const { return &fStructure; }
    const Structure& operator*() const { return fStructure; }

    /// Where a producer may put the next one; what is held is released first.
    Structure* Receive()
    {
        Release();
        return &fStructure;
    }

private:
    void Release()
    {
        if (fStructure.release)
            fStructure.release(&fStructure);
        fStructure.release = nullptr;
    }

    Structure fStructure{};
};

#endif
