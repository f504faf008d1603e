// Draws in a GtkGLArea of GTK 4. GTK owns the GLES context and the frame buffer, and calls the render
// handler.
#include "examples/AppQueue.h"
#include "examples/Picture.h"
#include "moka/base/RefPtr.h"
#include "moka/renderer/RendererFactory.h"

#include <gtk/gtk.h>

namespace {

using namespace Moka;

Examples::AppQueue queue; // runs on GTK's thread

int status = 0;

void Realize(GtkGLArea* area, gpointer) {
    gtk_gl_area_make_current(area);
    GError const* const error = gtk_gl_area_get_error(area);
    if (!error && RendererFactory::AttachContext()) return RendererFactory::SetDeferred(true);
    g_printerr("no GLES context: %s\n", error ? error->message : "GTK's is not OpenGL ES 3.0");
    status = 1;
    g_application_quit(g_application_get_default());
}

gboolean Render(GtkGLArea* area, GdkGLContext*, gpointer) {
    int const scale = gtk_widget_get_scale_factor(GTK_WIDGET(area));
    int const width = gtk_widget_get_width(GTK_WIDGET(area)) * scale;
    int const height = gtk_widget_get_height(GTK_WIDGET(area)) * scale;
    RendererFactory::InvalidateState(); // GTK has used GL since the last frame
    {
        // Draws into the frame buffer that GTK has bound, which changes after a resize.
        auto const screen = RefPtr<IMKBitmap>::Adopt(
            MKGraphicsFactory::CreateScreenBitmap(&queue, 0, 0, width, height, 0, 1));
        auto const canvas =
            RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&queue, screen.Get(), 1));
        Examples::DrawPicture(*canvas, width, height);
    }
    queue.Run();
    RendererFactory::Flush(); // before GTK goes on
    return TRUE;
}

void Unrealize(GtkGLArea* area, gpointer) {
    gtk_gl_area_make_current(area);
    if (gtk_gl_area_get_error(area)) return;
    queue.Run();
    RendererFactory::DetachContext();
}

void Activate(GtkApplication* application, gpointer) {
    GtkWidget* const window = gtk_application_window_new(application);
    GtkWidget* const area = gtk_gl_area_new();
    gtk_gl_area_set_use_es(GTK_GL_AREA(area), TRUE);
    gtk_gl_area_set_required_version(GTK_GL_AREA(area), 3, 0);
    g_signal_connect(area, "realize", G_CALLBACK(Realize), nullptr);
    g_signal_connect(area, "render", G_CALLBACK(Render), nullptr);
    g_signal_connect(area, "unrealize", G_CALLBACK(Unrealize), nullptr);
    gtk_window_set_title(GTK_WINDOW(window), "GTK 4");
    gtk_window_set_decorated(GTK_WINDOW(window), FALSE);
    gtk_window_set_default_size(GTK_WINDOW(window), 320, 240);
    gtk_window_set_child(GTK_WINDOW(window), area);
    gtk_window_present(GTK_WINDOW(window));
}

} // namespace

int main(int argc, char** argv) {
    g_autoptr(GtkApplication) application = gtk_application_new(nullptr, G_APPLICATION_NON_UNIQUE);
    g_signal_connect(application, "activate", G_CALLBACK(Activate), nullptr);
    int const failure = g_application_run(G_APPLICATION(application), argc, argv);
    return failure != 0 ? failure : status;
}
