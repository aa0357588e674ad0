#include "layout/fonts/font_manager.h"

#include <algorithm>
#include <memory>

#include "core/logging/log.h"
#include "css/values/text_reader.h"
#include "layout/dom_tasks.h"
#include "layout/fonts/fallback_font_data.h"
#include "layout/fonts/memory_stream.h"

namespace qorvex::layout {

namespace {

constexpr TaskChannels kChannels[] = {TaskChannels::Resources, TaskChannels::Main};

void LogChannel(const char* what, TaskChannels channel, uint32_t family) {
    LogTrace(what, static_cast<uint32_t>(channel), " on family ", family);
}

// 0 off, 1 on, 2 auto.
fresco::SdfMode ToSdfMode(uint32_t useSDF) {
    switch (useSDF) {
        case 1:
            return fresco::SdfMode::Always;
        case 2:
            return fresco::SdfMode::WhenLarge;
        default:
            return fresco::SdfMode::Never;
    }
}

// Collections hold several faces; only a description that leaves something open asks for all of them.
bool IsCollection(std::string_view url) {
    const size_t dot = url.rfind('.');
    if (dot == std::string_view::npos) return false;
    const std::string_view extension = url.substr(dot + 1);
    return css::EqualsIgnoreCase(extension, "ttc") || css::EqualsIgnoreCase(extension, "otc");
}

// Closes the stream with the task that reads it, also when that task is dropped.
struct StreamCloser {
    void operator()(fresco::IStreamReader* reader) const { reader->Close(); }
};
using StreamPtr = std::unique_ptr<fresco::IStreamReader, StreamCloser>;

// Tells a node that a font it waits for has come.
struct FontArrived : DOMTaskData {};

}  // namespace

FontManager::FontManager(const FontManagerSettings& settings)
    : service_(settings.service),
      family_(settings.family),
      loader_(settings.loader),
      strings_(settings.strings) {
    for (const TaskChannels channel : kChannels) {
        LogChannel("Opening task channel ", channel, family_.family);
        family_.system->OpenChannel(channel, family_.family);
    }
    for (const char* family : settings.defaultFamilies) {
        if (family == nullptr || *family == '\0' || !default_family_.empty()) continue;
        SetDefaultFont(family);
    }
    LoadFallbackFont(settings.embeddedFallbackFont);
}

FontManager::~FontManager() {
    for (const TaskChannels channel : kChannels) {
        LogChannel("Closing task channel ", channel, family_.family);
        family_.system->CloseChannel(channel, family_.family);
    }
}

void FontManager::RunMainTasks() {
    family_.system->Run(TaskChannels::Main, false, nullptr, family_.family);
}

void FontManager::SetDefaultFont(std::string_view family) {
    default_family_ = strings_.Intern(family);
    if (GetFont({default_family_, kNormalStyle, kNormalWeight}, {}) != nullptr) return;
    LogWarning("Unable to load default font name ", family);
    default_family_ = Atom();
}

void FontManager::LoadFallbackFont(int32_t which) {
    if (which == 0) return;
    MemoryStream stream = which == 1 ? MemoryStream(kSmallFallbackFont, kSmallFallbackFontSize)
                                     : MemoryStream(kLargeFallbackFont, kLargeFallbackFontSize);
    fallback_ = service_.LoadFace(&stream, 0, fresco::SdfMode::Never);
}

fresco::IFont* FontManager::GetFont(const FontDescription& description, const NodeLinkPtr& waiter) {
    if (description.family.empty()) return nullptr;
    if (const fresco::FontId* id = loaded_.get(description)) return service_.GetFont(*id);
    if (WaiterList* waiters = pending_.get(description)) {
        if (waiter && std::find(waiters->begin(), waiters->end(), waiter) == waiters->end()) {
            waiters->push_back(waiter);
        }
        return nullptr;
    }
    if (!default_family_.empty() && IsGenericFamily(description.family.view())) {
        return GetFont({default_family_, description.style, description.weight}, {});
    }
    const fresco::FontId id = service_.FindFont(description.family.c_str(), ToFontFlags(description));
    if (id == fresco::kNoId) return nullptr;
    loaded_.insert(description, id);
    return service_.GetFont(id);
}

void FontManager::ResolveTypefaces(const css::FontFamily& families, css::FontStyle style, uint8_t weight,
                                   const NodeLinkPtr& waiter, TypefaceList& out) {
    out.clear();
    const uint8_t styleCode = StyleCode(style);
    for (const css::CssString& family : families) {
        const Atom name = strings_.Intern(family.view());
        uint32_t found = css::kNoTypeface;
        bool pending = false;
        const auto search = [&](uint8_t code) {
            SearchWeights(weight, [&](uint8_t candidate) {
                const FontDescription description{name, code, candidate};
                const fresco::IFont* font = GetFont(description, waiter);
                if (font != nullptr) found = font->GetId();
                pending = font == nullptr && pending_.contains(description);
                return font != nullptr || pending;
            });
        };
        search(styleCode);
        // A family without slanted faces shows its upright ones (CSS Fonts Module Level 4, 5.2, step 4).
        if (found == css::kNoTypeface && !pending && styleCode != kNormalStyle) search(kNormalStyle);
        out.push_back(found);
    }
    out.push_back(fallback_);
}

void FontManager::AddFontDescription(const FontDescription& description, const URL& url, uint32_t useSDF) {
    if (loaded_.contains(description)) return;
    const bool isNew = pending_.try_emplace(description).second;
    if (!isNew && description.IsExplicit()) return;
    // The answer may come when the manager has gone: until the task runs, which only an open family does,
    // nothing here looks at it.
    FontManager* manager = this;
    auto answer = [manager, family = family_, description, url, useSDF](fresco::IStreamReader* reader) {
        // Reading and parsing a face takes long, and this may be the main thread.
        family.Push(TaskChannels::Resources, MakeTask("LoadFontFaces", [=, stream = StreamPtr(reader)] {
                        LoadFaces(manager->service_, family, *manager, stream.get(), description, url,
                                  ToSdfMode(useSDF));
                    }));
    };
    family_.Push(TaskChannels::Resources, loader_.RequestFont(url, std::move(answer)));
}

void FontManager::LoadFaces(fresco::IFontService& service, TaskFamilyHandle family, FontManager& manager,
                            fresco::IStreamReader* reader, const FontDescription& description, const URL& url,
                            fresco::SdfMode sdf) {
    const auto post = [&](auto&& function) {
        family.Push(TaskChannels::Main, MakeTask("UpdateFontManager", function));
    };
    uint32_t usable = 0;
    if (reader != nullptr) {
        const bool all = !description.IsExplicit() && IsCollection(url.GetText().view());
        const uint32_t count = all ? service.GetFaceCount(reader) : 1;
        for (uint32_t face = 0; face < count; ++face) {
            // A variable font shows the weight that the description asks for, where it names one.
            const uint32_t wanted = description.weight != 0 ? ToFontFlags(description) : fresco::kAnyStyle;
            const fresco::FontId id = service.LoadFace(reader, face, sdf, wanted);
            if (id == fresco::kNoId) continue;
            ++usable;
            post([&manager, id, description] { manager.OnFaceLoaded(id, description, description); });
        }
    }
    if (usable > 0) return;
    LogWarning("Unable to load font ", url.GetText().view(), " with given stream reader!");
    post([&manager, description] { manager.OnLoadFailed(description); });
}

void FontManager::OnFaceLoaded(fresco::FontId id, FontDescription description, const FontDescription& asked) {
    const fresco::IFont* font = service_.GetFont(id);
    if (font == nullptr) return OnLoadFailed(asked);
    if (description.family.empty()) description.family = strings_.Intern(font->GetFamilyName());
    if (description.style == 0) description.style = StyleFromFlags(font->GetFlags());
    if (description.weight == 0) description.weight = WeightFromFlags(font->GetFlags());
    loaded_.insert_or_assign(description, id);
    TellWaiters(description);
    if (!(asked == description)) TellWaiters(asked);
}

void FontManager::OnLoadFailed(const FontDescription& description) {
    // The waiters look again too: what they found pending may now have a font of another weight.
    TellWaiters(description);
}

void FontManager::TellWaiters(const FontDescription& description) {
    WaiterList* found = pending_.get(description);
    if (found == nullptr) return;
    const WaiterList waiters = std::move(*found);
    pending_.erase(description);
    const FontArrived data;
    for (const NodeLinkPtr& waiter : waiters)
        waiter->Receive(DOMTaskKind::FontArrived, data);
}

bool FontManager::RemoveFontDescription(const FontDescription& description) {
    return loaded_.erase(description) > 0;
}

void FontManager::AddFontFace(const css::FontFace& face) {
    const URL url(face.url.view());
    if (url.IsEmpty() || url.IsRelative()) {
        LogWarning("@font-face src url must be a valid URI");
        return;
    }
    uint8_t weight = kNormalWeight;
    if (face.weight >= kLightestWeight * 100 && face.weight <= kHeaviestWeight * 100) {
        weight = static_cast<uint8_t>((face.weight + 50) / 100);
    } else {
        LogWarning(
            "font-weight descriptor in @font-face declaration was not parsed properly. Font-weight accepts "
            "only specific weight values: [0-1000], normal, bold. Using the initial value");
    }
    // Pages get outlines at their true shape: distance fields pay only for text that a GPU scales.
    AddFontDescription({strings_.Intern(face.family.view()), StyleCode(face.style), weight}, url, 0);
}

}  // namespace qorvex::layout
