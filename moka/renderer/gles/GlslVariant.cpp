#include "moka/renderer/gles/GlslVariant.h"

#include "moka/renderer/device/GlslTokens.h"

#include <algorithm>
#include <cstring>
#include <map>
#include <set>

namespace Moka::detail {
namespace {

using Kind = GlslToken::Kind;

// Thrown where a source cannot be rewritten. MakeGlslVariant catches it.
struct NotUnderstood {
    std::string reason;
};

[[noreturn]] void Refuse(std::string reason) { throw NotUnderstood{std::move(reason)}; }

template <std::size_t N>
bool IsOneOf(std::string_view word, char const* const (&words)[N]) {
    return std::any_of(std::begin(words), std::end(words), [=](char const* one) { return word == one; });
}

bool IsPrecision(std::string_view word) {
    static constexpr char const* kWords[] = {"lowp", "mediump", "highp"};
    return IsOneOf(word, kWords);
}

// The words that this file rewrites. They must not occur in a macro or inside an #if.
bool IsStructural(std::string_view word) {
    static constexpr char const* kWords[] = {"uniform", "attribute",   "varying",     "in",
                                             "out",     "main",        "precision",   "gl_FragColor",
                                             "flat",    "gl_FragData", "gl_VertexID", "__VERSION__"};
    return IsOneOf(word, kWords);
}

// Sources that contain these words cannot be rewritten.
bool IsForeign(std::string_view word) {
    static constexpr char const* kWords[] = {"gl_VertexID", "gl_InstanceID", "gl_FragData", "__VERSION__"};
    return IsOneOf(word, kWords) || word.substr(0, 4) == "moka" || word.substr(0, 4) == "Moka";
}

char const* ToNewName(std::string_view word) {
    static std::map<std::string_view, char const*> const kNames = {{"texture2D", "texture"},
                                                                   {"texture2DProj", "textureProj"},
                                                                   {"texture2DLod", "textureLod"},
                                                                   {"textureCube", "texture"},
                                                                   {"texture2DProjLod", "textureProjLod"},
                                                                   {"textureCubeLod", "textureLod"},
                                                                   {"gl_FragColor", "mokaFragColor"},
                                                                   {"attribute", "in"}};
    auto const found = kNames.find(word);
    return found == kNames.end() ? nullptr : found->second;
}

char const* GetTypeName(BindingType type) {
    switch (type) {
    case BindingTypeMatrix4:
        return "mat4";
    case BindingTypeVector4:
        return "vec4";
    case BindingTypeVector2:
        return "vec2";
    case BindingTypeFloat:
        return "float";
    case BindingTypeBool:
    case BindingTypeInt:
        return "int";
    case BindingTypeUnknown:
    case BindingTypeTextureUnit:
        break;
    }
    return "";
}

bool IsIntegral(BindingType type) { return type == BindingTypeBool || type == BindingTypeInt; }

// A uniform of the program. Fields are in the order of the record.
struct Field {
    ProgramLayout::Uniform const* uniform;
    bool isConstant;
    std::int32_t value; // of a constant
};

std::vector<Field> ListFields(GlslVariantRequest const& request) {
    std::vector<Field> fields;
    for (ProgramLayout::Uniform const& uniform : request.layout.uniforms) {
        if (uniform.type != BindingTypeTextureUnit) fields.push_back({&uniform, false, 0});
    }
    std::sort(fields.begin(), fields.end(),
              [](Field const& a, Field const& b) { return a.uniform->offset < b.uniform->offset; });
    std::size_t index = 0;
    for (Field& field : fields) {
        if (!IsIntegral(field.uniform->type)) continue;
        field.isConstant = (request.varying & (1u << index)) == 0;
        field.value = request.integers[index++];
    }
    return fields;
}

// Rewrites one stage token by token. Line numbers stay the same.
class StageRewriter {
public:
    StageRewriter(std::string_view source, bool isVertex, std::vector<Field> const& fields)
        : mTokens(SplitGlsl(source)), mIsVertex(isVertex), mFields(fields) {}

    void Rewrite() {
        for (mAt = 0; mAt < mTokens.size();) TakeToken();
        if (mConditions != 0 || mDepth != 0) Refuse("brackets or conditions are not closed");
        if (!mHasMain) Refuse("there is no main()");
    }

    std::string const& GetBody() const { return mBody; }
    std::string const& GetExtensions() const { return mExtensions; }
    bool WritesFragColor() const { return mWritesFragColor; }
    int GetVaryings() const { return mVaryings; }
    // The fields that the stage declares.
    std::vector<Field const*> const& GetUsed() const { return mUsed; }

private:
    void TakeToken() {
        GlslToken const& token = mTokens[mAt];
        switch (token.kind) {
        case Kind::Blank:
            Copy();
            return;
        case Kind::Directive:
            TakeDirective(token.text);
            ++mAt;
            return;
        case Kind::Symbol:
            CountDepth(token.text.front());
            mStartsStatement = mDepth == 0 && (token.text == ";" || token.text == "}");
            Copy();
            return;
        case Kind::Word:
            TakeWord(token.text);
            return;
        }
    }

    void CountDepth(char symbol) {
        if (std::strchr("({[", symbol)) ++mDepth;
        if (std::strchr(")}]", symbol)) --mDepth;
    }

    void Copy() { mBody += mTokens[mAt++].text; }

    void TakeDirective(std::string_view text) {
        std::vector<GlslToken> words;
        for (GlslToken const& token : SplitGlsl(text.substr(1))) {
            if (token.kind == Kind::Word) words.push_back(token);
        }
        std::string_view const name = words.empty() ? std::string_view() : words.front().text;
        if (!text.empty() && text.back() == '\\') Refuse("a directive goes on in the next line");
        if (name == "version") {
            mIsOld = words.size() < 2 || words[1].text == "100";
            return;
        }
        if (name == "extension") {
            if (mIsOld) Refuse("it uses an extension of GLSL ES 1.00");
            mExtensions.append(text).append("\n");
            return;
        }
        for (GlslToken const& word : words) {
            if (IsStructural(word.text) || IsForeign(word.text)) {
                Refuse("a directive contains " + std::string(word.text));
            }
        }
        if (name == "if" || name == "ifdef" || name == "ifndef") ++mConditions;
        if (name == "endif") --mConditions;
        mBody += text;
    }

    void TakeWord(std::string_view word) {
        if (IsForeign(word)) Refuse("it contains " + std::string(word));
        if (mConditions > 0 && IsStructural(word)) Refuse("a condition contains " + std::string(word));
        if (mDepth == 0 && word == "uniform") {
            TakeUniform();
            return;
        }
        if (mDepth == 0) CountVarying(word);
        mStartsStatement = false;
        if (word == "main") {
            mHasMain = mHasMain || mDepth == 0;
            mBody += "mokaMain";
        } else if (mIsOld && word == "varying") {
            mBody += mIsVertex ? "out" : "in";
        } else if (char const* const newName = mIsOld ? ToNewName(word) : nullptr) {
            mWritesFragColor = mWritesFragColor || word == "gl_FragColor";
            mBody += newName;
        } else {
            mBody += word;
        }
        ++mAt;
    }

    // Counts one vector for each declared name, or one for each column of a matrix. Other types are left to
    // the linker to check.
    void CountVarying(std::string_view word) {
        if (!mIsVertex || word != (mIsOld ? "varying" : "out")) return;
        int vectors = 1;
        for (std::size_t i = mAt + 1; i < mTokens.size() && mTokens[i].text != ";"; ++i) {
            std::string_view const text = mTokens[i].text;
            if (text.size() > 3 && text.substr(0, 3) == "mat") vectors = text[3] - '0';
            if (text == ",") mVaryings += vectors;
        }
        mVaryings += vectors;
    }

    std::string_view NextWord() {
        do {
            ++mAt;
        } while (mAt < mTokens.size() && mTokens[mAt].kind == Kind::Blank);
        return mAt < mTokens.size() ? mTokens[mAt].text : std::string_view();
    }

    // "uniform [precision] type name [, name]... ;"
    void TakeUniform() {
        if (!mStartsStatement) Refuse("a uniform has a qualifier");
        std::size_t const begin = mAt;
        std::string_view word = NextWord();
        std::string precision;
        if (IsPrecision(word)) {
            precision = std::string(word) + " ";
            word = NextWord();
        }
        std::string const type(word);
        if (type.find("sampler") != std::string::npos) {
            for (std::size_t i = begin; i <= mAt; ++i) mBody += mTokens[i].text;
            ++mAt;
            mStartsStatement = false;
            return;
        }
        static constexpr char const* kTypes[] = {"mat4", "vec4", "vec2", "float", "int", "bool"};
        if (!IsOneOf(type, kTypes)) Refuse("a uniform is of type " + type);
        for (word = NextWord();; word = NextWord()) {
            Declare(precision, type, std::string(word));
            word = NextWord();
            if (word == ";") break;
            if (word != ",") Refuse("a uniform is declared with " + std::string(word));
        }
        for (std::size_t i = begin; i < mAt; ++i) {
            mBody.append(
                static_cast<std::size_t>(std::count(mTokens[i].text.begin(), mTokens[i].text.end(), '\n')),
                '\n');
        }
        ++mAt;
    }

    void Declare(std::string const& precision, std::string const& type, std::string const& name) {
        auto const found = std::find_if(mFields.begin(), mFields.end(),
                                        [&](Field const& field) { return field.uniform->name == name; });
        // Uniforms that are not found are unused; the compiler has removed them.
        if (found != mFields.end() && found->isConstant) {
            std::string const value =
                type == "bool" ? (found->value != 0 ? "true" : "false") : std::to_string(found->value);
            mBody += "const " + precision + type + " " + name + " = " + value + ";";
            return;
        }
        if (found != mFields.end()) {
            mUsed.push_back(&*found);
            if (!mIsVertex) {
                mBody += "flat in " + precision + GetTypeName(found->uniform->type) + " moka_" + name + "; ";
            }
        }
        mBody += precision + type + " " + name + ";";
    }

    std::vector<GlslToken> const mTokens;
    bool const mIsVertex;
    std::vector<Field> const& mFields;
    std::size_t mAt = 0;
    std::string mBody;
    std::string mExtensions;
    bool mIsOld = true; // GLSL ES 1.00
    bool mHasMain = false;
    bool mWritesFragColor = false;
    bool mStartsStatement = true;
    int mConditions = 0; // open #if directives
    int mDepth = 0;      // open brackets
    int mVaryings = 0;
    std::vector<Field const*> mUsed;
};

std::string Assign(Field const& field, std::string const& value) {
    bool const isBool = field.uniform->type == BindingTypeBool;
    return "    " + field.uniform->name + " = " + value + (isBool ? " != 0" : "") + ";\n";
}

std::string MakeVertexStage(StageRewriter const& stage, StageRewriter const& fragment,
                            std::vector<Field> const& fields, ProgramLayout const& layout) {
    std::string text = "#version 300 es\n" + stage.GetExtensions() + "struct MokaRecord {";
    for (Field const& field : fields) {
        text += std::string(" highp ") + GetTypeName(field.uniform->type) + " " + field.uniform->name + ";";
    }
    text += " };\nlayout(std140) uniform " + std::string(kRecordBlock) + " { MokaRecord mokaRecords[" +
            std::to_string(GetRecordsPerBlock(layout)) + "]; };\n" +
            "layout(location = " + std::to_string(kRecordLocation) + ") in highp uint mokaNumber;\n";
    std::string copies;
    for (Field const* field : stage.GetUsed()) {
        copies += Assign(*field, "mokaRecords[mokaNumber]." + field->uniform->name);
    }
    for (Field const* field : fragment.GetUsed()) {
        std::string const& name = field->uniform->name;
        text += std::string("flat out highp ") + GetTypeName(field->uniform->type) + " moka_" + name + ";\n";
        copies += "    moka_" + name + " = mokaRecords[mokaNumber]." + name + ";\n";
    }
    return text + "#line 1\n" + stage.GetBody() + "\nvoid main() {\n" + copies + "    mokaMain();\n}\n";
}

std::string MakeFragmentStage(StageRewriter const& stage) {
    std::string text = "#version 300 es\n" + stage.GetExtensions();
    // gl_FragColor has the same precision.
    if (stage.WritesFragColor()) text += "layout(location = 0) out mediump vec4 mokaFragColor;\n";
    text += "#line 1\n" + stage.GetBody() + "\nvoid main() {\n";
    for (Field const* field : stage.GetUsed()) text += Assign(*field, "moka_" + field->uniform->name);
    return text + "    mokaMain();\n}\n";
}

void CheckDeclared(std::vector<Field> const& fields, StageRewriter const& vertex,
                   StageRewriter const& fragment) {
    for (Field const& field : fields) {
        auto const declares = [&](StageRewriter const& stage) {
            return std::find(stage.GetUsed().begin(), stage.GetUsed().end(), &field) != stage.GetUsed().end();
        };
        if (!field.isConstant && !declares(vertex) && !declares(fragment)) {
            Refuse("the declaration of " + field.uniform->name + " is not found");
        }
    }
}

GlslStages Rewrite(GlslVariantRequest const& request) {
    std::vector<Field> const fields = ListFields(request);
    if (fields.empty()) Refuse("it has no uniforms");
    if (GetRecordsPerBlock(request.layout) == 0) Refuse("its uniforms are too large for a block");
    StageRewriter vertex(request.sources.vertex, true, fields);
    StageRewriter fragment(request.sources.fragment, false, fields);
    vertex.Rewrite();
    fragment.Rewrite();
    CheckDeclared(fields, vertex, fragment);
    int varyings = vertex.GetVaryings();
    for (Field const* field : fragment.GetUsed()) {
        varyings += field->uniform->type == BindingTypeMatrix4 ? 4 : 1;
    }
    if (varyings > kMostVaryings) Refuse("it would need " + std::to_string(varyings) + " varyings");
    return {MakeVertexStage(vertex, fragment, fields, request.layout), MakeFragmentStage(fragment)};
}

} // namespace

std::string MakeGlslHighp(std::string_view source) {
    std::string text;
    for (GlslToken const& token : SplitGlsl(source)) {
        bool const isPrecision = token.kind == Kind::Word && IsPrecision(token.text);
        text += isPrecision ? std::string_view("highp") : token.text;
    }
    return text;
}

std::size_t GetRecordStride(ProgramLayout const& layout) { return (layout.integersEnd + 15) / 16 * 16; }

std::size_t GetRecordsPerBlock(ProgramLayout const& layout) {
    std::size_t const stride = GetRecordStride(layout);
    return stride == 0 ? 0 : kBlockBytes / stride;
}

std::optional<GlslStages> MakeGlslVariant(GlslVariantRequest const& request, std::string* reason) {
    try {
        return Rewrite(request);
    } catch (NotUnderstood const& refusal) {
        *reason = refusal.reason;
        return std::nullopt;
    }
}

} // namespace Moka::detail
