// Seeded random changes of a page, as the statements of script that make them: styles of every kind of visual
// property, pictures, classes, tree, text and scrolling.
#pragma once

#include <random>
#include <string>
#include <utility>
#include <vector>

namespace qorvex::pages {

class RandomPage {
  public:
    RandomPage(uint32_t seed, bool animations) : random_(seed), animations_(animations) {}

    // The document before the first change. Its script knows dump(node), the tree as an array, and
    // build(array), which makes the body anew from one; scroll() then scrolls as in the array.
    static std::string Html();
    // The files beside the document, by name. Some that the changes name are not there or broken.
    static std::vector<std::pair<std::string, std::string>> Pictures();
    // The statements of one frame. The boxes are called b0, b1, ... and their number is bounded.
    std::string NextFrame();

  private:
    uint32_t Below(uint32_t bound) { return static_cast<uint32_t>(random_() % bound); }
    std::string Box() { return "$('b" + std::to_string(Below(boxes_)) + "')"; }
    std::string Place();
    std::string Style();
    std::string PictureUrl();
    std::string PictureChange();
    std::string TreeChange();
    std::string TextChange();
    std::string Change();

    std::mt19937 random_;
    bool animations_;
    uint32_t boxes_ = 8;
};

}  // namespace qorvex::pages
