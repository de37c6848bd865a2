#include "Pictures.h"

#include <QApplication>
#include <QCommandLineParser>
#include <QFontInfo>
#include <QLocale>
#include <QPalette>
#include <QProxyStyle>
#include <QStyleFactory>
#include <cstdlib>
#include <iostream>

// Draws the login panel in each of its states, for the pages in docs/. Nothing is shown on a screen.

namespace {

QPalette darkPalette() {
  QPalette palette(QColor(0x45, 0x45, 0x45), QColor(0x38, 0x38, 0x38));
  palette.setColor(QPalette::Base, QColor(0x1c, 0x1c, 0x1c));
  palette.setColor(QPalette::Highlight, QColor(0x3d, 0x7e, 0xc9));
  return palette;
}

// Nothing moves, so that every picture is of an end.
class StillStyle final : public QProxyStyle {
public:
  StillStyle(const QString& name, QObject* owner) : QProxyStyle(name) { setParent(owner); }

  int styleHint(StyleHint hint, const QStyleOption* option, const QWidget* widget,
                QStyleHintReturn* data) const override {
    return hint == SH_Widget_Animation_Duration ? 0 : QProxyStyle::styleHint(hint, option, widget, data);
  }
};

} // namespace

int main(int argc, char** argv) {
  ::setenv("QT_QPA_PLATFORM", "offscreen", 1);
  QApplication application(argc, argv);
  QCommandLineParser parser;
  parser.setApplicationDescription("Draws the login panel in each of its states.");
  parser.addHelpOption();
  parser.addPositionalArgument("folder", "where the pictures go");
  parser.addOptions({{"name", "begins the name of each picture", "name", "light"},
                     {"style", "how controls look", "style", "fusion"},
                     {"dark", "a dark palette"},
                     {"large", "a font of twice the size"},
                     {"language", "the user's language", "tag", "en"},
                     {"states", "only these, separated by commas", "names"}});
  parser.process(application);
  if (parser.positionalArguments().size() != 1) {
    parser.showHelp(EXIT_FAILURE);
  }

  if (!QStyleFactory::keys().contains(parser.value("style"), Qt::CaseInsensitive)) {
    std::cerr << "there is no style " << parser.value("style").toStdString() << '\n';
    return EXIT_FAILURE;
  }
  QApplication::setStyle(new StillStyle(parser.value("style"), &application));
  if (parser.isSet("dark")) {
    QApplication::setPalette(darkPalette());
  }
  QFont font("DejaVu Sans");
  font.setPixelSize(parser.isSet("large") ? 24 : 12);
  QApplication::setFont(font);
  QApplication::setCursorFlashTime(0); // the cursor is always seen
  QApplication::setLayoutDirection(QLocale(parser.value("language")).textDirection());
  pictures::Pictures all({.folder = parser.positionalArguments().front(),
                          .name = parser.value("name"),
                          .language = parser.value("language").toStdString(),
                          .states = parser.value("states").split(',', Qt::SkipEmptyParts)});
  return all.draw() ? EXIT_SUCCESS : EXIT_FAILURE;
}
