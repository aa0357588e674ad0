#include "fresco/cpu/filters.h"

namespace fresco::cpu {
namespace {

// Radii above this look the same as this on any surface there can be.
constexpr float kMaxSigma = 4096;

struct Kernel {
    Vector<uint32_t> weights;  // sum is 1 << 16; odd count
};

Kernel MakeGaussian(float sigma) {
    const int radius = std::max(1, int(std::ceil(sigma * 3)));
    Vector<double> raw;
    double sum = 0;
    for (int i = -radius; i <= radius; ++i) {
        raw.push_back(std::exp(-double(i) * i / (2.0 * sigma * sigma)));
        sum += raw.back();
    }
    Kernel kernel;
    uint32_t total = 0;
    for (const double w : raw) {
        kernel.weights.push_back(uint32_t(w / sum * 65536 + 0.5));
        total += kernel.weights.back();
    }
    kernel.weights[size_t(radius)] += 65536u - total;  // the middle takes what rounding left over
    return kernel;
}

struct Sums {
    uint32_t r = 0, g = 0, b = 0, a = 0;

    void Add(uint32_t p, uint32_t w) {
        r += (p & 255) * w, g += (p >> 8 & 255) * w, b += (p >> 16 & 255) * w, a += (p >> 24) * w;
    }
    uint32_t Shifted() const {
        const auto byte = [](uint32_t v) { return (v + 32768) >> 16; };
        return byte(r) | byte(g) << 8 | byte(b) << 16 | byte(a) << 24;
    }
};

// One line through the kernel; beyond its ends all is transparent.
void ConvolveLine(const uint32_t* from, uint32_t* to, int count, const Kernel& kernel) {
    const int radius = int(kernel.weights.size() / 2);
    for (int i = 0; i < count; ++i) {
        Sums sums;
        const int first = std::max(0, i - radius), last = std::min(count - 1, i + radius);
        for (int k = first; k <= last; ++k) {
            if (from[k]) sums.Add(from[k], kernel.weights[size_t(k - i + radius)]);
        }
        to[i] = sums.Shifted();
    }
}

// A running mean over `before` pixels to the left, the pixel itself and `after` to the right.
void BoxLine(const uint32_t* from, uint32_t* to, int count, int before, int after) {
    const uint64_t size = uint64_t(before + after + 1);
    const uint64_t reciprocal = ((uint64_t(1) << 32) + size / 2) / size;
    uint32_t r = 0, g = 0, b = 0, a = 0;
    const auto step = [&](uint32_t p, uint32_t sign) {
        r += (p & 255) * sign, g += (p >> 8 & 255) * sign, b += (p >> 16 & 255) * sign, a += (p >> 24) * sign;
    };
    for (int i = 0; i < std::min(after, count); ++i)
        step(from[i], 1);
    for (int i = 0; i < count; ++i) {
        if (i + after < count) step(from[i + after], 1);
        if (i - before - 1 >= 0) step(from[i - before - 1], ~0u);
        const auto mean = [&](uint32_t sum) {
            return uint32_t((sum * reciprocal + (uint64_t(1) << 31)) >> 32);
        };
        to[i] = mean(r) | mean(g) << 8 | mean(b) << 16 | mean(a) << 24;
    }
}

// Three boxes whose variances add up to the Gaussian's as nearly as whole pixels allow: two of one size,
// which may be even (they lean to opposite sides), and an odd one. Equal boxes alone miss the width by up to
// a tenth.
struct Boxes {
    int pair = 1, single = 1;
};

Boxes ChooseBoxes(float sigma) {
    const double target = 12.0 * sigma * sigma + 3;  // sum of the squared sizes
    const int middle = int(std::sqrt(target / 3));
    Boxes best;
    double bestMiss = 1e30;
    for (int pair = std::max(1, middle - 2); pair <= middle + 2; ++pair) {
        for (int single = std::max(1, middle - 3) | 1; single <= middle + 4; single += 2) {
            const double miss = std::abs(2.0 * pair * pair + double(single) * single - target);
            if (miss < bestMiss) best = {pair, single}, bestMiss = miss;
        }
    }
    return best;
}

struct LineBlur {
    float sigma;
    Kernel kernel;  // of small radii
    Boxes boxes;    // of the others

    explicit LineBlur(float s) : sigma(s) {
        if (sigma <= kExactSigma)
            kernel = MakeGaussian(sigma);
        else
            boxes = ChooseBoxes(sigma);
    }
    void Run(uint32_t* line, uint32_t* scratch, int count) const {
        if (sigma <= kExactSigma) {
            ConvolveLine(line, scratch, count, kernel);
        } else {
            const int half = boxes.pair / 2, odd = boxes.pair & 1, rest = boxes.single / 2;
            BoxLine(line, scratch, count, half, half - 1 + odd);
            BoxLine(scratch, line, count, half - 1 + odd, half);
            BoxLine(line, scratch, count, rest, rest);
        }
        std::memcpy(line, scratch, size_t(count) * 4);
    }
};

bool IsBlank(const uint32_t* line, int count) {
    uint32_t any = 0;
    for (int i = 0; i < count; ++i)
        any |= line[i];
    return any == 0;
}

// Columns are gathered into lines, a block of them at a time, so that each row is read in whole cache lines.
constexpr int kColumnBlock = 16;

void BlurColumns(const Bitmap& bitmap, const LineBlur& blur, Vector<uint32_t>& lines, uint32_t* scratch) {
    const int height = bitmap.bounds.Height();
    for (int x0 = bitmap.bounds.x0; x0 < bitmap.bounds.x1; x0 += kColumnBlock) {
        const int block = std::min(kColumnBlock, bitmap.bounds.x1 - x0);
        for (int y = 0; y < height; ++y) {
            const uint32_t* row = bitmap.Row(bitmap.bounds.y0 + y) + x0;
            for (int i = 0; i < block; ++i)
                lines[size_t(i) * size_t(height) + size_t(y)] = row[i];
        }
        for (int i = 0; i < block; ++i) {
            uint32_t* line = lines.data() + size_t(i) * size_t(height);
            if (!IsBlank(line, height)) blur.Run(line, scratch, height);
        }
        for (int y = 0; y < height; ++y) {
            uint32_t* row = bitmap.Row(bitmap.bounds.y0 + y) + x0;
            for (int i = 0; i < block; ++i)
                row[i] = lines[size_t(i) * size_t(height) + size_t(y)];
        }
    }
}

}  // namespace

int BlurExtent(float sigma) {
    if (!(sigma > 0)) return 0;
    // Three boxes reach 3 d / 2, which is just under 3 sigma.
    return int(std::ceil(std::min(sigma, kMaxSigma) * 3)) + 1;
}

bool Blur(const Bitmap& bitmap, float sigmaX, float sigmaY) {
    const int width = bitmap.bounds.Width(), height = bitmap.bounds.Height();
    if (width <= 0 || height <= 0) return true;
    sigmaX = std::min(sigmaX, kMaxSigma), sigmaY = std::min(sigmaY, kMaxSigma);
    Vector<uint32_t> scratch(size_t(std::max(width, height)));
    if (sigmaX > 0.05f) {
        const LineBlur blur(sigmaX);
        for (int y = bitmap.bounds.y0; y < bitmap.bounds.y1; ++y) {
            uint32_t* line = bitmap.Row(y) + bitmap.bounds.x0;
            if (!IsBlank(line, width)) blur.Run(line, scratch.data(), width);
        }
    }
    if (sigmaY > 0.05f) {
        const LineBlur blur(sigmaY);
        Vector<uint32_t> lines(size_t(kColumnBlock) * size_t(height));
        BlurColumns(bitmap, blur, lines, scratch.data());
    }
    return true;
}

}  // namespace fresco::cpu
