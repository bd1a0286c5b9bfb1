#include "sim/SimDriver.h"

#include <gtest/gtest.h>

namespace
{

constexpr const char* kVertex = "attribute vec2 a_pos;\nattribute highp vec4 a_color;\n"
                                "uniform mat4 u_matrix; /* uniform float no; */\n"
                                "varying vec4 v_color;\n"
                                "void main() { gl_Position = u_matrix * vec4(a_pos, 0, 1); }\n";
constexpr const char* kFragment = "precision mediump float;\nuniform sampler2D u_tex[4];\n"
                                  "uniform vec2 u_size, u_offset;\n"
                                  "void main() { gl_FragColor = vec4(1.0); }\n";

GLuint Compile(GLenum type, const char* source)
{
    const GLuint shader = glCreateShader(type);
    glShaderSource(shader, 1, &source, nullptr);
    glCompileShader(shader);
    return shader;
}

GLint ShaderStatus(GLuint shader)
{
    GLint status = -1;
    glGetShaderiv(shader, GL_COMPILE_STATUS, &status);
    return status;
}

GLint LinkStatus(GLuint program)
{
    GLint status = -1;
    glGetProgramiv(program, GL_LINK_STATUS, &status);
    return status;
}

GLuint Build()
{
    const GLuint vertex = Compile(GL_VERTEX_SHADER, kVertex);
    const GLuint fragment = Compile(GL_FRAGMENT_SHADER, kFragment);
    const GLuint program = glCreateProgram();
    glAttachShader(program, vertex);
    glAttachShader(program, fragment);
    glBindAttribLocation(program, 0, "a_pos");
    glBindAttribLocation(program, 1, "a_color");
    glLinkProgram(program);
    glDetachShader(program, vertex);
    glDetachShader(program, fragment);
    glDeleteShader(vertex);
    glDeleteShader(fragment);
    return program;
}

TEST(SimProgram, DeclarationsBecomeActive)
{
    SimDriver driver;
    const SimContext context(driver);
    const GLuint program = Build();
    ASSERT_EQ(LinkStatus(program), 1);

    const SimProgramState state = driver.Program(program);
    EXPECT_EQ(state.attributes, (std::map<std::string, int>{{"a_color", 1}, {"a_pos", 0}}));
    ASSERT_EQ(state.uniforms.size(), 4u);
    EXPECT_EQ(state.uniforms[0].name, "u_matrix");
    EXPECT_EQ(state.uniforms[0].type, GLenum{GL_FLOAT_MAT4});
    EXPECT_EQ(state.uniforms[1].name, "u_tex[0]");
    EXPECT_EQ(state.uniforms[1].size, 4);
    EXPECT_EQ(state.uniforms[2].name, "u_size");
    EXPECT_EQ(state.uniforms[3].name, "u_offset");
    EXPECT_EQ(glGetUniformLocation(program, "u_tex[2]"), state.uniforms[1].location + 2);
    EXPECT_EQ(glGetUniformLocation(program, "u_tex[4]"), -1);
    EXPECT_EQ(driver.Live().shaders, 0);
    glDeleteProgram(program);
    EXPECT_EQ(driver.Live().programs, 0);
}

TEST(SimProgram, ErrorDirectiveFailsToCompile)
{
    SimDriver driver;
    const SimContext context(driver);
    const GLuint shader = Compile(GL_VERTEX_SHADER, "void main() {}\n#error no luck\n");

    EXPECT_EQ(ShaderStatus(shader), 0);
    char log[64] = "";
    glGetShaderInfoLog(shader, sizeof log, nullptr, log);
    EXPECT_STREQ(log, "ERROR: 0:2: 'no luck' : error\n");
}

TEST(SimProgram, BinaryLoadsUnlessAltered)
{
    SimDriver driver;
    const SimContext context(driver);
    const GLuint program = Build();
    GLint length = 0;
    glGetProgramiv(program, GL_PROGRAM_BINARY_LENGTH, &length);
    ASSERT_GT(length, 0);
    std::vector<unsigned char> bytes(static_cast<std::size_t>(length));
    GLenum format = 0;
    glGetProgramBinary(program, length, nullptr, &format, bytes.data());

    const GLuint copy = glCreateProgram();
    glProgramBinary(copy, format, bytes.data(), length);
    EXPECT_EQ(LinkStatus(copy), 1);
    EXPECT_EQ(driver.Program(copy).attributes.at("a_color"), 1);

    bytes[40] ^= 1;
    glProgramBinary(copy, format, bytes.data(), length);
    EXPECT_EQ(LinkStatus(copy), 0);
}

TEST(SimProgram, UniformsKeepTheirValues)
{
    SimDriver driver;
    const SimContext context(driver);
    const GLuint program = Build();
    glUseProgram(program);
    const float size[] = {3, 4};
    glUniform2fv(glGetUniformLocation(program, "u_size"), 1, size);
    glUniform1i(glGetUniformLocation(program, "u_tex[3]"), 2);

    EXPECT_EQ(driver.Program(program).uniforms[2].values, (std::vector<double>{3, 4}));
    EXPECT_EQ(driver.Program(program).uniforms[1].values, (std::vector<double>{0, 0, 0, 2}));
}

} // namespace
