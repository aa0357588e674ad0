#include "hud_scene.h"

#include <cstring>
#include <random>
#include <string_view>

namespace qorvex::benchmarks {
namespace {

using namespace fresco;

class Dice {
  public:
    float Between(float low, float high) {
        return low + (high - low) * static_cast<float>(random_() % 10000) / 10000;
    }
    float Whole(int low, int high) {
        return static_cast<float>(low + static_cast<int>(random_() % static_cast<unsigned>(high - low + 1)));
    }
    Color Tint(float alpha) { return {Between(0, 1), Between(0, 1), Between(0, 1), alpha}; }

  private:
    std::mt19937 random_{20};
};

HudBox MakeBox(Dice& dice, const Rect& room, int index) {
    const float width = dice.Whole(60, 240), height = dice.Whole(24, 72);
    // Layout snaps boxes to whole pixels; animations do not.
    const float part = index % 5 == 0 ? 0.4f : 0;
    return {{room.x + dice.Whole(0, static_cast<int>(room.width - width) - 1) + part,
             room.y + dice.Whole(0, static_cast<int>(room.height - height) - 1) + part, 0, width, height},
            dice.Whole(4, 14),
            dice.Tint(index % 2 ? 1.0f : 0.75f)};
}

HudLabel MakeLabel(Dice& dice, IFont& font, const Rect& room) {
    constexpr std::string_view kText = "Ammo 120/360 Health 87 Shield recharging Objective: hold point B";
    constexpr std::size_t kLength = 20;
    HudLabel label{room.x + dice.Whole(0, static_cast<int>(room.width) - 240),
                   room.y + dice.Whole(20, static_cast<int>(room.height) - 10),
                   dice.Whole(12, 20),
                   dice.Tint(1),
                   {}};
    std::uint32_t codes[kLength], glyphs[kLength];
    float advances[kLength];
    const auto from = static_cast<std::size_t>(dice.Whole(0, static_cast<int>(kText.size() - kLength)));
    for (std::size_t i = 0; i < kLength; ++i)
        codes[i] = static_cast<unsigned char>(kText[from + i]);
    font.GetGlyphIndices(codes, kLength, glyphs);
    font.GetAdvances(glyphs, kLength, label.size, advances);
    float x = 0;
    for (std::size_t i = 0; i < kLength; ++i) {
        label.glyphs.push_back({glyphs[i], x, 0});
        x += advances[i];
    }
    return label;
}

HudGradient MakeGradient(Dice& dice, const Rect& room, int index) {
    HudGradient gradient{};
    const float width = dice.Whole(120, 300), height = dice.Whole(30, 80);
    gradient.rect = {dice.Whole(0, static_cast<int>(room.width - width)),
                     dice.Whole(0, static_cast<int>(room.height - height)), 0, width, height};
    const Rect& r = gradient.rect;
    gradient.radial = index % 5 == 4;
    switch (index % 5) {
        case 0:  // down, the most frequent on pages
        case 1:
            gradient.start = {r.x, r.y}, gradient.end = {r.x, r.y + height};
            break;
        case 2:
            gradient.start = {r.x, r.y}, gradient.end = {r.x + width, r.y};
            break;
        case 3:
            gradient.start = {r.x, r.y}, gradient.end = {r.x + width, r.y + height};
            break;
        default:
            gradient.start = {r.x + width / 2, r.y + height / 2}, gradient.end = {width / 2, width / 2};
    }
    const int stops = 2 + index % 2;
    for (int i = 0; i < stops; ++i) {
        const float alpha = index % 3 ? 1 : dice.Between(0.2f, 1);
        Color color = dice.Tint(alpha);
        color = {color.r * alpha, color.g * alpha, color.b * alpha, alpha};
        gradient.stops.push_back({static_cast<float>(i) / static_cast<float>(stops - 1), color});
    }
    return gradient;
}

// An icon: a disc with a soft edge over noise.
HudPicture MakePicture(int size, unsigned seed) {
    HudPicture picture{size, size, {}};
    std::mt19937 random(seed);
    for (int y = 0; y < size; ++y) {
        for (int x = 0; x < size; ++x) {
            const float dx = static_cast<float>(x) - static_cast<float>(size) / 2,
                        dy = static_cast<float>(y) - static_cast<float>(size) / 2;
            const float away = static_cast<float>(size * size) / 4 - dx * dx - dy * dy;
            const auto alpha = static_cast<std::uint32_t>(away < 0 ? 0 : away > 255 ? 255 : away);
            const std::uint32_t color = random();
            const auto channel = [&](int shift) { return (color >> shift & 255) * alpha / 255; };
            picture.pixels.push_back(channel(0) | channel(8) << 8 | channel(16) << 16 | alpha << 24);
        }
    }
    return picture;
}

}  // namespace

HudScene MakeHudScene(IFont& font) {
    Dice dice;
    HudScene scene;
    const Rect screen{0, 0, 0, HudScene::kWidth, HudScene::kHeight};
    scene.group = {1200, 600, 0, 600, 400};
    for (int i = 0; i < 270; ++i)
        scene.boxes.push_back(MakeBox(dice, screen, i));
    for (int i = 0; i < 30; ++i)
        scene.groupBoxes.push_back(MakeBox(dice, scene.group, i));
    for (int i = 0; i < 50; ++i)
        scene.gradients.push_back(MakeGradient(dice, screen, i));
    for (int i = 0; i < 90; ++i)
        scene.labels.push_back(MakeLabel(dice, font, screen));
    for (int i = 0; i < 10; ++i)
        scene.groupLabels.push_back(MakeLabel(dice, font, scene.group));
    for (const int size : {48, 64, 128, 256})
        scene.pictures.push_back(MakePicture(size, static_cast<unsigned>(size)));
    for (int i = 0; i < 50; ++i) {
        // Icons of four sizes to places from 40 to 96 pixels: some grow, most shrink.
        const float side = dice.Whole(40, 96);
        scene.images.push_back(
            {{dice.Whole(0, 1800), dice.Whole(0, 980), 0, side, side}, static_cast<std::uint32_t>(i) % 4});
    }
    for (int i = 0; i < 10; ++i)
        scene.shadows.push_back({{dice.Whole(0, 1600), dice.Whole(0, 860), 0, 308, 208}, 0});
    return scene;
}

}  // namespace qorvex::benchmarks
