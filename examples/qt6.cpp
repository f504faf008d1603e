// Draws in a QOpenGLWidget of Qt 6. Qt owns the GLES context and the frame buffer, and calls paintGL.
#include "examples/AppQueue.h"
#include "examples/Picture.h"
#include "moka/base/RefPtr.h"
#include "moka/renderer/RendererFactory.h"

#include <QApplication>
#include <QOpenGLContext>
#include <QOpenGLWidget>
#include <QSurfaceFormat>

namespace {

using namespace Moka;

class PageWidget final : public QOpenGLWidget {
public:
    ~PageWidget() override {
        if (context()) context()->disconnect(this); // the context is destroyed after this object
        Detach();
    }

protected:
    void initializeGL() override {
        mIsAttached = RendererFactory::AttachContext();
        if (!mIsAttached) return;
        RendererFactory::SetDeferred(true); // this program flushes after each frame
        // If the widget moves to another window, it gets another context.
        connect(context(), &QOpenGLContext::aboutToBeDestroyed, this, [this] { Detach(); });
    }

    void paintGL() override {
        if (!mIsAttached) return;
        int const width = static_cast<int>(this->width() * devicePixelRatio());
        int const height = static_cast<int>(this->height() * devicePixelRatio());
        RendererFactory::InvalidateState(); // Qt has used GL since the last frame
        {
            // Draws into the frame buffer that Qt has bound, which changes after a resize.
            auto const screen = RefPtr<IMKBitmap>::Adopt(
                MKGraphicsFactory::CreateScreenBitmap(&mQueue, 0, 0, width, height, 0, 1));
            auto const canvas =
                RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&mQueue, screen.Get(), 1));
            Examples::DrawPicture(*canvas, width, height);
        }
        mQueue.Run();
        RendererFactory::Flush(); // before Qt goes on
    }

private:
    void Detach() {
        if (!mIsAttached) return;
        mIsAttached = false;
        makeCurrent();
        mQueue.Run();
        RendererFactory::DetachContext();
        doneCurrent();
    }

    Examples::AppQueue mQueue; // runs on Qt's thread
    bool mIsAttached = false;
};

} // namespace

int main(int argc, char** argv) {
    QSurfaceFormat format;
    format.setRenderableType(QSurfaceFormat::OpenGLES);
    format.setVersion(3, 0);
    QSurfaceFormat::setDefaultFormat(format);
    QApplication const application(argc, argv);
    QOpenGLContext probe; // a widget without a context would end the process
    if (!probe.create() || !probe.isOpenGLES())
        return qCritical("no GLES context: see QT_XCB_GL_INTEGRATION"), 1;
    PageWidget widget;
    widget.setWindowTitle("Qt 6");
    widget.resize(320, 240);
    widget.show();
    return QApplication::exec();
}
