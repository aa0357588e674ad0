// What a node of a settled page costs, everything counted: the node, its display element and link, its layout
// handle, its share of style groups and of match states, its place in the lists of its parent, and Yoga's
// node.
#include <fresco/rendering_library.h>
#include <malloc.h>
#include <yoga/Yoga.h>

#include "css/style/style_fixture.h"
#include "display/dirty_region.h"
#include "dom/character_data.h"
#include "layout/fonts/font_manager.h"
#include "layout/perform_layout.h"

namespace qorvex::css::test {
namespace {

// A block of the heap costs more than was asked for.
constexpr size_t kBlockOverhead = 16;

size_t YogaNodeBytes() {
    YGNode* node = YGNodeNew();
    const size_t bytes = malloc_usable_size(node) + kBlockOverhead + sizeof(YGNode*);
    YGNodeFree(node);
    return bytes;
}

class Memory : public StyleTest {
  protected:
    // Bytes of one more node below the body, on average over many that a page grows by: what an earlier page
    // has left in the pools would count for nothing in a new one.
    size_t BytesOf(std::string_view node, std::string_view bodyDisplay, std::string_view sheet) {
        constexpr int kFew = 640, kMany = 1920;
        Load("", "body { display: " + std::string(bodyDisplay) + " } " + std::string(sheet));
        Body().SetInnerHTML(Rows(node, kFew));
        Settle();
        const size_t few = BytesInUse();
        Body().InsertAdjacentHTML("beforeend", Rows(node, kMany - kFew));
        Settle();
        return (BytesInUse() - few) / (kMany - kFew);
    }

    // What a text adds to the element around it. Elements find what others left in the pools both times.
    size_t BytesOfText() {
        const std::string_view sheet = ".row { color: red }";
        BytesOf("<div class='row'></div>", "simple", sheet);
        const size_t with = BytesOf("<div class='row'>0123456789</div>", "simple", sheet);
        const float width = FirstText().GetLayoutResult()->width;
        EXPECT_EQ(width > 10, host_->fonts != nullptr) << width;
        return with - BytesOf("<div class='row'></div>", "simple", sheet);
    }

  private:
    const dom::Node& FirstText() { return *Body().GetFirstChild()->GetFirstChild()->GetFirstChild(); }

    // In rows, so that the capacity of one long list does not count.
    static std::string Rows(std::string_view node, int count) {
        std::string rows;
        for (int i = 0; i < count; ++i)
            rows += (i % 20 ? "" : i ? "</section><section>" : "<section>") + std::string(node);
        return rows + "</section>";
    }

    size_t BytesInUse() {
        size_t flexNodes = 0;
        for (dom::Node* at = &Body(); at; at = at->GetNextInTree(&Body())) {
            if (const layout::LayoutHandle* handle = at->GetLayoutHandle())
                flexNodes += handle->node().flex != nullptr;
        }
        return allocator_.LiveBytes() + allocator_.LiveBlocks() * kBlockOverhead +
               flexNodes * YogaNodeBytes();
    }

    // Frames until the sets of changed nodes have given their memory back.
    void Settle() {
        for (int i = 0; i < 40; ++i) {
            Body().SetAttribute("title", i % 2 ? "a" : "b");
            Body().MarkStyleDirty();
            Solve();
            const layout::LayoutWork work = document_->UpdateLayoutStyles(false);
            layout::LayoutUpdatePtr update = MakeRef<layout::LayoutUpdateData>();
            document_->CommitLayout(*update, nullptr, nullptr);
            dsp::DirtyRegion dirty;
            layout::LayoutPass pass{*update, document_->GetLayoutTree().Root(), 800, 600, dirty};
            if (work == layout::LayoutWork::Layout) layout::PerformLayout(pass);
            layout::SyncTrees(*update);
        }
    }
};

constexpr std::string_view kSheet =
    ".row { display: flex; width: 50px; margin: 2px; padding: 4px; border: 1px solid red; color: blue }";

TEST_F(Memory, AStyledElementOfASimplePage) {
    const size_t bytes =
        BytesOf("<div class='row'></div>", "simple", ".row { width: 50px; padding: 4px; color: red }");
    RecordProperty("bytes", static_cast<int>(bytes));
    EXPECT_LT(bytes, 860u);
}

// Yoga's own node comes on top, and costs two thirds of all the rest.
TEST_F(Memory, AStyledElementOfAFlexPage) {
    const size_t bytes = BytesOf("<div class='row'></div>", "block", kSheet);
    RecordProperty("bytes", static_cast<int>(bytes));
    EXPECT_LT(bytes - YogaNodeBytes(), 905u);
}

TEST_F(Memory, ATextOfTenCharactersThatIsNotLaidOut) {
    const size_t bytes = BytesOfText();
    RecordProperty("bytes", static_cast<int>(bytes));
    EXPECT_LT(bytes, 400u);
}

class NoFiles final : public layout::IFontResourceLoader {
  public:
    TaskPtr RequestFont(const URL&, Callback) override { return nullptr; }
};

// With its lines and glyphs.
TEST_F(Memory, ATextOfTenCharacters) {
    fresco::IRenderingLibrary* library = fresco::CreateNullRenderingLibrary({});
    {
        TaskSystem tasks{TaskSystemSettings{}};
        NoFiles loader;
        layout::FontManager manager(
            {*library->GetFontService(), {1, &tasks}, loader, host_->strings, {nullptr, nullptr}, 2});
        host_->fonts = host_->fontManager = &manager;
        const size_t bytes = BytesOfText();
        RecordProperty("bytes", static_cast<int>(bytes));
        EXPECT_LT(bytes, 890u);
        Drop();
        host_->fonts = host_->fontManager = nullptr;
    }
    library->Destroy();
}

}  // namespace
}  // namespace qorvex::css::test
