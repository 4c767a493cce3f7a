// Feeds arbitrary bytes to the binary metadata decoder, twice on the same object (the whole
// input, then its second half), so that blocks of one frame leaking into the next show up as
// well. The sanitizers catch any read beyond the data; the checks below catch results that do
// not describe the bytes given.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <vector>

#include "analytics/haq_meta_binary.h"

namespace {

bool EndsWithMarker(const uint8_t* data, size_t size) {
    const auto marker = [&](size_t end) {
        return end >= 4 && data[end - 4] == 0xFF && data[end - 3] == 0xFF &&
               data[end - 2] == 0xFF && data[end - 1] == 0xFF;
    };
    return marker(size) ||
           (size >= 6 && data[size - 2] == 0x0D && data[size - 1] == 0x0A && marker(size - 2));
}

void Check(CHaqMetaBinary& decoder, const uint8_t* data, size_t size) {
    // A heap copy of exactly `size` bytes, so that any read past it is caught.
    std::vector<uint8_t> copy(data, data + size);
    const int result =
        decoder.Decode(copy.empty() ? nullptr : copy.data(), static_cast<int32_t>(copy.size()));
    if (size < 4 || size > decoder.BufferSize()) {
        if (result != CHaqMetaBinary::kBadCall) {
            std::abort();
        }
    } else if (result == CHaqMetaBinary::kBadCall) {
        std::abort();
    }
    if (result == CHaqMetaBinary::kNoEndMarker && EndsWithMarker(copy.data(), size)) {
        std::abort();
    }
    if (result != CHaqMetaBinary::kBadCall && result != CHaqMetaBinary::kNoEndMarker &&
        !EndsWithMarker(copy.data(), size)) {
        std::abort();
    }
    if (result == CHaqMetaBinary::kOk && (!decoder.HasTimeBlock() || !decoder.HasObjectBlock())) {
        std::abort();
    }
    if ((result == CHaqMetaBinary::kBadCall || result == CHaqMetaBinary::kNoEndMarker) &&
        (decoder.HasTimeBlock() || decoder.HasObjectBlock() || decoder.Has0101Block())) {
        std::abort();
    }

    const uint32_t count = decoder.ObjectCount();
    if (count > decoder.DeclaredObjectCount() || count * 20u > size) {
        std::abort();
    }
    // A decoded frame that declares more records than fit cannot have been accepted.
    if (result == CHaqMetaBinary::kOk && count != decoder.DeclaredObjectCount()) {
        std::abort();
    }
    std::vector<SHaqMetaBinaryObjectData> objects(kMetaMaxObjects);
    if (decoder.CopyObjects(objects.data(), kMetaMaxObjects) > kMetaMaxObjects) {
        std::abort();
    }
    SHaqMetaBinaryObjectData one{};
    if (decoder.GetObject(count, one)) {
        std::abort();
    }
    uint32_t first = 0;
    uint32_t second = 0;
    if (decoder.GetTime(first, second) != decoder.HasTimeBlock()) {
        std::abort();
    }
    int32_t scale = -1;
    int32_t width = -1;
    int32_t height = -1;
    if (decoder.DeriveGeometry(scale, width, height)) {
        if (scale < 0 || scale > 320 || (scale == 0 && (width <= 320 || height < 0))) {
            std::abort();
        }
    } else if (scale != -1 || width != -1 || height != -1) {
        std::abort();
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    CHaqMetaBinary decoder;
    if (decoder.Init(3, 1000) != CHaqMetaBinary::kOk) {
        std::abort();
    }
    Check(decoder, data, size);
    Check(decoder, data + size / 2, size - size / 2);
    return 0;
}
