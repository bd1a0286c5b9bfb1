#include "SimGl.h"

// Query objects and transform feedback: names and lives. Queries count nothing, feedback writes
// nothing.

using namespace Sim;

namespace
{

bool IsQueryTarget(GLenum target)
{
    return IsOneOf(target, {GL_ANY_SAMPLES_PASSED, GL_ANY_SAMPLES_PASSED_CONSERVATIVE,
                            GL_TRANSFORM_FEEDBACK_PRIMITIVES_WRITTEN});
}

/// The query that runs on the target; null when none does.
PlainObject* RunningQuery(GlEntry& entry, GLenum target)
{
    for (const auto& [name, query] : entry.Gl().queries)
    {
        if (query->active && query->target == target)
            return query.get();
    }
    return nullptr;
}

bool CheckFeedbackState(GlEntry& entry, bool active)
{
    if (entry.Gl().feedbackActive == active)
        return true;
    entry.Misuse(GL_INVALID_OPERATION,
                 active ? "there is no transform feedback" : "transform feedback is running");
    return false;
}

} // namespace

SIM_API void glGenQueries(GLsizei n, GLuint* ids)
{
    GlEntry entry("glGenQueries", {n, (const void*)ids}, 30);
    Generate(entry, entry ? &entry.Gl().queries : nullptr, n, ids);
}

SIM_API void glDeleteQueries(GLsizei n, const GLuint* ids)
{
    GlEntry entry("glDeleteQueries", {n, (const void*)ids}, 30);
    Delete(entry, entry ? &entry.Gl().queries : nullptr, n, ids,
           [&](GLuint name) { entry.Gl().queries.Erase(name); });
}

SIM_API GLboolean glIsQuery(GLuint id)
{
    GlEntry entry("glIsQuery", {id}, 30);
    const PlainObject* const query = entry ? entry.Gl().queries.Find(id) : nullptr;
    return query && query->created ? GL_TRUE : GL_FALSE;
}

SIM_API void glBeginQuery(GLenum target, GLuint id)
{
    GlEntry entry("glBeginQuery", {target, id}, 30);
    if (!entry)
        return;
    if (!IsQueryTarget(target))
        return entry.Misuse(GL_INVALID_ENUM, "no such query target: " + Hex(target));
    PlainObject* const query = entry.Gl().queries.Find(id);
    if (!query || RunningQuery(entry, target))
        return entry.Misuse(GL_INVALID_OPERATION, "no such query, or one is running");
    query->created = query->active = true;
    query->target = target;
}

SIM_API void glEndQuery(GLenum target)
{
    GlEntry entry("glEndQuery", {target}, 30);
    if (!entry)
        return;
    PlainObject* const query = RunningQuery(entry, target);
    if (!query)
        return entry.Misuse(GL_INVALID_OPERATION, "no query is running");
    query->active = false;
}

SIM_API void glGetQueryiv(GLenum target, GLenum name, GLint* params)
{
    GlEntry entry("glGetQueryiv", {target, name, (const void*)params}, 30);
    if (!entry)
        return;
    *params = 0;
    for (const auto& [id, query] : entry.Gl().queries)
    {
        if (query->active && query->target == target)
            *params = static_cast<GLint>(id);
    }
}

SIM_API void glGetQueryObjectuiv(GLuint id, GLenum name, GLuint* params)
{
    GlEntry entry("glGetQueryObjectuiv", {id, name, (const void*)params}, 30);
    if (!entry)
        return;
    const PlainObject* const query = entry.Gl().queries.Find(id);
    if (!query || query->active)
        return entry.Misuse(GL_INVALID_OPERATION, "no such query, or it is running");
    *params = name == GL_QUERY_RESULT_AVAILABLE;
}

SIM_API void glGenTransformFeedbacks(GLsizei n, GLuint* ids)
{
    GlEntry entry("glGenTransformFeedbacks", {n, (const void*)ids}, 30);
    Generate(entry, entry ? &entry.Gl().transformFeedbacks : nullptr, n, ids);
}

SIM_API void glDeleteTransformFeedbacks(GLsizei n, const GLuint* ids)
{
    GlEntry entry("glDeleteTransformFeedbacks", {n, (const void*)ids}, 30);
    Delete(entry, entry ? &entry.Gl().transformFeedbacks : nullptr, n, ids,
           [&](GLuint name) { entry.Gl().transformFeedbacks.Erase(name); });
}

SIM_API GLboolean glIsTransformFeedback(GLuint id)
{
    GlEntry entry("glIsTransformFeedback", {id}, 30);
    const PlainObject* const feedback = entry ? entry.Gl().transformFeedbacks.Find(id) : nullptr;
    return feedback && feedback->created ? GL_TRUE : GL_FALSE;
}

SIM_API void glBindTransformFeedback(GLenum target, GLuint id)
{
    GlEntry entry("glBindTransformFeedback", {target, id}, 30);
    if (!entry)
        return;
    if (target != GL_TRANSFORM_FEEDBACK)
        return entry.Misuse(GL_INVALID_ENUM, "no such target: " + Hex(target));
    if (id != 0)
        Bind(entry, entry.Gl().transformFeedbacks, id);
    entry.Gl().transformFeedback = id;
}

SIM_API void glBeginTransformFeedback(GLenum mode)
{
    GlEntry entry("glBeginTransformFeedback", {mode}, 30);
    if (entry && CheckFeedbackState(entry, false))
        entry.Gl().feedbackActive = true;
}

SIM_API void glEndTransformFeedback()
{
    GlEntry entry("glEndTransformFeedback", {}, 30);
    if (entry && CheckFeedbackState(entry, true))
        entry.Gl().feedbackActive = false;
}

SIM_API void glPauseTransformFeedback()
{
    GlEntry entry("glPauseTransformFeedback", {}, 30);
    if (entry)
        CheckFeedbackState(entry, true);
}

SIM_API void glResumeTransformFeedback()
{
    GlEntry entry("glResumeTransformFeedback", {}, 30);
    if (entry)
        CheckFeedbackState(entry, true);
}

SIM_API void glTransformFeedbackVaryings(GLuint program, GLsizei count,
                                         const GLchar* const* varyings, GLenum mode)
{
    GlEntry entry("glTransformFeedbackVaryings", {program, count, (const void*)varyings, mode}, 30);
    if (entry && CheckCount(entry, count))
        FindProgram(entry, program);
}

SIM_API void glGetTransformFeedbackVarying(GLuint program, GLuint index, GLsizei size,
                                           GLsizei* length, GLsizei* count, GLenum* type,
                                           GLchar* name)
{
    GlEntry entry("glGetTransformFeedbackVarying",
                  {program, index, size, (const void*)length, (const void*)count, (const void*)type,
                   (const void*)name},
                  30);
    if (entry && FindProgram(entry, program))
        entry.Misuse(GL_INVALID_VALUE, "there is no varying " + std::to_string(index));
}
