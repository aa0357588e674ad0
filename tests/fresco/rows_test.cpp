// The vector ways of the row loops against the plain one, bit for bit.
#include "fresco/cpu/rows.h"

#include <gtest/gtest.h>

#include <functional>
#include <random>
#include <vector>

#include <fresco/paint.h>

namespace fresco::cpu {
namespace {

constexpr int kMax = 150;

// Inputs of one round: rows with blank, opaque and ordinary pixels, masks with runs of 0 and 255.
struct Sample {
    std::mt19937 random;
    uint32_t dst[kMax], src[kMax * 2], other[kMax * 2];
    uint8_t mask[kMax];
    int count;

    explicit Sample(unsigned seed) : random(seed) {
        for (uint32_t& p : dst)
            p = Pixel();
        const unsigned kind = random() % 4;
        for (uint32_t& p : src)
            p = kind == 0 ? 0 : kind == 1 ? Pixel() | 0xFF000000u : Pixel();
        for (uint32_t& p : other)
            p = Pixel();
        for (uint8_t& m : mask)
            m = uint8_t(kind == 0 ? 0 : kind == 1 ? 255 : random());
        count = int(random() % kMax);
    }
    uint32_t Pixel() {
        const uint32_t a = random() % 4 == 0 ? (random() % 2) * 255 : random() % 256;
        const auto c = [&] { return a ? random() % (a + 1) : 0; };
        return c() | c() << 8 | c() << 16 | a << 24;
    }
    float Unit() { return float(random() % 1000) / 1000; }
};

using Run = std::function<void(const RowLoops&, Sample&)>;

void ExpectEqualWays(const char* name, const Run& run) {
    for (const RowWay way : {RowWay::Sse2, RowWay::Avx2, RowWay::Avx512}) {
        const RowLoops* loops = GetRowLoops(way);
        if (!loops) continue;
        for (unsigned seed = 0; seed < 300; ++seed) {
            Sample plain(seed), wide(seed);
            run(*GetRowLoops(RowWay::Plain), plain);
            run(*loops, wide);
            for (int i = 0; i < kMax; ++i)
                ASSERT_EQ(wide.dst[i], plain.dst[i])
                    << name << " way " << int(way) << " seed " << seed << " at " << i;
        }
    }
}

}  // namespace

TEST(RowLoops, BlendsAndScalesAreEqualInEveryWay) {
    ExpectEqualWays("Fill", [](const RowLoops& l, Sample& r) { l.Fill(r.dst, r.count, r.Pixel()); });
    ExpectEqualWays("BlendSolid",
                    [](const RowLoops& l, Sample& r) { l.BlendSolid(r.dst, r.count, r.Pixel()); });
    ExpectEqualWays("BlendSolidMask", [](const RowLoops& l, Sample& r) {
        l.BlendSolidMask(r.dst, r.count, r.Pixel(), r.mask);
    });
    ExpectEqualWays("BlendSolidMasks", [](const RowLoops& l, Sample& r) {
        const int width = std::min(r.count, 24);
        l.BlendSolidMasks(r.dst, 30, width, 3, r.Pixel(), r.mask, size_t(width));
    });
    ExpectEqualWays("BlendRow", [](const RowLoops& l, Sample& r) {
        l.BlendRow(r.dst, r.src, r.count, r.random() % 2 ? 255 : r.random() % 256);
    });
    ExpectEqualWays("BlendRowMask",
                    [](const RowLoops& l, Sample& r) { l.BlendRowMask(r.dst, r.src, r.count, r.mask); });
    ExpectEqualWays("Scale", [](const RowLoops& l, Sample& r) { l.Scale(r.dst, r.count, r.random() % 256); });
    ExpectEqualWays("ScaleByMask",
                    [](const RowLoops& l, Sample& r) { l.ScaleByMask(r.dst, r.count, r.mask); });
    ExpectEqualWays("ScaleByAlpha",
                    [](const RowLoops& l, Sample& r) { l.ScaleByAlpha(r.dst, r.src, r.count); });
    for (uint32_t mode = kBlendMultiply; mode <= kBlendExclusion; ++mode) {
        ExpectEqualWays("BlendSeparable", [mode](const RowLoops& l, Sample& r) {
            l.BlendSeparable(mode, r.dst, r.src, r.count);
        });
    }
    ExpectEqualWays("BlendOperator", [](const RowLoops& l, Sample& r) {
        l.BlendOperator(r.dst, r.src, r.count, BlendFactor(r.random() % 4), BlendFactor(r.random() % 4));
    });
    ExpectEqualWays("MixByMask",
                    [](const RowLoops& l, Sample& r) { l.MixByMask(r.dst, r.src, r.count, r.mask); });
    ExpectEqualWays("MultiplyMask", [](const RowLoops& l, Sample& r) {
        l.MultiplyMask(reinterpret_cast<uint8_t*>(r.dst), reinterpret_cast<uint8_t*>(r.src), r.count * 4);
    });
    ExpectEqualWays("ScaleMask", [](const RowLoops& l, Sample& r) {
        l.ScaleMask(reinterpret_cast<uint8_t*>(r.dst), reinterpret_cast<uint8_t*>(r.src), r.count * 4,
                    r.random() % 256);
    });
    ExpectEqualWays("Premultiply", [](const RowLoops& l, Sample& r) {
        for (uint32_t& p : r.dst)
            p = r.random();
        l.Premultiply(r.dst, r.count);
    });
    ExpectEqualWays("SwapRedAndBlue", [](const RowLoops& l, Sample& r) { l.SwapRedAndBlue(r.dst, r.count); });
}

// Their loops go by the cache lines of both rows.
TEST(RowLoops, LongRowsBlendEquallyWhereverTheyLie) {
    for (unsigned place = 0; place < 16 * 16; ++place) {
        const size_t to = place % 16, from = place / 16, count = 300 + place % 67;
        Sample random(place);
        std::vector<uint32_t> src(from + count), dst(to + count);
        // Runs of equal kinds: whole registers are blank or opaque.
        for (size_t i = 0; i < src.size(); ++i)
            src[i] = i % 150 < 80 ? random.Pixel() : i % 150 < 115 ? 0 : random.Pixel() | 0xFF000000u;
        for (uint32_t& p : dst)
            p = random.Pixel();
        for (const uint32_t alpha : {255u, 99u}) {
            std::vector<uint32_t> expected = dst;
            GetRowLoops(RowWay::Plain)->BlendRow(expected.data() + to, src.data() + from, int(count), alpha);
            for (const RowWay way : {RowWay::Sse2, RowWay::Avx2, RowWay::Avx512}) {
                if (!GetRowLoops(way)) continue;
                std::vector<uint32_t> wide = dst;
                GetRowLoops(way)->BlendRow(wide.data() + to, src.data() + from, int(count), alpha);
                ASSERT_EQ(wide, expected) << "way " << int(way) << " place " << place << " alpha " << alpha;
            }
        }
    }
}

TEST(RowLoops, SamplesAndGradientsAreEqualInEveryWay) {
    ExpectEqualWays("MixRows", [](const RowLoops& l, Sample& r) {
        l.MixRows(r.dst, r.src, r.other, r.count, r.random() % 256);
    });
    ExpectEqualWays("SampleColumns", [](const RowLoops& l, Sample& r) {
        int32_t offsets[kMax];
        ColumnSample samples[kMax];
        for (int i = 0; i < kMax; ++i) {
            offsets[i] = int32_t(r.random() % (kMax - 1));
            const auto weight = uint16_t(r.random() % 256);
            for (int k = 0; k < 8; ++k)
                samples[i].weights[k] = k < 4 ? uint16_t(256 - weight) : weight;
        }
        l.SampleColumns(r.dst, r.src, offsets, samples, r.count);
    });
    ExpectEqualWays("SampleTexels", [](const RowLoops& l, Sample& r) {
        TexelSample samples[kMax];
        for (TexelSample& s : samples) {
            const auto at = [&] { return int32_t(r.random() % kMax); };
            s = {{at(), at()}, {at(), at()}, uint16_t(r.random() % 256), uint16_t(r.random() % 256)};
        }
        l.SampleTexels(r.dst, r.src, samples, r.count);
    });
    const auto walk = [](Sample& r) {
        GradientWalk w{};
        w.colors = r.other, w.last = kMax - 2, w.spread = r.random() % 3;
        const float reach = r.random() % 8 == 0 ? 1e9f : 300;
        w.u = (r.Unit() - 0.5f) * reach, w.du = (r.Unit() - 0.5f) * 9;
        w.v = (r.Unit() - 0.5f) * reach, w.dv = (r.Unit() - 0.5f) * 9;
        return w;
    };
    ExpectEqualWays("LinearGradient", [&](const RowLoops& l, Sample& r) {
        l.LinearGradient(r.dst, int(r.random() % 4000) - 2000, r.count, walk(r));
    });
    ExpectEqualWays("RadialGradient", [&](const RowLoops& l, Sample& r) {
        l.RadialGradient(r.dst, int(r.random() % 4000) - 2000, r.count, walk(r));
    });
    ExpectEqualWays("Ramp", [](const RowLoops& l, Sample& r) {
        float start[4], step[4];
        for (int c = 0; c < 4; ++c)
            start[c] = r.Unit() * 300 - 20, step[c] = r.Unit() * 4 - 2;
        l.Ramp(r.dst, r.count, start, step);
    });
}

TEST(RowLoops, FiltersAreEqualInEveryWay) {
    ExpectEqualWays("ApplyMatrix", [](const RowLoops& l, Sample& r) {
        ColorMatrix matrix;
        const float reach = r.random() % 8 == 0 ? 3e38f : 2;
        for (float& m : matrix.m)
            m = (r.Unit() - 0.4f) * reach;
        l.ApplyMatrix(r.dst, r.count, matrix);
    });
    ExpectEqualWays("BoxBlur", [](const RowLoops& l, Sample& r) {
        l.BoxBlur(r.dst, r.src, r.count, int(r.random() % 90), int(r.random() % 90));
    });
    ExpectEqualWays("Convolve", [](const RowLoops& l, Sample& r) {
        const int taps = 2 + 2 * int(r.random() % 6);
        int16_t weights[12] = {};
        int left = 16384;
        for (int k = 0; k < taps; ++k) {
            weights[k] = int16_t(k + 1 == taps ? left : int(r.random()) % (left / 2 + 1));
            if (weights[k] < 0) weights[k] = 0;
            left -= weights[k];
        }
        l.Convolve(r.dst, r.src, r.count, weights, taps);
    });
}

}  // namespace fresco::cpu
