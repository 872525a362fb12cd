// Reads the images of resources/images when the program is built, so that it reads none itself:
//
//   nimbo-vector-images OUT.cpp IMAGE.svg...
//
// They are written in a small part of SVG 1.1 (https://www.w3.org/TR/SVG11/): `<svg viewBox="0 0 W H">` with `<path d>`
// of the commands M L H V C Z, `<circle cx cy r>` and `<rect x y width height rx>` in it; on each `fill`, `fill-rule`,
// `stroke` and `stroke-width`. A colour is "none", "currentColor" or "#rrggbb". `stroke-linecap` and `stroke-linejoin`
// must be "round" where they stand, as all strokes are drawn round. Comments and other attributes are passed over; any
// other element or path command is an error, so that nothing is left out unseen.

#include <glib.h>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <map>
#include <memory>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "desktop/drawing/VectorImage.h"

namespace nimbo {

namespace {

using Operation = VectorImage::Operation;
using Attributes = std::map<std::string, std::string, std::less<>>;

struct Shape {
  std::vector<VectorImage::Step> steps;
  VectorImage::Paint fill{true, Color{0, 0, 0, 1}};
  VectorImage::Paint stroke{false, {}};
  bool fillsEvenOdd = false;
  double strokeWidth = 1;
};

[[noreturn]] void fail(const std::string& problem) { throw std::runtime_error(problem); }

void trimFront(std::string_view& text, std::string_view characters) {
  text.remove_prefix(std::min(text.find_first_not_of(characters), text.size()));
}

/// Takes `count` numbers off `text`.
void readNumbers(std::string_view& text, double* numbers, int count) {
  for (int i = 0; i < count; ++i) {
    trimFront(text, " \t\r\n,");
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), numbers[i]);
    if (error != std::errc() || !std::isfinite(numbers[i])) fail("a number is malformed");
    text.remove_prefix(static_cast<std::size_t>(end - text.data()));
  }
}

/// An attribute's one number; `fallback` where it does not stand.
double numberIn(const Attributes& attributes, std::string_view name, double fallback = 0) {
  const auto found = attributes.find(name);
  if (found == attributes.end()) return fallback;
  std::string_view text = found->second;
  double number = 0;
  readNumbers(text, &number, 1);
  if (!text.empty()) fail("a number is malformed");
  return number;
}

VectorImage::Paint paintOf(std::string_view text) {
  VectorImage::Paint paint{text != "none", {}};
  if (text == "none" || text == "currentColor") return paint;
  if (text.starts_with('#')) paint.color = colorFromHexText(text);
  if (!paint.color) fail("a colour is not none, currentColor or #rrggbb");
  return paint;
}

std::vector<VectorImage::Step> stepsOfPath(std::string_view data) {
  std::vector<VectorImage::Step> steps;
  char command = 0;
  double x = 0, y = 0;            // the current point
  double startX = 0, startY = 0;  // of the subpath
  while (trimFront(data, " \t\r\n"), !data.empty()) {
    if (data.front() >= 'A') {
      command = data.front();
      data.remove_prefix(1);
    }
    VectorImage::Step step{Operation::line, {}};
    double* v = step.values.data();
    int count = 0;
    switch (command) {
      case 'M':
      case 'L':
        readNumbers(data, v, 2);
        if (command == 'M') {
          step.operation = Operation::move;
          startX = v[0], startY = v[1];
          // Pairs after the first are lines.
          command = 'L';
        }
        break;
      case 'H':
        readNumbers(data, v, 1);
        v[1] = y;
        break;
      case 'V':
        readNumbers(data, v + 1, 1);
        v[0] = x;
        break;
      case 'C':
        step.operation = Operation::curve;
        count = 4;
        readNumbers(data, v, 6);
        break;
      case 'Z':
        step.operation = Operation::close;
        v[0] = startX, v[1] = startY;
        command = 0;
        break;
      default:
        fail("a path has a command other than M L H V C Z");
    }
    x = v[count], y = v[count + 1];
    steps.push_back(step);
  }
  if (steps.empty() || steps.front().operation != Operation::move) fail("a path does not start with M");
  return steps;
}

std::vector<VectorImage::Step> stepsOfRect(const Attributes& attributes) {
  const double x = numberIn(attributes, "x"), y = numberIn(attributes, "y");
  const double width = numberIn(attributes, "width"), height = numberIn(attributes, "height");
  const double radius = std::min({numberIn(attributes, "rx"), width / 2, height / 2});
  // Control points at this part of the radius make a quarter circle, within 0.03 percent.
  const double k = radius * (1 - 0.5522847498);
  const double right = x + width, bottom = y + height;
  return {
      {Operation::move, {x + radius, y}},
      {Operation::line, {right - radius, y}},
      {Operation::curve, {right - k, y, right, y + k, right, y + radius}},
      {Operation::line, {right, bottom - radius}},
      {Operation::curve, {right, bottom - k, right - k, bottom, right - radius, bottom}},
      {Operation::line, {x + radius, bottom}},
      {Operation::curve, {x + k, bottom, x, bottom - k, x, bottom - radius}},
      {Operation::line, {x, y + radius}},
      {Operation::curve, {x, y + k, x + k, y, x + radius, y}},
      {Operation::close, {}},
  };
}

std::vector<VectorImage::Step> stepsOf(std::string_view element, const Attributes& attributes) {
  if (element == "rect") return stepsOfRect(attributes);
  if (element == "circle")
    return {{Operation::circle, {numberIn(attributes, "cx"), numberIn(attributes, "cy"), numberIn(attributes, "r")}}};
  if (element != "path") fail("the element " + std::string(element) + " is not supported");
  const auto data = attributes.find("d");
  if (data == attributes.end()) fail("a path has no d");
  return stepsOfPath(data->second);
}

Shape shapeOf(std::string_view element, const Attributes& attributes) {
  Shape shape;
  shape.steps = stepsOf(element, attributes);
  for (const auto& [name, value] : attributes) {
    if (name == "fill") shape.fill = paintOf(value);
    if (name == "stroke") shape.stroke = paintOf(value);
    if (name == "fill-rule") shape.fillsEvenOdd = value == "evenodd";
    if ((name == "stroke-linecap" || name == "stroke-linejoin") && value != "round") fail("a stroke is not round");
  }
  shape.strokeWidth = numberIn(attributes, "stroke-width", 1);
  return shape;
}

/// One image, read by GLib's parser of XML.
class SVG {
 public:
  explicit SVG(const std::string& text) {
    constexpr GMarkupParser kParser{&SVG::onElement, nullptr, nullptr, nullptr, nullptr};
    const std::unique_ptr<GMarkupParseContext, decltype(&g_markup_parse_context_free)> context(
        g_markup_parse_context_new(&kParser, G_MARKUP_DEFAULT_FLAGS, this, nullptr), g_markup_parse_context_free);
    GError* error = nullptr;
    if (g_markup_parse_context_parse(context.get(), text.data(), static_cast<gssize>(text.size()), &error) &&
        g_markup_parse_context_end_parse(context.get(), &error))
      return;
    const std::string problem = error->message;
    g_error_free(error);
    fail(problem);
  }

  Size size() const { return _size; }
  const std::vector<Shape>& shapes() const { return _shapes; }

 private:
  static void onElement(GMarkupParseContext* context, const char* element, const char** names, const char** values,
                        void* svg, GError** error) {
    Attributes attributes;
    for (; *names; ++names, ++values) attributes.emplace(*names, *values);
    try {
      static_cast<SVG*>(svg)->take(element, attributes, g_markup_parse_context_get_element_stack(context)->next);
    } catch (const std::runtime_error& failure) {
      int line = 0, character = 0;
      g_markup_parse_context_get_position(context, &line, &character);
      g_set_error(error, G_MARKUP_ERROR, G_MARKUP_ERROR_INVALID_CONTENT, "line %d: %s", line, failure.what());
    }
  }

  void take(std::string_view element, const Attributes& attributes, bool isInside) {
    if (isInside) {
      _shapes.push_back(shapeOf(element, attributes));
      return;
    }
    const auto viewBox = attributes.find("viewBox");
    if (element != "svg" || viewBox == attributes.end()) fail("the first element is not svg, or has no viewBox");
    double numbers[4];
    std::string_view text = viewBox->second;
    readNumbers(text, numbers, 4);
    if (numbers[0] != 0 || numbers[1] != 0 || !(numbers[2] > 0) || !(numbers[3] > 0))
      fail("the viewBox does not start at 0 0 or is empty");
    _size = {numbers[2], numbers[3]};
  }

  Size _size;
  std::vector<Shape> _shapes;
};

std::string literal(double number) {
  char text[32];
  return {text, std::to_chars(text, text + sizeof text, number).ptr};
}

std::string literal(const VectorImage::Paint& paint) {
  if (!paint.color) return paint.isUsed ? "{true, {}}" : "{false, {}}";
  const Color& color = *paint.color;
  return "{true, Color{" + literal(color.red) + ", " + literal(color.green) + ", " + literal(color.blue) + ", " +
         literal(color.alpha) + "}}";
}

/// The images as C++.
class Table {
 public:
  void add(const std::string& name, const SVG& svg) {
    const std::size_t firstShape = _shapeCount;
    for (const Shape& shape : svg.shapes()) {
      for (const auto& [operation, values] : shape.steps) {
        static constexpr const char* kNames[] = {"move", "line", "curve", "close", "circle"};
        _steps << "    {Operation::" << kNames[static_cast<std::size_t>(operation)] << ", {";
        for (const double value : values) _steps << literal(value) << ", ";
        _steps << "}},\n";
      }
      _shapes << "    {{kSteps + " << _stepCount << ", " << shape.steps.size() << "}, " << literal(shape.fill) << ", "
              << literal(shape.stroke) << ", " << (shape.fillsEvenOdd ? "true" : "false") << ", "
              << literal(shape.strokeWidth) << "},\n";
      _stepCount += shape.steps.size();
      ++_shapeCount;
    }
    _images << "    {\"" << name << "\", {" << literal(svg.size().width) << ", " << literal(svg.size().height)
            << "}, {kShapes + " << firstShape << ", " << svg.shapes().size() << "}},\n";
  }

  std::string text() const {
    return "#include \"desktop/drawing/VectorImage.h\"\n\nnamespace nimbo {\nnamespace {\n\n"
           "using Operation = VectorImage::Operation;\n\nconstexpr VectorImage::Step kSteps[] = {\n" +
           _steps.str() + "};\n\nconstexpr VectorImage::Shape kShapes[] = {\n" + _shapes.str() +
           "};\n\nconstexpr VectorImage kImages[] = {\n" + _images.str() +
           "};\n\n}  // namespace\n\nconst std::span<const VectorImage> kVectorImages(kImages);\n\n}  // namespace "
           "nimbo\n";
  }

 private:
  std::ostringstream _steps, _shapes, _images;
  std::size_t _stepCount = 0, _shapeCount = 0;
};

}  // namespace

}  // namespace nimbo

int main(int count, char** arguments) {
  nimbo::Table table;
  for (int i = 2; i < count; ++i) {
    std::ifstream file(arguments[i]);
    std::ostringstream text;
    text << file.rdbuf();
    try {
      table.add(std::filesystem::path(arguments[i]).stem(), nimbo::SVG(text.str()));
    } catch (const std::runtime_error& failure) {
      std::fprintf(stderr, "%s: %s\n", arguments[i], failure.what());
      return 1;
    }
  }
  if (count < 3 || !(std::ofstream(arguments[1]) << table.text())) {
    std::fprintf(stderr, "usage: nimbo-vector-images OUT.cpp IMAGE.svg...\n");
    return 2;
  }
}
