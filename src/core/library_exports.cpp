// The exported entry points that stand beside the library object.
#include <qorvex/library.h>

#include "core/adapters/rendering_adapters.h"
#include "core/library_impl.h"
#include "core/logging/log.h"
#include "core/url/url_decode.h"

namespace qorvex {

Library* Library::Initialize(const LibraryParams& params) {
    return LibraryImpl::Create(params, nullptr);
}

Library* Library::InitializeWithRenderingLibrary(const LibraryParamsWithExternalRenderingLibrary& params,
                                                 fresco::IRenderingLibrary* rendering_library) {
    if (!rendering_library) return nullptr;
    LibraryParams full;
    static_cast<LibraryParamsWithExternalRenderingLibrary&>(full) = params;
    return LibraryImpl::Create(full, rendering_library);
}

const char* Library::GetDefaultUserAgent() {
    return "Qorvex/" QORVEX_VERSION_TEXT " (Windows; Native) qorvex/" QORVEX_VERSION_TEXT " (Tarnwell Labs)";
}

void Library::HintThreadUsage(WorkType type) {
    if (type != WorkType::Resources && type != WorkType::Layout)
        LogWarning("Trying to HintThreadUsage on unknown WorkType");
}

void Library::DecodeURLString(const char* in, unsigned length, char* out, unsigned* out_length) {
    ThreadScope scope;
    TempMark mark;
    TempVector<char> text;
    text.resize(static_cast<size_t>(length) + 1);
    const unsigned decoded = DecodePercentEscapes(std::string_view(in, length), text.data());
    if (out_length) *out_length = decoded;
    if (out) std::memcpy(out, text.data(), decoded);
}

void AdaptRenderingAllocatorAndLoggerFromQorvex(IAllocator* allocator, Logging::ILogHandler* log_handler,
                                                fresco::IAllocator** out_allocator,
                                                fresco::Logging::ILogHandler** out_log_handler) {
    *out_allocator =
        new (allocator->Allocate(sizeof(FrescoAllocator), MemoryTag::Rendering)) FrescoAllocator(*allocator);
    *out_log_handler = new (allocator->Allocate(sizeof(FrescoLogHandler), MemoryTag::Rendering))
        FrescoLogHandler(log_handler);
}

void DestroyAdaptedRenderingAllocatorAndLogger(IAllocator* allocator, fresco::IAllocator* adapted_allocator,
                                               fresco::Logging::ILogHandler* adapted_log_handler) {
    auto* adapted = static_cast<FrescoAllocator*>(adapted_allocator);
    auto* log = static_cast<FrescoLogHandler*>(adapted_log_handler);
    if (adapted) {
        std::destroy_at(adapted);
        allocator->Deallocate(adapted, MemoryTag::Rendering);
    }
    if (log) {
        std::destroy_at(log);
        allocator->Deallocate(log, MemoryTag::Rendering);
    }
}

}  // namespace qorvex
