#include "SimShaderText.h"

#include "SimTokens.h"

#include <algorithm>
#include <cstdlib>
#include <map>

namespace Sim
{

namespace
{

struct Type
{
    const char* name;
    GLenum token;
    int components;
    GLenum scalar;
};

constexpr Type kTypes[] = {
    {"float", GL_FLOAT, 1, GL_FLOAT},
    {"vec2", GL_FLOAT_VEC2, 2, GL_FLOAT},
    {"vec3", GL_FLOAT_VEC3, 3, GL_FLOAT},
    {"vec4", GL_FLOAT_VEC4, 4, GL_FLOAT},
    {"int", GL_INT, 1, GL_INT},
    {"ivec2", GL_INT_VEC2, 2, GL_INT},
    {"ivec3", GL_INT_VEC3, 3, GL_INT},
    {"ivec4", GL_INT_VEC4, 4, GL_INT},
    {"uint", GL_UNSIGNED_INT, 1, GL_UNSIGNED_INT},
    {"uvec2", GL_UNSIGNED_INT_VEC2, 2, GL_UNSIGNED_INT},
    {"uvec3", GL_UNSIGNED_INT_VEC3, 3, GL_UNSIGNED_INT},
    {"uvec4", GL_UNSIGNED_INT_VEC4, 4, GL_UNSIGNED_INT},
    {"bool", GL_BOOL, 1, GL_BOOL},
    {"bvec2", GL_BOOL_VEC2, 2, GL_BOOL},
    {"bvec3", GL_BOOL_VEC3, 3, GL_BOOL},
    {"bvec4", GL_BOOL_VEC4, 4, GL_BOOL},
    {"mat2", GL_FLOAT_MAT2, 4, GL_FLOAT},
    {"mat3", GL_FLOAT_MAT3, 9, GL_FLOAT},
    {"mat4", GL_FLOAT_MAT4, 16, GL_FLOAT},
    {"mat2x3", GL_FLOAT_MAT2x3, 6, GL_FLOAT},
    {"mat2x4", GL_FLOAT_MAT2x4, 8, GL_FLOAT},
    {"mat3x2", GL_FLOAT_MAT3x2, 6, GL_FLOAT},
    {"mat3x4", GL_FLOAT_MAT3x4, 12, GL_FLOAT},
    {"mat4x2", GL_FLOAT_MAT4x2, 8, GL_FLOAT},
    {"mat4x3", GL_FLOAT_MAT4x3, 12, GL_FLOAT},
    {"sampler2D", GL_SAMPLER_2D, 1, GL_INT},
    {"sampler3D", GL_SAMPLER_3D, 1, GL_INT},
    {"samplerCube", GL_SAMPLER_CUBE, 1, GL_INT},
    {"sampler2DArray", GL_SAMPLER_2D_ARRAY, 1, GL_INT},
    {"sampler2DShadow", GL_SAMPLER_2D_SHADOW, 1, GL_INT},
    {"samplerCubeShadow", GL_SAMPLER_CUBE_SHADOW, 1, GL_INT},
    {"sampler2DArrayShadow", GL_SAMPLER_2D_ARRAY_SHADOW, 1, GL_INT},
    {"samplerExternalOES", 0x8D66 /* GL_SAMPLER_EXTERNAL_OES */, 1, GL_INT},
    {"isampler2D", GL_INT_SAMPLER_2D, 1, GL_INT},
    {"isampler3D", GL_INT_SAMPLER_3D, 1, GL_INT},
    {"isamplerCube", GL_INT_SAMPLER_CUBE, 1, GL_INT},
    {"isampler2DArray", GL_INT_SAMPLER_2D_ARRAY, 1, GL_INT},
    {"usampler2D", GL_UNSIGNED_INT_SAMPLER_2D, 1, GL_INT},
    {"usampler3D", GL_UNSIGNED_INT_SAMPLER_3D, 1, GL_INT},
    {"usamplerCube", GL_UNSIGNED_INT_SAMPLER_CUBE, 1, GL_INT},
    {"usampler2DArray", GL_UNSIGNED_INT_SAMPLER_2D_ARRAY, 1, GL_INT},
};

const Type* FindType(const std::string& name)
{
    const auto found = std::find_if(std::begin(kTypes), std::end(kTypes),
                                    [&](const Type& type) { return type.name == name; });
    return found == std::end(kTypes) ? nullptr : found;
}

const Type* FindType(GLenum token)
{
    const auto found = std::find_if(std::begin(kTypes), std::end(kTypes),
                                    [&](const Type& type) { return type.token == token; });
    return found == std::end(kTypes) ? nullptr : found;
}

bool IsQualifier(const std::string& word)
{
    static const char* const words[] = {"highp",    "mediump",  "lowp",      "const",
                                        "flat",     "smooth",   "centroid",  "invariant",
                                        "coherent", "readonly", "row_major", "column_major"};
    return std::find(std::begin(words), std::end(words), word) != std::end(words);
}

/// Reads the tokens of a source, one global statement after the other.
class Reader
{
public:
    explicit Reader(const TokenList& tokens) : m_tokens(tokens) {}

    Declarations Read()
    {
        while (m_at < m_tokens.words.size() && m_out.error.empty())
            ReadStatement();
        return m_out;
    }

private:
    using Members = std::vector<Variable>;

    const std::string& Peek(std::size_t ahead = 0) const
    {
        static const std::string end;
        return m_at + ahead < m_tokens.words.size() ? m_tokens.words[m_at + ahead] : end;
    }

    std::string Next()
    {
        const std::string word = Peek();
        ++m_at;
        return word;
    }

    bool Accept(const char* word)
    {
        if (Peek() != word)
            return false;
        ++m_at;
        return true;
    }

    void Fail(const std::string& text)
    {
        if (m_out.error.empty())
            m_out.error = "ERROR: 0:1: " + text + "\n";
    }

    /// Skips from an opening bracket to behind the closing one.
    void SkipGroup(const char* open, const char* close)
    {
        int depth = 0;
        while (m_at < m_tokens.words.size())
        {
            const std::string word = Next();
            depth += word == open ? 1 : word == close ? -1 : 0;
            if (depth == 0)
                return;
        }
        Fail(std::string("'") + close + "' is missing");
    }

    void SkipStatement()
    {
        while (m_at < m_tokens.words.size() && !Accept(";"))
            ++m_at;
    }

    int ReadInteger()
    {
        const std::string word = Next();
        const auto constant = m_constants.find(word);
        if (constant != m_constants.end())
            return constant->second;
        const auto define = m_tokens.defines.find(word);
        return std::atoi((define == m_tokens.defines.end() ? word : define->second).c_str());
    }

    /// layout(location = 3, std140): the location, -1 without one.
    int ReadLayout()
    {
        int location = -1;
        if (!Accept("layout"))
            return location;
        while (m_at < m_tokens.words.size() && !Accept(")"))
        {
            if (Next() == "location" && Accept("="))
                location = ReadInteger();
        }
        return location;
    }

    void ReadStatement()
    {
        if (Accept(";"))
            return;
        const int location = ReadLayout();
        while (IsQualifier(Peek()))
            ReadConstant();
        if (Peek() == "precision")
            return SkipStatement();
        if (Peek() == "struct")
            return ReadStruct();
        if (Accept("uniform"))
            return ReadUniform(location);
        if (Accept("attribute") || Accept("in"))
            return ReadVariables(location, m_out.inputs);
        if (Accept("varying") || Accept("out"))
        {
            Members ignored;
            return ReadVariables(-1, ignored);
        }
        ReadFunctionOrGlobal();
    }

    /// Skips a qualifier, and remembers the value of "const int N = 4;".
    void ReadConstant()
    {
        const bool isConstant = Next() == "const";
        while (IsQualifier(Peek()))
            ++m_at;
        if (isConstant && Peek() == "int" && Peek(2) == "=")
            m_constants[Peek(1)] = std::atoi(Peek(3).c_str());
    }

    void ReadFunctionOrGlobal()
    {
        const std::string type = Next();
        if (type != "void" && !FindType(type) && !m_structs.count(type))
            return Fail("'" + type + "' : syntax error");
        const std::string name = Next();
        if (Peek() != "(")
        {
            while (m_at < m_tokens.words.size() && Peek() != ";")
                ++m_at;
            if (!Accept(";"))
                Fail("'" + name + "' : syntax error");
            return;
        }
        SkipGroup("(", ")");
        if (Accept(";"))
            return;
        if (Peek() != "{")
            return Fail("'" + Peek() + "' : syntax error");
        SkipGroup("{", "}");
        m_out.hasMain = m_out.hasMain || name == "main";
    }

    void ReadStruct()
    {
        Next();
        const std::string name = Next();
        m_structs[name] = ReadMembers();
        if (!Accept(";"))
            Fail("';' is missing");
    }

    /// { highp vec4 a; float b[3]; }
    Members ReadMembers()
    {
        Members members;
        if (!Accept("{"))
        {
            Fail("'{' is missing");
            return members;
        }
        while (m_out.error.empty() && !Accept("}"))
        {
            ReadLayout();
            ReadVariables(-1, members);
        }
        return members;
    }

    void ReadUniform(int location)
    {
        while (IsQualifier(Peek()))
            ++m_at;
        if (Peek(1) == "{")
            return ReadBlock();
        ReadVariables(location, m_out.uniforms);
    }

    void ReadBlock()
    {
        const std::string name = Next();
        const Members members = ReadMembers();
        std::string prefix;
        int count = 0;
        if (Peek() != ";")
        {
            Next(); // the instance's name, which programs do not see
            prefix = name + ".";
            if (Accept("["))
            {
                count = ReadInteger();
                Accept("]");
            }
        }
        if (!Accept(";"))
            return Fail("';' is missing");
        const int first = static_cast<int>(m_out.blocks.size());
        for (int i = 0; i < std::max(count, 1); ++i)
        {
            UniformBlock block;
            block.name = count > 0 ? name + "[" + std::to_string(i) + "]" : name;
            m_out.blocks.push_back(block);
        }
        for (Variable member : members)
        {
            member.name = prefix + member.name;
            member.block = first;
            m_out.uniforms.push_back(member);
        }
    }

    int ReadArraySize(bool& array)
    {
        if (!Accept("["))
            return 1;
        array = true;
        const int size = ReadInteger();
        if (!Accept("]") || size < 1)
            Fail("']' : syntax error");
        return size;
    }

    /// highp vec4 a, b[2];
    void ReadVariables(int location, Members& out)
    {
        while (IsQualifier(Peek()))
            ++m_at;
        const std::string typeName = Next();
        const Type* const type = FindType(typeName);
        const auto structure = m_structs.find(typeName);
        if (!type && structure == m_structs.end())
            return Fail("'" + typeName + "' : undeclared identifier");
        bool typeIsArray = false;
        const int typeSize = ReadArraySize(typeIsArray);
        do
        {
            Variable variable;
            variable.name = Next();
            variable.array = typeIsArray;
            variable.location = location;
            const int size = ReadArraySize(variable.array);
            variable.size = std::max(size, typeSize);
            if (Accept("="))
            {
                while (m_at < m_tokens.words.size() && Peek() != ";" && Peek() != ",")
                    ++m_at;
            }
            if (type)
            {
                variable.type = type->token;
                out.push_back(variable);
            }
            else
            {
                AddStruct(variable, structure->second, out);
            }
        } while (Accept(","));
        if (!Accept(";"))
            Fail("'" + Peek() + "' : syntax error");
    }

    /// Members of structures are uniforms of their own: "light[1].color".
    void AddStruct(const Variable& variable, const Members& members, Members& out)
    {
        for (int i = 0; i < variable.size; ++i)
        {
            const std::string element = variable.array ? "[" + std::to_string(i) + "]" : "";
            for (Variable member : members)
            {
                member.name = variable.name + element + "." + member.name;
                out.push_back(member);
            }
        }
    }

    const TokenList& m_tokens;
    std::size_t m_at = 0;
    std::map<std::string, Members> m_structs;
    std::map<std::string, int> m_constants;
    Declarations m_out;
};

} // namespace

Declarations ReadShader(const std::string& source)
{
    const TokenList tokens = Tokenize(source);
    if (!tokens.error.empty())
    {
        Declarations failed;
        failed.error = tokens.error;
        return failed;
    }
    return Reader(tokens).Read();
}

int ComponentsOf(GLenum type)
{
    const Type* const row = FindType(type);
    return row ? row->components : 1;
}

bool IsSampler(GLenum type)
{
    const Type* const row = FindType(type);
    return row && std::string(row->name).find("sampler") != std::string::npos;
}

bool IsMatrix(GLenum type)
{
    const Type* const row = FindType(type);
    return row && std::string(row->name).rfind("mat", 0) == 0;
}

GLenum ScalarOf(GLenum type)
{
    const Type* const row = FindType(type);
    return row ? row->scalar : GLenum{GL_FLOAT};
}

} // namespace Sim
