// CodecBench.cpp: measures the speed of reading and writing image files, in megapixels a second, and the
// sizes of files. There are two pictures of 2048 x 2048: sparse pen strokes on transparency, and a smooth
// picture with grain. DecodeSrgb and DecodeP3 read the latter with an sRGB and a Display P3 profile; Decode
// reads it without a profile. Files are in memory if the system supports it, so that the disk is not
// measured.
#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "tests/support/ColorProfiles.h"

#include <algorithm>
#include <benchmark/benchmark.h>
#include <cmath>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <random>
#include <string>
#include <unistd.h>
#include <vector>

namespace {

using Moka::Bitmap;
using Moka::BitmapFactory;
using Moka::String;

constexpr int kSide = 2048;
using Pixels = std::vector<unsigned char>;

// Draws a disc with a soft edge, one pixel wide.
void Dab(Pixels& pixels, double x, double y, double radius, unsigned char const (&colour)[3]) {
    for (int v = std::max(0, static_cast<int>(y - radius)); v < std::min<double>(kSide, y + radius + 1);
         ++v) {
        for (int u = std::max(0, static_cast<int>(x - radius)); u < std::min<double>(kSide, x + radius + 1);
             ++u) {
            double const cover = std::clamp(radius - std::hypot(u - x, v - y) + 0.5, 0.0, 1.0);
            unsigned char* const pixel = &pixels[static_cast<std::size_t>(v * kSide + u) * 4];
            double const alpha = std::max<double>(pixel[3], 255 * cover);
            for (int c = 0; c < 3; ++c) pixel[c] = static_cast<unsigned char>(colour[c] * alpha / 255);
            pixel[3] = static_cast<unsigned char>(alpha);
        }
    }
}

Pixels MakeInkPage() {
    Pixels pixels(std::size_t{kSide} * kSide * 4);
    std::mt19937 random(3);
    std::uniform_real_distribution<double> unit(0, 1);
    constexpr unsigned char kColours[][3] = {{20, 20, 40}, {30, 60, 200}, {200, 30, 30}};
    for (int stroke = 0; stroke < 400; ++stroke) {
        double x = unit(random) * kSide;
        double y = unit(random) * kSide;
        double direction = unit(random) * 6.3;
        double const bend = (unit(random) - 0.5) * 0.2;
        for (int step = 0; step < 80; ++step) {
            double const pressure = std::sin(step * 3.14159 / 80);
            Dab(pixels, x, y, 1 + 2 * pressure, kColours[stroke % 3]);
            x += 1.5 * std::cos(direction);
            y += 1.5 * std::sin(direction);
            direction += bend;
        }
    }
    return pixels;
}

Pixels MakePhoto() {
    Pixels pixels;
    pixels.reserve(std::size_t{kSide} * kSide * 4);
    std::mt19937 random(5);
    for (int y = 0; y < kSide; ++y) {
        for (int x = 0; x < kSide; ++x) {
            double const light = 120 + 50 * std::sin(x * 0.004) * std::cos(y * 0.007) +
                                 30 * std::sin(x * 0.05 + y * 0.03) + static_cast<double>(random() % 12);
            pixels.push_back(static_cast<unsigned char>(light));
            pixels.push_back(static_cast<unsigned char>(light * 0.8 + 20));
            pixels.push_back(static_cast<unsigned char>(200 - light * 0.6));
            pixels.push_back(255);
        }
    }
    return pixels;
}

enum Picture { kInk, kPhoto };

Bitmap& GetBitmap(Picture picture) {
    static Pixels pixels[2] = {MakeInkPage(), MakePhoto()};
    static Bitmap bitmaps[2];
    Bitmap& bitmap = bitmaps[picture];
    if (!bitmap.GetBuffer())
        bitmap.Construct(pixels[picture].data(), kSide, kSide, kSide * 4, 1, false, false);
    return bitmap;
}

// A temporary folder, removed when the program ends.
struct Folder {
    Folder() {
        std::filesystem::path const memory = "/dev/shm";
        bool const hasMemory = access(memory.c_str(), W_OK) == 0;
        path = (hasMemory ? memory : std::filesystem::temp_directory_path()) /
               ("moka-codec-bench-" + std::to_string(getpid()));
        std::filesystem::create_directories(path);
    }
    ~Folder() { std::filesystem::remove_all(path); }
    std::filesystem::path path;
};

std::string PathFor(Picture picture, char const* extension, int quality) {
    static Folder const folder;
    return folder.path / (std::to_string(picture) + "-" + std::to_string(quality) + "." + extension);
}

void Report(benchmark::State& state, std::string const& path) {
    state.counters["MP/s"] =
        benchmark::Counter(kSide * kSide / 1e6, benchmark::Counter::kIsIterationInvariantRate);
    state.counters["KiB"] = static_cast<double>(std::filesystem::file_size(path)) / 1024;
}

void Encode(benchmark::State& state, Picture picture, char const* extension, int quality) {
    std::string const path = PathFor(picture, extension, quality);
    String const text(path);
    Bitmap const& bitmap = GetBitmap(picture);
    for (auto _ : state) {
        if (!BitmapFactory::SaveBitmap(&bitmap, &text, quality)) return state.SkipWithError("cannot save");
    }
    Report(state, path);
}

// Decodes to a square of this side. With the picture's own side it is not scaled.
void Decode(benchmark::State& state, Picture picture, char const* extension, int quality, int side) {
    std::string const path = PathFor(picture, extension, quality);
    String const text(path);
    BitmapFactory::SaveBitmap(&GetBitmap(picture), &text, quality);
    for (auto _ : state) {
        std::unique_ptr<Bitmap> const bitmap(BitmapFactory::CreateBitmap(&text, side, side));
        if (!bitmap) return state.SkipWithError("cannot read");
        benchmark::DoNotOptimize(bitmap->GetBuffer());
    }
    Report(state, path);
}

void DecodeProfiled(benchmark::State& state, char const* extension, char const* profile) {
    std::string const path = PathFor(kPhoto, extension, 100);
    String const text(path);
    BitmapFactory::SaveBitmap(&GetBitmap(kPhoto), &text, 100);
    std::ifstream plain(path, std::ios::binary);
    std::string const bytes(std::istreambuf_iterator<char>(plain), {});
    std::string const name = path + ".profiled";
    std::ofstream(name, std::ios::binary)
        << Moka::Testing::EmbedProfile(bytes, Moka::Testing::ReadProfile(profile));
    String const profiled(name);
    for (auto _ : state) {
        std::unique_ptr<Bitmap> const bitmap(BitmapFactory::CreateBitmapForGraphics(&profiled));
        if (!bitmap) return state.SkipWithError("cannot read");
        benchmark::DoNotOptimize(bitmap->GetBuffer());
    }
    Report(state, name);
}

int RegisterAll() {
    struct {
        char const* name;
        char const* extension;
        int quality;
    } const formats[] = {{"png", "png", 100},    {"jpeg90", "jpg", 90},         {"jpeg100", "jpg", 100},
                         {"webp80", "webp", 80}, {"webpLossless", "webp", 100}, {"mki", "mki", 100}};
    for (Picture const picture : {kInk, kPhoto}) {
        std::string const kind = picture == kInk ? "/ink/" : "/photo/";
        for (auto const& format : formats) {
            auto const add = [&](std::string const& name, auto function, auto... arguments) {
                benchmark::RegisterBenchmark((name + kind + format.name).c_str(), function, picture,
                                             format.extension, format.quality, arguments...)
                    ->Unit(benchmark::kMillisecond);
            };
            add("Encode", Encode);
            add("Decode", Decode, kSide);
            add("DecodeTo256", Decode, 256);
            add("DecodeTo1500", Decode, 1500);
        }
    }
    for (char const* const extension : {"png", "jpg", "webp"}) {
        auto const add = [&](char const* name, char const* profile) {
            benchmark::RegisterBenchmark((name + std::string("/photo/") + extension + "100").c_str(),
                                         DecodeProfiled, extension, profile)
                ->Unit(benchmark::kMillisecond);
        };
        add("DecodeSrgb", "srgb");
        add("DecodeP3", "p3");
    }
    return 0;
}

int const registered = RegisterAll();

} // namespace
