#pragma once

// One row of a pane screen: either the name of a section that opens (a key
// alone), or a key with its value. The key is bold; a value too long for the
// row scrolls sideways instead of being cut off.

#include <QLabel>
#include <QScrollArea>

#include "app/TableView.h"

namespace corvane {

class CorvaneCell final : public TableViewCell {
  Q_OBJECT

 public:
  // A row with only a key label, placed directly on the content area.
  static CorvaneCell* initWithStyleKey(Style style, const QString& reuseIdentifier);
  // A key/value row: both labels in a view that scrolls sideways.
  static CorvaneCell* initWithStyle(Style style, const QString& reuseIdentifier);

  // Place the labels: the key alone, or the key and its value.
  void setLayoutKey();
  void setLayout();
  using QWidget::setLayout;

  // The labels of the row, made by the initialiser: the key, and in a
  // key/value row the value and the view that scrolls both sideways (nullptr
  // in a key-only row).
  QLabel* key = nullptr;
  QLabel* value = nullptr;
  QScrollArea* view = nullptr;

  // The font that measures the key, and the value too.
  static QFont measuringFont();

 protected:
  void layoutSubviews() override;

 private:
  enum class Arrangement { None, Key, KeyAndValue };

  CorvaneCell(Style style, const QString& reuseIdentifier);
  static QLabel* makeLabel(QWidget* parent, const QFont& font, const QColor& colour);

  QWidget* scrolledContent_ = nullptr;
  Arrangement arrangement_ = Arrangement::None;
};

}  // namespace corvane
