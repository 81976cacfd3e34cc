#pragma once

// The button of a menu field. Only for the layer's own sources.

#include <QPushButton>

// Shows a text of any length, shortened in the middle to the button's width with the whole as tool tip, and
// opens its menu by press, Space, Enter, Up and Down. Where there is no room for a text it shows the arrow
// alone. The menu opens without a loop of its own, so that whatever happens meanwhile happens as ever.
// Belongs to its field's box.
class FieldButton : public QPushButton {
    Q_DISABLE_COPY_MOVE(FieldButton)

  public:
    FieldButton();

    // Borrows the menu; null takes it away.
    void SetMenu(QMenu* menu);
    void SetFullText(const QString& text);
    // What the whole text asks for.
    [[nodiscard]] QSize sizeHint() const override;

  protected:
    void resizeEvent(QResizeEvent* event) override;
    void changeEvent(QEvent* event) override;
    void showEvent(QShowEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;

  private:
    [[nodiscard]] QSize SizeFor(const QString& text) const;
    void Shorten();
    void Open();

    QString fullText_;
};
