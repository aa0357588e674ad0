// compare-pictures A B [--threshold N] [--allow PERCENT] [--difference OUT]: prints the share of pixels that
// have a channel which differs by more than N (8), in percent. Exit 0; 1 when that is above PERCENT (0.1) or
// the sizes differ; 2 for a file or an argument that cannot be used. OUT shows the first picture pale,
// differences in red, and darker the larger they are.
#include <png.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <vector>

namespace {

struct Picture {
    uint32_t width = 0, height = 0;
    std::vector<uint8_t> rgb;

    bool Read(const char* file) {
        png_image image = {};
        image.version = PNG_IMAGE_VERSION;
        if (!png_image_begin_read_from_file(&image, file)) return false;
        image.format = PNG_FORMAT_RGB;
        width = image.width, height = image.height;
        rgb.resize(PNG_IMAGE_SIZE(image));
        const png_color white = {255, 255, 255};
        return png_image_finish_read(&image, &white, rgb.data(), 0, nullptr) != 0;
    }
    bool Write(const char* file) const {
        png_image image = {};
        image.version = PNG_IMAGE_VERSION;
        image.width = width, image.height = height;
        image.format = PNG_FORMAT_RGB;
        return png_image_write_to_file(&image, file, 0, rgb.data(), 0, nullptr) != 0;
    }
};

int Distance(const uint8_t* a, const uint8_t* b) {
    return std::max({std::abs(a[0] - b[0]), std::abs(a[1] - b[1]), std::abs(a[2] - b[2])});
}

void MarkDifference(const uint8_t* pixel, int distance, int threshold, uint8_t* out) {
    if (distance > threshold) {
        out[0] = uint8_t(255 - distance / 2);
        out[1] = out[2] = 0;
        return;
    }
    const int grey = (pixel[0] + pixel[1] + pixel[2]) / 3;
    std::fill(out, out + 3, uint8_t(224 + grey / 8));
}

int Refuse(const char* what, const char* name) {
    std::fprintf(stderr, "compare-pictures: %s: %s\n", name, what);
    return 2;
}

}  // namespace

int main(int argc, char** argv) {
    const char* files[2] = {};
    const char* difference = nullptr;
    int threshold = 8, count = 0;
    double allowed = 0.1;
    for (int i = 1; i < argc; ++i) {
        const bool more = i + 1 < argc;
        if (more && std::strcmp(argv[i], "--threshold") == 0)
            threshold = std::atoi(argv[++i]);
        else if (more && std::strcmp(argv[i], "--allow") == 0)
            allowed = std::atof(argv[++i]);
        else if (more && std::strcmp(argv[i], "--difference") == 0)
            difference = argv[++i];
        else if (count < 2 && argv[i][0] != '-')
            files[count++] = argv[i];
        else
            return Refuse("unknown argument", argv[i]);
    }
    if (count < 2) return Refuse("two pictures, please", "usage");
    Picture a, b;
    if (!a.Read(files[0])) return Refuse("is no readable PNG", files[0]);
    if (!b.Read(files[1])) return Refuse("is no readable PNG", files[1]);
    if (a.width != b.width || a.height != b.height) {
        std::printf("%ux%u against %ux%u\n", a.width, a.height, b.width, b.height);
        return 1;
    }
    Picture shown = a;
    size_t differing = 0;
    int largest = 0;
    for (size_t i = 0; i < a.rgb.size(); i += 3) {
        const int distance = Distance(&a.rgb[i], &b.rgb[i]);
        differing += distance > threshold;
        largest = std::max(largest, distance);
        MarkDifference(&a.rgb[i], distance, threshold, &shown.rgb[i]);
    }
    const double percent = 300.0 * double(differing) / double(std::max<size_t>(a.rgb.size(), 1));
    std::printf("%.3f%% of the pixels differ by more than %d, the largest difference is %d\n", percent,
                threshold, largest);
    if (difference && !shown.Write(difference)) return Refuse("cannot be written", difference);
    return percent > allowed ? 1 : 0;
}
