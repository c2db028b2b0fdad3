#include "hosts/desktop/Icons.h"

#include <QBuffer>
#include <QFile>
#include <QGuiApplication>
#include <QIconEngine>
#include <QImageReader>
#include <QPainter>
#include <QPalette>
#include <QPixmapCache>

// Resources of a static library come in by name, and only from outside every namespace.
static void LoadResources()
{
    Q_INIT_RESOURCE(icons);
}

namespace
{

class ThemedIconEngine : public QIconEngine
{
public:
    ThemedIconEngine(const QString& drawingName, const QByteArray& text) : name(drawingName), drawing(text) {}

    QIconEngine* clone() const override { return new ThemedIconEngine(name, drawing); }

    void paint(QPainter* painter, const QRect& rectangle, QIcon::Mode mode, QIcon::State state) override
    {
        const qreal ratio = painter->device() ? painter->device()->devicePixelRatioF() : 1.0;
        painter->drawPixmap(rectangle, pixmap((QSizeF(rectangle.size()) * ratio).toSize(), mode, state));
    }

    QPixmap pixmap(const QSize& size, QIcon::Mode mode, QIcon::State) override
    {
        const QColor colour = Colour(mode);
        const QString key = name + QChar('|') + colour.name(QColor::HexArgb) + QChar('|') +
                            QString::number(size.width()) + QChar('x') + QString::number(size.height());
        QPixmap result;
        if (!QPixmapCache::find(key, &result))
        {
            result = Draw(size, colour);
            QPixmapCache::insert(key, result);
        }
        return result;
    }

private:
    static QColor Colour(QIcon::Mode mode)
    {
        const QPalette palette = QGuiApplication::palette();
        if (mode == QIcon::Selected)
            return palette.color(QPalette::Active, QPalette::HighlightedText);
        return palette.color(mode == QIcon::Disabled ? QPalette::Disabled : QPalette::Active, QPalette::ButtonText);
    }

    QPixmap Draw(const QSize& size, const QColor& colour) const
    {
        QByteArray text = drawing;
        text.replace("currentColor", colour.name().toLatin1());
        QBuffer buffer(&text);
        QImageReader reader(&buffer, "svg");
        reader.setScaledSize(size);
        return QPixmap::fromImage(reader.read());
    }

    QString name;
    QByteArray drawing;
};

} // namespace

QIcon desktop::MakeIcon(const QString& name)
{
    LoadResources();
    const QString file = ":/icons/" + name + ".svg";
    QFile drawing(file);
    if (!drawing.open(QIODevice::ReadOnly))
        return {};
    return QIcon(new ThemedIconEngine(file, drawing.readAll()));
}
