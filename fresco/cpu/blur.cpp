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

// https://www.w3.org/TR/filter-effects-1/#feGaussianBlurElement: three boxes of d pixels.
void BlurLine(uint32_t* line, uint32_t* scratch, int count, float sigma, const Kernel& kernel) {
    if (sigma <= kExactSigma) {
        ConvolveLine(line, scratch, count, kernel);
        std::memcpy(line, scratch, size_t(count) * 4);
        return;
    }
    const int d = std::max(2, int(std::floor(sigma * 3 * std::sqrt(2 * 3.14159265) / 4 + 0.5)));
    const int half = d / 2;
    if (d & 1) {
        BoxLine(line, scratch, count, half, half);
        BoxLine(scratch, line, count, half, half);
        BoxLine(line, scratch, count, half, half);
    } else {
        BoxLine(line, scratch, count, half, half - 1);
        BoxLine(scratch, line, count, half - 1, half);
        BoxLine(line, scratch, count, half, half);
    }
    std::memcpy(line, scratch, size_t(count) * 4);
}

bool IsBlank(const uint32_t* line, int count) {
    uint32_t any = 0;
    for (int i = 0; i < count; ++i)
        any |= line[i];
    return any == 0;
}

// Columns are gathered into lines, a block of them at a time, so that each row is read in whole cache lines.
constexpr int kColumnBlock = 16;

void BlurColumns(const Bitmap& bitmap, float sigma, const Kernel& kernel, Vector<uint32_t>& lines,
                 uint32_t* scratch) {
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
            if (!IsBlank(line, height)) BlurLine(line, scratch, height, sigma, kernel);
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
        const Kernel kernel = sigmaX <= kExactSigma ? MakeGaussian(sigmaX) : Kernel{};
        for (int y = bitmap.bounds.y0; y < bitmap.bounds.y1; ++y) {
            uint32_t* line = bitmap.Row(y) + bitmap.bounds.x0;
            if (!IsBlank(line, width)) BlurLine(line, scratch.data(), width, sigmaX, kernel);
        }
    }
    if (sigmaY > 0.05f) {
        const Kernel kernel = sigmaY <= kExactSigma ? MakeGaussian(sigmaY) : Kernel{};
        Vector<uint32_t> lines(size_t(kColumnBlock) * size_t(height));
        BlurColumns(bitmap, sigmaY, kernel, lines, scratch.data());
    }
    return true;
}

}  // namespace fresco::cpu
