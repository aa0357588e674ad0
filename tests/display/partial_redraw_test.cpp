// Pixels of frames that repaint only what changed, against full repaints of the same page.
#include "display/dump.h"
#include "display/recording.h"

#include <fresco/rendering_library.h>

#include <random>

namespace qorvex::test {
namespace {

using layout::LayoutHandle;

class PartialRedrawTest : public RecordTest {
  protected:
    static constexpr uint32_t kWidth = 200;
    static constexpr uint32_t kHeight = 150;

    PartialRedrawTest() : renderer_(fresco::IRenderingLibrary::Initialize({})) {
        page.viewWidth = kWidth;
        page.viewHeight = kHeight;
        renderer_->RegisterRenderThread(nullptr, nullptr, 0);
    }
    ~PartialRedrawTest() override {
        for (Target* target : {&part_, &full_}) {
            if (target->scene == nullptr) continue;
            target->scene->Finish();
            target->scene->Destroy();
        }
        frame = {};
        renderer_->Destroy();
    }

    struct Target {
        std::vector<uint32_t> pixels = std::vector<uint32_t>(kWidth * kHeight);
        fresco::CpuRenderTarget color;
        fresco::IScene* scene = nullptr;
    };

    void Paint(Target& target, const dsp::FrameRecord& record) {
        if (target.scene == nullptr) {
            target.scene = renderer_->CreateScene({});
            target.color = {target.pixels.data(), kWidth, kHeight, kWidth * 4};
            fresco::RenderTargetDescription description;
            description.color = {kWidth, kHeight, 1, 256};
            target.scene->SetRenderTarget(&target.color, nullptr, description);
        }
        target.scene->ExecuteFrontEnd(record.resourceBuffers.data(), record.resourceBuffers.size());
        target.scene->ExecuteBackEnd(record.buffers.data(), record.buffers.size());
        target.scene->FreeSurfaces(record.surfacesToFree.data(), record.surfacesToFree.size());
    }

    // One frame on both targets; the first pixel that differs, or -1.
    long Frame() {
        page.Frame();
        Paint(part_, Record());
        page.dirty.Add(layout::MakeRect(0, 0, kWidth, kHeight));
        std::fill(full_.pixels.begin(), full_.pixels.end(), 0x12345678u);
        Paint(full_, Record());
        for (size_t i = 0; i < full_.pixels.size(); ++i) {
            if (part_.pixels[i] != full_.pixels[i]) return static_cast<long>(i);
        }
        return -1;
    }

  private:
    fresco::IRenderingLibrary* renderer_;
    Target part_;
    Target full_;
};

class RandomPartialRedraw : public PartialRedrawTest, public ::testing::WithParamInterface<unsigned> {};

TEST_P(RandomPartialRedraw, ChangesPaintLikeFullFrames) {
    const char* styles[] = {
        "background-color: rgba(200, 40, 30, 0.6)",
        "background-color: #2288cc",
        "border: 3px solid black",
        "border: 1px solid white; border-left-color: red; border-radius: 9px",
        "border-radius: 50%",
        "box-shadow: 3px 4px 6px 1px rgba(0, 0, 0, 0.7)",
        "box-shadow: inset 2px 2px 5px black, 0 0 0 3px green",
        "box-shadow: none",
        "background-image: linear-gradient(45deg, red, blue)",
        "background-image: radial-gradient(white, black)",
        "transform: rotate(20deg) scale(1.3)",
        "transform: translateX(7.5px)",
        "transform: none",
        "opacity: 0.4",
        "opacity: 1",
        "filter: blur(3px)",
        "filter: none",
        "mix-blend-mode: multiply",
        "mix-blend-mode: normal",
        "clip-path: circle(40%)",
        "clip-path: none",
        "mask-image: linear-gradient(black, transparent)",
        "mask-image: none",
        "perspective: 80px",
        "transform: rotateY(40deg) translateZ(5px)",
        "filter: drop-shadow(4px 3px 2px black)",
        "overflow: hidden",
        "overflow: visible",
        "z-index: -1",
        "z-index: 2",
        "z-index: auto",
        "position: static",
        "visibility: hidden",
        "visibility: visible",
    };
    std::mt19937 random(GetParam());
    auto number = [&](uint32_t below) { return static_cast<uint32_t>(random() % below); };
    std::vector<LayoutHandle*> boxes{page.body};
    auto place = [&] {
        char style[160];
        std::snprintf(style, sizeof(style),
                      "position: %s; left: %d.%dpx; top: %dpx; width: %dpx; height: %dpx",
                      number(2) ? "absolute" : "relative", static_cast<int>(number(140)), number(10),
                      static_cast<int>(number(90)), 8 + number(70), 8 + number(50));
        return std::string(style);
    };
    page.Change(page.root, "background-color: #eeeeee");
    for (int step = 0; step < 200; ++step) {
        for (uint32_t edit = 1 + number(3); edit > 0; --edit) {
            LayoutHandle* box = boxes[number(4) == 0 ? 0 : number(static_cast<uint32_t>(boxes.size()))];
            if (!box->data().inTree) continue;
            const uint32_t choice = number(10);
            if (choice == 0 && box != page.body) {
                page.tree.Remove(*box, &page.dirty);
            } else if (choice <= 2 && boxes.size() < 60) {
                boxes.push_back(page.Add(box, place() + "; " + styles[number(2)]));
            } else if (choice == 3) {
                page.tree.SetScroll(*box, {0, static_cast<float>(number(40))});
            } else if (choice <= 6 && box != page.body) {
                page.Change(box, place());
            } else if (box != page.body) {
                page.Change(box, styles[number(std::size(styles))]);
            }
        }
        const long different = Frame();
        ASSERT_EQ(different, -1) << "step " << step << " at " << different % kWidth << ", "
                                 << different / kWidth << "\n"
                                 << dsp::DumpStackingContexts(*page.root).view();
    }
}

INSTANTIATE_TEST_SUITE_P(Seeds, RandomPartialRedraw, ::testing::Range(1u, 9u));

}  // namespace
}  // namespace qorvex::test
