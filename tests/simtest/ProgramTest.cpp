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

TEST(SimProgram, BlocksAndTheirMembers)
{
    SimDriver driver;
    const SimContext context(driver);
    const GLuint vertex =
        Compile(GL_VERTEX_SHADER, "#version 300 es\n"
                                  "layout(location = 3) in vec2 a_pos;\n"
                                  "layout(std140) uniform Frame { mat4 m; vec2 size; };\n"
                                  "uniform Light { vec4 color; } u_light;\n"
                                  "void main() { gl_Position = m * vec4(a_pos, 0, 1); }\n");
    const GLuint fragment =
        Compile(GL_FRAGMENT_SHADER, "#version 300 es\nout vec4 color;\nvoid main() {}\n");
    const GLuint program = glCreateProgram();
    glAttachShader(program, vertex);
    glAttachShader(program, fragment);
    glLinkProgram(program);
    ASSERT_EQ(LinkStatus(program), 1);

    EXPECT_EQ(glGetUniformBlockIndex(program, "Frame"), 0u);
    EXPECT_EQ(glGetUniformBlockIndex(program, "Light"), 1u);
    EXPECT_EQ(glGetUniformBlockIndex(program, "None"), GL_INVALID_INDEX);
    EXPECT_EQ(glGetUniformLocation(program, "m"), -1);
    EXPECT_EQ(glGetAttribLocation(program, "a_pos"), 3);
    GLint size = 0;
    glGetActiveUniformBlockiv(program, 0, GL_UNIFORM_BLOCK_DATA_SIZE, &size);
    EXPECT_EQ(size, 80);
    glUniformBlockBinding(program, 1, 2);
    EXPECT_EQ(driver.Program(program).blocks[1].binding, 2u);
    EXPECT_EQ(driver.Program(program).uniforms[2].name, "Light.color");
}

TEST(SimProgram, ActiveNamesAreCut)
{
    SimDriver driver;
    const SimContext context(driver);
    const GLuint program = Build();
    char name[5] = "";
    GLsizei length = 0;
    GLint size = 0;
    GLenum type = 0;
    glGetActiveUniform(program, 0, sizeof name, &length, &size, &type, name);
    EXPECT_STREQ(name, "u_ma");
    EXPECT_EQ(length, 4);
    EXPECT_EQ(type, GLenum{GL_FLOAT_MAT4});
}

TEST(SimProgram, UnboundAttributesDoNotFollowTheSource)
{
    SimDriver driver;
    const SimContext context(driver);
    const GLuint vertex =
        Compile(GL_VERTEX_SHADER, "attribute vec2 z;\nattribute vec2 a;\nvoid main() {}\n");
    const GLuint fragment = Compile(GL_FRAGMENT_SHADER, "void main() {}\n");
    const GLuint program = glCreateProgram();
    glAttachShader(program, vertex);
    glAttachShader(program, fragment);
    glLinkProgram(program);
    EXPECT_EQ(driver.Program(program).attributes, (std::map<std::string, int>{{"a", 0}, {"z", 1}}));
}

TEST(SimProgram, FailuresMayBeInjected)
{
    SimDriver driver;
    const SimContext context(driver);
    driver.FailCompile("vertex log");
    const GLuint shader = Compile(GL_VERTEX_SHADER, kVertex);
    EXPECT_EQ(ShaderStatus(shader), 0);
    glCompileShader(shader);
    EXPECT_EQ(ShaderStatus(shader), 1);
    driver.FailLink("link log");
    const GLuint program = Build();
    EXPECT_EQ(LinkStatus(program), 0);
    char log[32] = "";
    glGetProgramInfoLog(program, sizeof log, nullptr, log);
    EXPECT_STREQ(log, "link log");
}

TEST(SimProgram, BinariesNeedAFormat)
{
    SimDriver driver(SimGpu::Default().WithoutProgramBinaries());
    const SimContext context(driver);
    const GLuint program = Build();
    GLint length = 5;
    glGetProgramiv(program, GL_PROGRAM_BINARY_LENGTH, &length);
    EXPECT_EQ(length, 0);
    GLenum format = 0;
    glGetProgramBinary(program, 0, nullptr, &format, nullptr);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_OPERATION});
}

TEST(SimProgram, AUniformOfAnotherTypeIsMisuse)
{
    SimDriver driver;
    driver.ExpectMisuse("glUniform1f");
    const SimContext context(driver);
    const GLuint program = Build();
    glUseProgram(program);
    glUniform1f(glGetUniformLocation(program, "u_size"), 1);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_OPERATION});
    glUniform1f(-1, 1);
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

TEST(SimProgram, ADeletedProgramLivesWhileItIsUsed)
{
    SimDriver driver;
    const SimContext context(driver);
    const GLuint program = Build();
    glUseProgram(program);
    glDeleteProgram(program);
    EXPECT_EQ(driver.Live().programs, 1);
    glUseProgram(0);
    EXPECT_EQ(driver.Live().programs, 0);
}

TEST(SimProgram, AnUnknownProgramIsMisuse)
{
    SimDriver driver;
    driver.ExpectMisuse("glDeleteProgram");
    const SimContext context(driver);
    glDeleteProgram(0xFFFFFFFF);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_VALUE});
}

TEST(SimProgram, AnAttributeWithoutABufferIsMisuse)
{
    SimDriver driver;
    driver.ExpectMisuse("glDrawArrays");
    const SimContext context(driver);
    glUseProgram(Build());
    glEnableVertexAttribArray(5); // no attribute of the program
    glDrawArrays(GL_TRIANGLES, 0, 3);
    EXPECT_TRUE(driver.Misuses().empty());
    glEnableVertexAttribArray(1);
    glDrawArrays(GL_TRIANGLES, 0, 3);

    EXPECT_EQ(driver.Misuses(), std::vector<std::string>{"glDrawArrays: attribute 'a_color' is "
                                                         "enabled, and has no buffer"});
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

} // namespace
