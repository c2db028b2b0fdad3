#include "VrmlText.h"

#include <algorithm>
#include <map>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string_view>
#include <vector>

#include "base/Numbers.h"
#include "base/Paths.h"
#include "base/Text.h"
#include "Preparation.h"

namespace
{

constexpr std::size_t maxDepth = 300;
constexpr double maxGlShininess = 128; ///< what 1.0 stands for in the file

struct Token
{
    enum Kind
    {
        end,
        word,   ///< names, numbers, keywords
        string, ///< with its quotes
        mark,   ///< one of { } [ ]
    };
    Kind kind = end;
    std::size_t begin = 0;
    std::string_view text;

    bool Is(std::string_view what) const { return text == what; }
};

class Scanner
{
public:
    explicit Scanner(std::string_view vrml) : text(vrml) {}

    Token Next()
    {
        SkipBlanks();
        const std::size_t begin = at;
        if (at == text.size())
            return {Token::end, begin, {}};
        const char c = text[at++];
        if (std::string_view("{}[]").find(c) != std::string_view::npos)
            return {Token::mark, begin, text.substr(begin, 1)};
        if (c == '"')
        {
            while (at < text.size() && text[at] != '"')
                at += text[at] == '\\' ? 2 : 1;
            at = std::min(at + 1, text.size());
            return {Token::string, begin, text.substr(begin, at - begin)};
        }
        while (at < text.size() && std::string_view(" \t\r\n,{}[]\"#").find(text[at]) == std::string_view::npos)
            ++at;
        return {Token::word, begin, text.substr(begin, at - begin)};
    }

private:
    void SkipBlanks()
    {
        while (at < text.size())
        {
            if (text[at] == '#')
                at = std::min(text.find('\n', at), text.size());
            else if (std::string_view(" \t\r\n,").find(text[at]) != std::string_view::npos)
                ++at;
            else
                return;
        }
    }

    std::string_view text;
    std::size_t at = 0;
};

/// A name given by DEF, with the places where it is used, for a name may have to change.
struct Definition
{
    std::string name;
    std::size_t begin = 0; ///< of the name
    std::vector<std::size_t> uses;
    bool twoSided = false;
};

/// A node or a list that is open at the place reached.
struct Frame
{
    std::string type;                       ///< empty for a list or the body of a prototype
    std::size_t begin = 0;                  ///< of the type's name
    std::size_t bodyBegin = 0;              ///< behind the brace
    std::shared_ptr<Definition> definition; ///< null for an unnamed node
    std::vector<std::string> fields;
    std::vector<Token> urls;
    bool isList = false;
    bool twoSided = false;
};

struct Edit
{
    std::size_t begin;
    std::size_t length;
    std::string text;
};

bool HasField(const Frame& frame, std::string_view name)
{
    return std::find(frame.fields.begin(), frame.fields.end(), name) != frame.fields.end();
}

class Rewriter
{
public:
    Rewriter(std::string_view vrml, ReadContext& readContext) : text(vrml), context(readContext), scanner(vrml) {}

    std::string Run()
    {
        for (Token token = scanner.Next(); token.kind != Token::end; token = scanner.Next())
            Take(token);
        if (!stack.empty())
            throw std::runtime_error("it ends in the middle of a node");
        for (const auto& definition : definitions)
            if (definition->twoSided)
                Rename(*definition);
        return Apply();
    }

private:
    void Take(const Token& token)
    {
        if (token.Is("{"))
            OpenNode(token);
        else if (token.Is("["))
        {
            Frame list;
            list.isList = true;
            Open(std::move(list));
        }
        else if (token.Is("}") || token.Is("]"))
            Close(token);
        else if (token.kind == Token::string)
        {
            if (Frame* node = Node(); node && lastField == "url")
                node->urls.push_back(token);
        }
        else if (previous.Is("DEF"))
        {
            defined = std::make_shared<Definition>();
            defined->name = token.text;
            defined->begin = token.begin;
        }
        else if (previous.Is("USE"))
            Use(token);
        else if (Frame* node = Node(); node && !stack.back().isList)
        {
            if (lastField == "solid" && token.Is("FALSE"))
                node->twoSided = true;
            node->fields.emplace_back(token.text); // values come along; no field has a value's name
            lastField = token.text;
        }
        previous = token;
    }

    void Open(Frame frame)
    {
        if (stack.size() >= maxDepth)
            throw std::runtime_error("its nodes are nested too deeply");
        stack.push_back(std::move(frame));
    }

    void OpenNode(const Token& brace)
    {
        Frame frame;
        frame.bodyBegin = brace.begin + 1;
        if (previous.kind == Token::word)
        {
            frame.type = previous.text;
            frame.begin = previous.begin;
            frame.definition = std::move(defined);
            if (frame.definition)
            {
                definitions.push_back(frame.definition);
                latest[frame.definition->name] = frame.definition;
            }
        }
        defined = nullptr;
        lastField.clear();
        Open(std::move(frame));
    }

    void Close(const Token& token)
    {
        if (stack.empty() || stack.back().isList != token.Is("]"))
            throw std::runtime_error("its brackets don't match at byte " + std::to_string(token.begin));
        Frame frame = std::move(stack.back());
        stack.pop_back();
        lastField.clear();
        if (frame.isList)
            return;
        if (frame.type == "Material")
            FillMaterial(frame);
        else if (frame.type == "ImageTexture")
            TakeTexture(frame);
        else if (frame.type == "Inline")
            TakeInline(frame, token.begin + 1);
        else if (frame.twoSided)
            MarkTwoSided(frame);
    }

    /// The innermost node that isn't a list.
    Frame* Node()
    {
        for (auto frame = stack.rbegin(); frame != stack.rend(); ++frame)
            if (!frame->isList)
                return &*frame;
        return nullptr;
    }

    void Use(const Token& token)
    {
        const auto at = latest.find(std::string(token.text));
        if (at == latest.end())
            return;
        at->second->uses.push_back(token.begin);
        if (Frame* node = Node(); node && node->type == "Shape" && twoSidedGeometries.contains(at->second.get()))
            node->twoSided = true;
    }

    void FillMaterial(const Frame& frame)
    {
        const ModelRequest& request = context.request;
        std::string fields;
        if (const auto value = request.Number("useAmbientIntensity"); value && !HasField(frame, "ambientIntensity"))
            fields += " ambientIntensity " + base::FormatDouble(*value);
        if (const auto value = request.Number("useShininess"); value && !HasField(frame, "shininess"))
            fields += " shininess " + base::FormatDouble(*value / maxGlShininess);
        if (const auto value = request.Number("useSpecularity"); value && !HasField(frame, "specularColor"))
            for (const char* part : {" specularColor ", " ", " "})
                fields += part + base::FormatDouble(*value);
        if (!fields.empty())
            edits.push_back({frame.bodyBegin, 0, fields + " "});
    }

    static std::string Unquoted(const Token& token)
    {
        std::string result;
        const std::string_view inner = token.text.substr(1, std::max<std::size_t>(token.text.size(), 2) - 2);
        for (std::size_t i = 0; i < inner.size(); ++i)
        {
            if (inner[i] == '\\' && i + 1 < inner.size() && (inner[i + 1] == '"' || inner[i + 1] == '\\'))
                ++i;
            result += inner[i];
        }
        return result;
    }

    static std::string Quoted(const std::string& path)
    {
        std::string result = "\"";
        for (const char c : path)
            (result += c == '"' || c == '\\' ? "\\" : "") += c;
        return result + "\"";
    }

    /// The first of the places the file names where there is a file; all are alternatives.
    std::string FindFirst(const Frame& frame, const char* what)
    {
        for (std::size_t i = 0; i < frame.urls.size(); ++i)
        {
            const std::vector<std::string> before = context.report.warnings;
            if (std::string path = context.Find(Unquoted(frame.urls[i]), what); !path.empty())
                return path;
            if (i + 1 < frame.urls.size())
                context.report.warnings = before;
        }
        return {};
    }

    void TakeTexture(const Frame& frame)
    {
        const std::string path = FindFirst(frame, "texture");
        if (path.empty())
            return;
        context.textures.insert(path);
        for (const Token& url : frame.urls)
            edits.push_back({url.begin, url.text.size(), &url == &frame.urls.front() ? Quoted(path) : std::string()});
    }

    void TakeInline(const Frame& frame, std::size_t end)
    {
        const std::string path = FindFirst(frame, "part");
        if (context.request.IsOn("autoloadProxies", true) && !path.empty())
        {
            for (const Token& url : frame.urls)
                edits.push_back(
                    {url.begin, url.text.size(), &url == &frame.urls.front() ? Quoted(path) : std::string()});
            return;
        }
        edits.push_back({frame.begin, end - frame.begin, "Group { }"});
        if (path.empty())
            return;
        const Definition* definition = frame.definition.get();
        for (auto outer = stack.rbegin(); outer != stack.rend() && !definition; ++outer)
            definition = outer->definition.get();
        context.report.parts.emplace_back(definition ? definition->name : std::string(),
                                          base::Utf8(base::InnerPath(path)));
    }

    /// A geometry says it, its shape can carry the mark: the stock reader keeps the names of shapes.
    void MarkTwoSided(const Frame& frame)
    {
        if (frame.type != "Shape")
        {
            if (Frame* shape = Node(); shape && shape->type == "Shape")
                shape->twoSided = true;
            if (frame.definition)
                twoSidedGeometries[frame.definition.get()] = true;
        }
        else if (frame.definition)
            frame.definition->twoSided = true;
        else
            edits.push_back({frame.begin, 0, std::string("DEF ") + twoSidedMark + " "});
    }

    void Rename(const Definition& definition)
    {
        edits.push_back({definition.begin + definition.name.size(), 0, twoSidedMark});
        for (const std::size_t use : definition.uses)
            edits.push_back({use + definition.name.size(), 0, twoSidedMark});
    }

    std::string Apply()
    {
        std::stable_sort(edits.begin(), edits.end(), [](const Edit& a, const Edit& b) { return a.begin < b.begin; });
        std::string result;
        std::size_t at = 0;
        for (const Edit& edit : edits)
        {
            if (edit.begin < at)
                continue; // inside something that was taken out
            result.append(text.substr(at, edit.begin - at)).append(edit.text);
            at = edit.begin + edit.length;
        }
        return result.append(text.substr(std::min(at, text.size())));
    }

    std::string_view text;
    ReadContext& context;
    Scanner scanner;
    Token previous;
    std::string lastField;
    std::vector<Frame> stack;
    std::shared_ptr<Definition> defined; ///< named by DEF, its node not open yet
    std::vector<std::shared_ptr<Definition>> definitions;
    std::map<std::string, std::shared_ptr<Definition>> latest;
    std::map<const Definition*, bool> twoSidedGeometries;
    std::vector<Edit> edits;
};

} // namespace

PreparedText PrepareVrml(std::string content, ReadContext& context)
{
    PreparedText prepared;
    prepared.hasTurnedRoot = true;
    prepared.text = content.starts_with("#VRML V2.0") ? Rewriter(content, context).Run() : std::move(content);
    return prepared;
}
