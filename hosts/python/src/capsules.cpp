#include "hosts/python/src/capsules.h"

#include "hosts/python/src/faults.h"

#include <nanobind/stl/string.h>

#include <cstring>
#include <string>
#include <utility>

namespace nb = nanobind;

namespace
{

template<class Structure>
ArrowOwner<Structure> TakeOut(const nb::capsule& capsule, const char* name)
{
    auto* const structure = static_cast<Structure*>(PyCapsule_GetPointer(capsule.ptr(), name));
    if (structure == nullptr)
        throw nb::python_error();
    if (structure->release == nullptr)
        throw StreamFault("the stream has been read before", 0);
    return ArrowOwner<Structure>(*structure);
}

class StreamBatches : public Batches
{
public:
    StreamBatches(ArrowOwner<ArrowArrayStream> stream, nb::object explain)
        : fStream(std::move(stream)), fExplain(std::move(explain))
    {
        const int code = fStream->get_schema(fStream.operator->(), fSchema.Receive());
        if (code != 0)
            throw StreamFault(DescribeError(code), 0);
        if (std::strcmp(fSchema->format, "+s") != 0)
            throw DataFault("the data are single values; a table with named columns is needed");
    }

    const ArrowSchema& GetSchema() const override { return *fSchema; }

    const ArrowArray* Next(std::int64_t row) override
    {
        const int code = fStream->get_next(fStream.operator->(), fBatch.Receive());
        if (code != 0)
            throw StreamFault(DescribeError(code), row);
        return fBatch.IsEmpty() ? nullptr : &*fBatch;
    }

private:
    std::string DescribeError(int code)
    {
        const char* const message = fStream->get_last_error(fStream.operator->());
        const std::string text = message != nullptr ? message : std::strerror(code);
        const nb::gil_scoped_acquire gil;
        return fExplain.is_none() ? text : nb::cast<std::string>(fExplain(text));
    }

    ArrowOwner<ArrowArrayStream> fStream;
    nb::object fExplain;
    ArrowOwner<ArrowSchema> fSchema;
    ArrowOwner<ArrowArray> fBatch;
};

class IteratorBatches : public Batches
{
public:
    IteratorBatches(ArrowOwner<ArrowSchema> schema, nb::object iterator)
        : fSchema(std::move(schema)), fIterator(std::move(iterator))
    {
    }

    const ArrowSchema& GetSchema() const override { return *fSchema; }

    const ArrowArray* Next(std::int64_t) override
    {
        const nb::gil_scoped_acquire gil;
        const nb::object batch = nb::steal(PyIter_Next(fIterator.ptr()));
        if (PyErr_Occurred() != nullptr)
            throw nb::python_error();
        if (!batch.is_valid())
            return nullptr;
        const nb::tuple capsules(batch.attr("__arrow_c_array__")());
        fBatch = TakeOut<ArrowArray>(nb::cast<nb::capsule>(capsules[1]), "arrow_array");
        return &*fBatch;
    }

private:
    ArrowOwner<ArrowSchema> fSchema;
    nb::object fIterator;
    ArrowOwner<ArrowArray> fBatch;
};

} // namespace

std::unique_ptr<Batches> OpenStream(nb::capsule stream, nb::object explain)
{
    return std::make_unique<StreamBatches>(TakeOut<ArrowArrayStream>(stream, "arrow_array_stream"), std::move(explain));
}

std::unique_ptr<Batches> OpenIterator(nb::capsule schema, nb::object iterator)
{
    return std::make_unique<IteratorBatches>(TakeOut<ArrowSchema>(schema, "arrow_schema"), std::move(iterator));
}
