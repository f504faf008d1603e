// Loaded before the driver: reading pixels back is an OpenGL error as well.
#include <GLES3/gl3.h>
#include <dlfcn.h>

extern "C" __attribute__((visibility("default"))) void
glReadPixels(GLint x, GLint y, GLsizei width, GLsizei height, GLenum format, GLenum type, void* pixels) {
    auto const driver = reinterpret_cast<decltype(&glReadPixels)>(dlsym(RTLD_NEXT, "glReadPixels"));
    driver(x, y, width, height, format, type, pixels);
    glEnable(0);
}
