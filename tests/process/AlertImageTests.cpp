// Images of incidents, from their servers to the host's memory.

#include <cairo.h>
#include <gmock/gmock.h>
#include <turbojpeg.h>

#include "desktop/gtfs/LoopbackServer.h"
#include "host/Programs.h"
#include "process/AlertImages.h"

namespace nimbo {
namespace {

using nlohmann::json;
using testing::HasSubstr;

constexpr std::uint32_t kBlue = 0xff0000ff;

std::string png(int width, int height) {
  std::string file;
  cairo_surface_t* surface = cairo_image_surface_create(CAIRO_FORMAT_RGB24, width, height);
  cairo_t* context = cairo_create(surface);
  cairo_set_source_rgb(context, 0, 0, 1);
  cairo_paint(context);
  cairo_destroy(context);
  const auto append = +[](void* to, const unsigned char* bytes, unsigned count) {
    static_cast<std::string*>(to)->append(reinterpret_cast<const char*>(bytes), count);
    return CAIRO_STATUS_SUCCESS;
  };
  cairo_surface_write_to_png_stream(surface, append, &file);
  cairo_surface_destroy(surface);
  return file;
}

std::string jpeg(int width, int height) {
  const std::vector<std::uint32_t> pixels(static_cast<std::size_t>(width * height), kBlue);
  unsigned char* bytes = nullptr;
  unsigned long size = 0;
  const tjhandle encoder = tjInitCompress();
  tjCompress2(encoder, reinterpret_cast<const unsigned char*>(pixels.data()), width, 0, height, TJPF_BGRX, &bytes,
              &size, TJSAMP_444, 100, 0);
  std::string file(reinterpret_cast<const char*>(bytes), size);
  tjFree(bytes);
  tjDestroy(encoder);
  return file;
}

std::string replaced(std::string file, std::size_t place, std::string_view bytes) {
  return file.replace(place, bytes.size(), bytes);
}

TEST(AlertImage, ComesAsPixelsOrWithWhatIsWrong) {
  using namespace std::string_view_literals;
  const std::string blue = png(64, 32), photo = jpeg(64, 32);
  const auto answer = [](const std::string& file) { return LoopbackServer::answer("200 OK", file); };
  const struct {
    const char* what;
    std::string answer;
    std::uint32_t width;
    int shownWidth, shownHeight;  // 0: none
    const char* reason;
  } cases[] = {
      {"PNG", answer(blue), 100, 64, 32, ""},
      {"PNG scaled", answer(blue), 16, 16, 8, ""},
      {"JPEG", answer(photo), 100, 64, 32, ""},
      {"JPEG scaled", answer(photo), 15, 15, 8, ""},
      {"as large as may be", answer(png(4096, 1)), 1, 1, 1, ""},
      {"a pixel more", answer(png(4097, 1)), 100, 0, 0, "4097 by 1 pixels"},
      {"PNG that says it is large", answer(replaced(blue, 16, "\0\1\x86\xa0\0\1\x86\xa0"sv)), 100, 0, 0,
       "100000 by 100000"},
      {"JPEG that says it is large", answer(replaced(photo, photo.find("\xff\xc0") + 5, "\xfd\xe8\xfd\xe8")), 100, 0, 0,
       "65000 by 65000"},
      {"half of a PNG", answer(blue.substr(0, blue.size() / 2)), 100, 0, 0, "cannot be read"},
      {"header of a JPEG", answer("\xff\xd8\xff\xe0"), 100, 0, 0, "cannot be read"},
      {"another kind", answer("<svg/>"), 100, 0, 0, "neither PNG nor JPEG"},
      {"nothing", answer(""), 100, 0, 0, "neither PNG nor JPEG"},
      {"large file", answer(std::string((4 << 20) + 1, 'x')), 100, 0, 0, "larger than 4 MiB"},
      {"a page", LoopbackServer::answer("404 Not Found", blue), 100, 0, 0, "404"},
  };
  for (const auto& test : cases) {
    const LoopbackServer server([&](const std::string& request) {
      const bool isRedirected = request.starts_with("GET /there");
      return LoopbackServer::Answer{isRedirected ? test.answer
                                                 : LoopbackServer::answer("302 Found\r\nLocation: /there", "")};
    });
    const auto image = fetchImage(*FeedAddress::parse(server.address()), test.width, {});
    ASSERT_EQ(static_cast<bool>(image), test.shownWidth > 0) << test.what << (image ? "" : image.error()->reason());
    if (!image) {
      EXPECT_THAT(image.error()->reason(), HasSubstr(test.reason)) << test.what;
      continue;
    }
    const Picture& picture = **image;
    EXPECT_EQ(std::pair(picture.pixelWidth(), picture.pixelHeight()), std::pair(test.shownWidth, test.shownHeight))
        << test.what;
    std::uint32_t first = 0;
    std::memcpy(&first, picture.pixels().data(), sizeof first);
    EXPECT_EQ(first | 0x010101, kBlue | 0x010101) << test.what << std::hex << first;
  }
}

TEST(AlertImage, TakesNoMoreRoomThanItsHostGives) {
  const LoopbackServer server(
      [](const std::string&) { return LoopbackServer::Answer{LoopbackServer::answer("200 OK", png(64, 32))}; });
  const Programs programs;
  AlertsBuilder::Alert alert{"a", {"m1"}, "Works", "Slow."};
  alert.image = server.address("/map.png");
  programs.setUpCity({"m1"}, {alert});
  std::vector<json> events = {appearing()[0], request("performUpdate"), request("lines")};
  const json incident = programs.play(events).back()["result"]["lines"][0]["incidents"][0];
  const auto answer = [&](int capacity) {
    events.back() =
        request("image", {{"incident", incident["id"]}, {"width", 32}, {"offset", 4096}, {"capacity", capacity}});
    return programs.play(events).back();
  };
  EXPECT_EQ(answer(2048)["result"], (json{{"height", 16}, {"scale", 1.0}, {"stride", 128}, {"width", 32}}));
  EXPECT_EQ(answer(2047)["error"]["code"], -32002);
}

}  // namespace
}  // namespace nimbo
