#ifndef NIB_SIM_PROGRAMS_H
#define NIB_SIM_PROGRAMS_H

#include "SimGl.h"

namespace Sim
{

/// Shaders and programs take their names from one space.
GLuint NewProgramName(ShareGroup& group);
Shader* FindShader(GlEntry& entry, GLuint name);
/// Takes a shader that is deleted and attached nowhere out of the group.
void BuryShader(ShareGroup& group, GLuint name);
void BuryProgram(ShareGroup& group, GLuint name);

/// Makes an executable of the two sources; the text of the failure, empty on success.
std::string Link(const SimGpu& gpu, const std::string& vertexSource,
                 const std::string& fragmentSource,
                 const std::map<std::string, GLuint>& boundLocations, Executable& out);

/// The bytes of a linked program: only the driver that made them takes them, unaltered.
std::vector<unsigned char> SaveProgram(const SimGpu& gpu, const Program& program);
bool LoadProgram(const SimGpu& gpu, const void* bytes, std::size_t size, Program& program);

} // namespace Sim

#endif
