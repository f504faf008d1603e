#include "apps/notebook/PageFile.h"

#include "scenes/SceneError.h"
#include "scenes/SceneFields.h"
#include "scenes/SceneText.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <filesystem>
#include <nlohmann/json.hpp>

namespace Moka::Notebook {
namespace {

namespace fs = std::filesystem;
using nlohmann::json;
using Scenes::SceneFields;
using Scenes::SceneValue;

constexpr char kAbout[] = "A page of moka-notebook.";
constexpr char kPaper[] = "#FFFFFF";
constexpr char kStart[] = "\"operations\": [\n";
constexpr std::size_t kMaxProblems = 20;

std::string NameFile(std::string const& file, std::string const& folder) {
    fs::path const relative = fs::path(file).lexically_relative(folder);
    bool const isInside = !relative.empty() && *relative.begin() != "..";
    return isInside ? relative.string() : file;
}

// The fewest digits that distinguish hundredths.
double ToHundredths(float value) { return std::round(static_cast<double>(value) * 100) / 100; }

json WriteStroke(Stroke const& stroke) {
    char color[16];
    std::snprintf(color, sizeof(color), "#%08X", stroke.argb);
    json::array_t points;
    points.reserve(stroke.points.size());
    for (InkPoint const& p : stroke.points)
        points.push_back(json::array({ToHundredths(p.x), ToHundredths(p.y), ToHundredths(p.width)}));
    return {{"DrawStroke", {{"paint", {{"color", color}}}, {"points", std::move(points)}}}};
}

json WriteImage(Image const& image, std::string const& folder) {
    RectF const& to = image.place;
    json const place = json::array(
        {ToHundredths(to.left), ToHundredths(to.top), ToHundredths(to.right), ToHundredths(to.bottom)});
    return {{"DrawBitmap", {{"bitmap", NameFile(image.file, folder)}, {"dst", place}}}};
}

ObjectPtr ReadStroke(SceneFields& fields) {
    Stroke stroke;
    SceneFields paint(fields.Get("paint"));
    Vector4<float> const c = Scenes::ReadColor(paint.Get("color"));
    paint.CheckAll();
    auto const byte = [](float value) { return static_cast<unsigned>(std::lround(value * 255)) & 0xFFu; };
    stroke.argb = byte(c.w) << 24 | byte(c.x) << 16 | byte(c.y) << 8 | byte(c.z);
    SceneValue const& points = fields.Get("points");
    if (points.kind != SceneValue::Kind::List || points.items.empty())
        Scenes::ThrowExpected(points, "a list of points, [x, y, width]");
    for (SceneValue const& point : points.items) {
        std::vector<float> const n = Scenes::ReadFloats(point, 3, "[x, y, width]");
        stroke.points.push_back({n[0], n[1], n[2]});
    }
    return std::make_shared<Object const>(std::move(stroke));
}

ObjectPtr ReadImage(SceneFields& fields, std::string const& folder) {
    Image image;
    image.file = (fs::path(folder) / Scenes::ReadText(fields.Get("bitmap"))).lexically_normal().string();
    image.place = fields.GetRect("dst");
    return std::make_shared<Object const>(std::move(image));
}

// Throws SceneValueError.
ObjectPtr ReadObject(SceneValue const& value, std::string const& folder) {
    SceneFields operation(value);
    SceneValue const* const stroke = operation.Find("DrawStroke");
    SceneValue const* const image = operation.Find("DrawBitmap");
    operation.CheckAll();
    if (!stroke && !image) Scenes::ThrowExpected(value, "DrawStroke or DrawBitmap");
    SceneFields fields(stroke ? *stroke : *image);
    ObjectPtr object = stroke ? ReadStroke(fields) : ReadImage(fields, folder);
    fields.CheckAll();
    return object;
}

class Reader {
public:
    Reader(std::string const& name, std::string const& folder) : mName(name), mFolder(folder) {}

    PageText Take() { return std::move(mResult); }

    // Reads the layout of WritePage line by line, which needs no tree of the whole page. Returns false and reads nothing
    // if the JSON is laid out in another way.
    bool ReadLines(std::string_view text) {
        std::size_t const start = text.find(kStart);
        if (start == std::string_view::npos) return false;
        std::string_view head = text.substr(0, start);
        std::string_view rest = text.substr(start + sizeof(kStart) - 1);
        int line = static_cast<int>(std::count(head.begin(), head.end(), '\n')) + 2;
        std::string const headAlone = std::string(head) + "\"operations\": []}";
        if (!Parse(0, headAlone, [&](SceneValue const& root) { ReadHead(root); })) return false;
        for (; !rest.empty(); ++line) {
            std::size_t const end = std::min(rest.find('\n'), rest.size());
            std::string_view operation = rest.substr(0, end);
            rest.remove_prefix(std::min(end + 1, rest.size()));
            if (operation == "]}") return true;
            if (!operation.empty() && operation.back() == ',') operation.remove_suffix(1);
            Parse(line, operation, [&](SceneValue const& value) { Add(value); });
        }
        Tell(line, " the file ends before its operations do");
        return true;
    }

    void ReadTree(std::string_view text) {
        mResult = {};
        Parse(0, text, [&](SceneValue const& root) {
            Guard(0, [&] { ReadHead(root); });
            SceneFields fields(root);
            for (SceneValue const& item : fields.Get("operations").items) Guard(0, [&] { Add(item); });
        });
    }

private:
    void Add(SceneValue const& value) { mResult.objects.push_back(ReadObject(value, mFolder)); }

    static void ReadHead(SceneValue const& root) {
        SceneFields fields(root);
        fields.Find("about");
        fields.Find("bitmaps");
        fields.Get("operations");
        std::vector<float> const size = Scenes::ReadFloats(fields.Get("size"), 2, "[width, height]");
        if (size[0] != Page::kWidth) Scenes::ThrowExpected(fields.Get("size"), "as wide as a page, 1200");
        SceneValue const* const paper = fields.Find("background");
        if (!paper || paper->text != kPaper) Scenes::ThrowExpected(paper ? *paper : root, "on white paper");
        fields.CheckAll();
    }

    // line: the line of the text in the file, or 0 for the whole file.
    template <class Function>
    bool Parse(int line, std::string_view text, Function const& function) {
        SceneValue root; // must outlive errors, which refer to its values
        return Guard(line, [&] {
            root = Scenes::ParseSceneText(text);
            function(root);
        });
    }

    template <class Function>
    bool Guard(int line, Function const& function) {
        int const before = line > 0 ? line - 1 : 0;
        try {
            function();
            return true;
        } catch (Scenes::SceneValueError const& error) {
            Tell(error.GetValue().line + before, error.what());
        } catch (Scenes::SceneTextError const& error) {
            Tell(error.GetLine() + before, error.what());
        } catch (std::exception const& error) {
            Tell(std::max(line, 1), error.what());
        }
        return false;
    }

    void Tell(int line, std::string const& what) {
        if (mResult.problems.size() < kMaxProblems)
            mResult.problems.push_back(mName + ':' + std::to_string(line) + ':' +
                                       (what[0] == ' ' ? "" : " ") + what);
    }

    std::string const& mName;
    std::string const& mFolder;
    PageText mResult;
};

} // namespace

bool IsWritablePath(std::string const& path) {
    try {
        return !json(path).dump().empty();
    } catch (json::exception const&) {
        return false;
    }
}

std::string WriteOperation(Object const& object, std::string const& folder) {
    auto const* const stroke = std::get_if<Stroke>(&object.content);
    return (stroke ? WriteStroke(*stroke) : WriteImage(std::get<Image>(object.content), folder)).dump();
}

ObjectPtr ReadOperation(std::string_view text, std::string const& folder) {
    return ReadObject(Scenes::ParseSceneText(text), folder);
}

std::string WritePage(Objects const& objects, int height, std::string const& folder) {
    json bitmaps = json::object();
    for (ObjectPtr const& object : objects)
        if (auto const* const image = std::get_if<Image>(&object->content)) {
            std::string const name = NameFile(image->file, folder);
            bitmaps[name] = {{"file", name}, {"filter", "Mipmapped"}};
        }
    json const head = {
        {"about", kAbout}, {"size", {Page::kWidth, height}}, {"background", kPaper}, {"bitmaps", bitmaps}};
    std::string text = head.dump();
    text.back() = ',';
    text += std::string("\n") + kStart;
    for (ObjectPtr const& object : objects) {
        text += WriteOperation(*object, folder);
        text += &object == &objects.back() ? "\n" : ",\n";
    }
    return text += "]}\n";
}

PageText ReadPage(std::string_view text, std::string const& name, std::string const& folder) {
    Reader reader(name, folder);
    if (!reader.ReadLines(text)) reader.ReadTree(text);
    return reader.Take();
}

} // namespace Moka::Notebook
