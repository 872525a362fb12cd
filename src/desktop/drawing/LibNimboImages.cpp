// libnimbo-images.so: what ImagesPart.h declares.

#include <cairo.h>

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstring>

#include "desktop/drawing/ImagesPart.h"
#include "desktop/raii/CairoHandles.h"
#include "desktop/raii/JPEGDecoder.h"

namespace nimbo {

namespace {

constexpr std::string_view kPNGSignature = "\x89PNG\r\n\x1a\n", kJPEGSignature = "\xff\xd8\xff";

ErrorRef notShown(std::int64_t code, std::string reason) {
  return Error::errorWithDomain_code_reason(std::string(kDrawingErrorDomain), code, std::move(reason));
}
ErrorRef broken(const std::string& why) { return notShown(kDrawingErrorNotDrawn, "the image cannot be read: " + why); }

ErrorRef checkSize(std::uint64_t width, std::uint64_t height) {
  if (width == 0 || height == 0) return broken("it has no pixels");
  if (std::max(width, height) <= kLargestImageSide) return nullptr;
  return notShown(kDrawingErrorBadSize, "an image of " + std::to_string(width) + " by " + std::to_string(height) +
                                            " pixels is not shown: " + std::to_string(kLargestImageSide) +
                                            " a side are the most");
}

class DecodedPicture final : public Picture {
 public:
  explicit DecodedPicture(CairoSurfaceHandle surface) : _surface(std::move(surface)) {}
  int pixelWidth() const override { return cairo_image_surface_get_width(_surface.get()); }
  int pixelHeight() const override { return cairo_image_surface_get_height(_surface.get()); }
  double scale() const override { return 1; }
  int stride() const override { return cairo_image_surface_get_stride(_surface.get()); }
  std::span<const std::uint8_t> pixels() const override {
    return {cairo_image_surface_get_data(_surface.get()),
            static_cast<std::size_t>(stride()) * static_cast<std::size_t>(pixelHeight())};
  }

 private:
  CairoSurfaceHandle _surface;
};

/// The surface, if it is sound.
Outcome<CairoSurfaceHandle> sound(CairoSurfaceHandle surface) {
  const cairo_status_t status = cairo_surface_status(surface.get());
  if (status != CAIRO_STATUS_SUCCESS) return broken(cairo_status_to_string(status));
  return surface;
}

std::uint32_t bigEndianAt(std::string_view bytes, std::size_t place) {
  std::uint32_t number = 0;
  for (const char byte : bytes.substr(place, 4)) number = number << 8 | static_cast<std::uint8_t>(byte);
  return number;
}

Outcome<CairoSurfaceHandle> decodePNG(std::string_view file) {
  // Source: ISO/IEC 15948 (PNG), 11.2.2: the first chunk is IHDR, with width and height.
  constexpr std::size_t kType = 12, kWidth = 16, kHeight = 20, kEnd = 24;
  if (file.size() < kEnd || file.substr(kType, 4) != "IHDR") return broken("it has no header");
  if (ErrorRef error = checkSize(bigEndianAt(file, kWidth), bigEndianAt(file, kHeight))) return error;
  const auto read = +[](void* rest, unsigned char* to, unsigned count) {
    auto& left = *static_cast<std::string_view*>(rest);
    if (count > left.size()) return CAIRO_STATUS_READ_ERROR;
    std::memcpy(to, left.data(), count);
    left.remove_prefix(count);
    return CAIRO_STATUS_SUCCESS;
  };
  return sound(CairoSurfaceHandle(cairo_image_surface_create_from_png_stream(read, &file)));
}

/// The scale by which an image is read that is wanted so wide: none that loses more than is asked for.
tjscalingfactor scaleFor(int pixels, int wanted) {
  tjscalingfactor best{1, 1};
  int count = 0;
  const tjscalingfactor* const all = ::tjGetScalingFactors(&count);
  for (const tjscalingfactor& scale : std::span(all, all ? static_cast<std::size_t>(count) : 0))
    if (TJSCALED(pixels, scale) >= wanted && TJSCALED(pixels, scale) < TJSCALED(pixels, best)) best = scale;
  return best;
}

Outcome<CairoSurfaceHandle> decodeJPEG(std::string_view file, int wanted) {
  const JPEGDecoder decoder(::tjInitDecompress());
  if (!decoder) return broken("no memory");
  const auto* const bytes = reinterpret_cast<const unsigned char*>(file.data());
  int width = 0, height = 0, sampling = 0, colors = 0;
  if (::tjDecompressHeader3(decoder.get(), bytes, file.size(), &width, &height, &sampling, &colors) != 0)
    return broken(::tjGetErrorStr2(decoder.get()));
  if (ErrorRef error = checkSize(static_cast<std::uint64_t>(width), static_cast<std::uint64_t>(height))) return error;
  const tjscalingfactor scale = scaleFor(width, wanted);
  width = TJSCALED(width, scale);
  height = TJSCALED(height, scale);
  auto surface = sound(CairoSurfaceHandle(cairo_image_surface_create(CAIRO_FORMAT_ARGB32, width, height)));
  if (!surface) return surface;
  cairo_surface_flush(surface->get());
  constexpr int kPixel = std::endian::native == std::endian::little ? TJPF_BGRA : TJPF_ARGB;
  // What a file lacks at its end is left grey, as other programs have it; refused is what has scans without end.
  if (::tjDecompress2(decoder.get(), bytes, file.size(), cairo_image_surface_get_data(surface->get()), width,
                      cairo_image_surface_get_stride(surface->get()), height, kPixel, TJFLAG_LIMITSCANS) != 0 &&
      ::tjGetErrorCode(decoder.get()) != TJERR_WARNING)
    return broken(::tjGetErrorStr2(decoder.get()));
  cairo_surface_mark_dirty(surface->get());
  return surface;
}

Outcome<CairoSurfaceHandle> scaledDown(CairoSurfaceHandle image, int wanted) {
  const int width = cairo_image_surface_get_width(image.get()), height = cairo_image_surface_get_height(image.get());
  const double scale = std::min(1.0, static_cast<double>(wanted) / width);
  const int newHeight = std::max(1, static_cast<int>(std::lround(height * scale)));
  // Also one that keeps its size, whose pixels may have another form.
  auto scaled =
      sound(CairoSurfaceHandle(cairo_image_surface_create(CAIRO_FORMAT_ARGB32, std::min(width, wanted), newHeight)));
  if (!scaled) return scaled;
  const CairoContextHandle context(cairo_create(scaled->get()));
  cairo_scale(context.get(), scale, static_cast<double>(newHeight) / height);
  cairo_set_source_surface(context.get(), image.get(), 0, 0);
  cairo_pattern_set_extend(cairo_get_source(context.get()), CAIRO_EXTEND_PAD);
  cairo_set_operator(context.get(), CAIRO_OPERATOR_SOURCE);
  cairo_paint(context.get());
  cairo_surface_flush(scaled->get());
  return sound(std::move(*scaled));
}

class CairoAndTurboJPEG final : public ImagesPart {
  Outcome<PictureRef> decode(std::string_view file, int width) override {
    width = std::clamp(width, 1, kLargestImageSide);
    auto image = file.starts_with(kPNGSignature)    ? decodePNG(file)
                 : file.starts_with(kJPEGSignature) ? decodeJPEG(file, width)
                                                    : broken("it is neither PNG nor JPEG");
    if (image) image = scaledDown(std::move(*image), width);
    if (!image) return image.error();
    return PictureRef(std::make_shared<const DecodedPicture>(std::move(*image)));
  }
};

}  // namespace

}  // namespace nimbo

extern "C" nimbo::ImagesPart* nimbo_images() {
  static nimbo::CairoAndTurboJPEG part;
  return &part;
}
