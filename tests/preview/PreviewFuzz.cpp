// Fuzzes the preview reader with whole files held in memory.
#include "preview/DwgPreview.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    DwgPreview preview;
    if (ParseDwgPreview(data, size, preview)) {
        // What was accepted must be a measurable picture inside the input.
        if (preview.bytes.empty() || preview.bytes.size() > size || preview.width < 0 || preview.height < 0)
            std::abort();
        int w = 0, h = 0;
        if (!MeasurePreviewImage(preview.kind, preview.bytes.data(), preview.bytes.size(), w, h) ||
            w != preview.width || h != preview.height)
            std::abort();
    }
    return 0;
}
