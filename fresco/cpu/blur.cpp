#include "fresco/cpu/filters.h"

#include "fresco/cpu/rows.h"

namespace fresco::cpu {
namespace {

// More than this is drawn as this: a blur needs what lies three deviations outside of the clip, and that
// must stay a bounded piece of memory.
constexpr float kMaxSigma = 512;
// Less is not seen.
constexpr float kMinSigma = 0.05f;

// Weights of 1 / 16384 that add up to one; an even count, the last one is 0.
using Kernel = Vector<int16_t>;

Kernel MakeGaussian(float sigma) {
    const int radius = std::max(1, int(std::ceil(sigma * 3)));
    Vector<double> raw;
    double sum = 0;
    for (int i = -radius; i <= radius; ++i) {
        raw.push_back(std::exp(-double(i) * i / (2.0 * sigma * sigma)));
        sum += raw.back();
    }
    Kernel kernel;
    int total = 0;
    for (const double w : raw) {
        kernel.push_back(int16_t(w / sum * 16384 + 0.5));
        total += kernel.back();
    }
    kernel[size_t(radius)] = int16_t(kernel[size_t(radius)] + 16384 - total);  // what rounding left over
    kernel.push_back(0);
    return kernel;
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

// Blurs lines of pixels. A line lies in `room` with `pad` blank pixels on both sides.
class LineBlur {
  public:
    explicit LineBlur(float sigma) : exact_(sigma <= kExactSigma) {
        if (exact_)
            kernel_ = MakeGaussian(sigma);
        else
            boxes_ = ChooseBoxes(sigma);
        pad_ = exact_ ? int(kernel_.size()) / 2 : 0;
    }
    int pad() const { return pad_; }
    // From `line` to `out`; both are changed.
    void Run(uint32_t* line, uint32_t* out, int count) const {
        const RowLoops& rows = Rows();
        if (exact_) return rows.Convolve(out, line - (pad_ - 1), count, kernel_.data(), int(kernel_.size()));
        const int half = boxes_.pair / 2, odd = boxes_.pair & 1, rest = boxes_.single / 2;
        rows.BoxBlur(out, line, count, half, half - 1 + odd);
        rows.BoxBlur(line, out, count, half - 1 + odd, half);
        rows.BoxBlur(out, line, count, rest, rest);
    }

  private:
    bool exact_;
    Kernel kernel_;  // of small radii
    Boxes boxes_;    // of the others
    int pad_ = 0;
};

bool IsBlank(const uint32_t* line, int count) {
    uint32_t any = 0;
    for (int i = 0; i < count; ++i)
        any |= line[i];
    return any == 0;
}

// Scratch lines with room for the kernel's blank pixels on both sides.
struct Lines {
    Vector<uint32_t> pixels;
    int pad, pitch;

    Lines(int count, int length, int padding) : pad(padding + 2), pitch(length + 2 * pad) {
        pixels.resize(size_t(count) * size_t(pitch), 0);
    }
    uint32_t* At(int line) { return pixels.data() + size_t(line) * size_t(pitch) + pad; }
};

void BlurRows(const Bitmap& bitmap, const LineBlur& blur) {
    const int width = bitmap.bounds.Width();
    Lines lines(1, width, blur.pad());
    for (int y = bitmap.bounds.y0; y < bitmap.bounds.y1; ++y) {
        uint32_t* row = bitmap.Row(y) + bitmap.bounds.x0;
        if (IsBlank(row, width)) continue;
        std::memcpy(lines.At(0), row, size_t(width) * 4);
        blur.Run(lines.At(0), row, width);
    }
}

// Columns are gathered into lines, a block of them at a time, so that each row is read in whole cache lines.
constexpr int kColumnBlock = 16;

void BlurColumns(const Bitmap& bitmap, const LineBlur& blur) {
    const int height = bitmap.bounds.Height();
    Lines from(kColumnBlock, height, blur.pad()), to(kColumnBlock, height, 0);
    uint32_t *gathered[kColumnBlock], *blurred[kColumnBlock];
    for (int i = 0; i < kColumnBlock; ++i)
        gathered[i] = from.At(i), blurred[i] = to.At(i);
    for (int x0 = bitmap.bounds.x0; x0 < bitmap.bounds.x1; x0 += kColumnBlock) {
        const int block = std::min(kColumnBlock, bitmap.bounds.x1 - x0);
        uint32_t any[kColumnBlock] = {};
        for (int y = 0; y < height; ++y) {
            const uint32_t* row = bitmap.Row(bitmap.bounds.y0 + y) + x0;
            for (int i = 0; i < block; ++i)
                any[i] |= gathered[i][y] = row[i];
        }
        if (std::all_of(any, any + block, [](uint32_t column) { return column == 0; })) continue;
        for (int i = 0; i < block; ++i) {
            if (any[i] == 0)
                std::memset(blurred[i], 0, size_t(height) * 4);
            else
                blur.Run(gathered[i], blurred[i], height);
        }
        for (int y = 0; y < height; ++y) {
            uint32_t* row = bitmap.Row(bitmap.bounds.y0 + y) + x0;
            for (int i = 0; i < block; ++i)
                row[i] = blurred[i][y];
        }
    }
}

}  // namespace

int BlurExtent(float sigma) {
    if (!(sigma > 0)) return 0;
    // Three boxes reach 3 d / 2, which is just under 3 sigma.
    return int(std::ceil(std::min(sigma, kMaxSigma) * 3)) + 1;
}

void Blur(const Bitmap& bitmap, float sigmaX, float sigmaY) {
    if (bitmap.bounds.IsEmpty()) return;
    sigmaX = std::min(sigmaX, kMaxSigma), sigmaY = std::min(sigmaY, kMaxSigma);
    if (sigmaX > kMinSigma) BlurRows(bitmap, LineBlur(sigmaX));
    if (sigmaY > kMinSigma) BlurColumns(bitmap, LineBlur(sigmaY));
}

}  // namespace fresco::cpu
