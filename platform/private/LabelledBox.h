#pragma once

// A label with a field to its right, the two parts of a text control and of a menu field. Only for the
// layer's own sources.

#include <QWidget>

class QLabel;

// Lays out its two children whenever its size, the divider or the field's wish changes. The field is what a
// person works: it has the object name, the accessible name and the focus; the box has neither name nor focus
// of its own. The box belongs to its view; it owns label and field.
class LabelledBox : public QWidget {
    Q_DISABLE_COPY_MOVE(LabelledBox)

  public:
    // Takes the field, which has no parent yet.
    explicit LabelledBox(QWidget* field);

    // The name of box and field, for those who look widgets up.
    void SetNames(const char* name);
    void SetLabel(const char* label);
    // Width of the label's part.
    void SetDivider(int divider);
    // The field takes no more than its size hint's width.
    void LimitFieldToHint() { limited_ = true; }
    void LayOut();

    [[nodiscard]] QWidget* Field() const { return field_; }
    [[nodiscard]] QSize sizeHint() const override;

  protected:
    void resizeEvent(QResizeEvent* event) override;

  private:
    QLabel* label_ = nullptr; // there is none without a text
    QWidget* field_;
    int divider_ = 0;
    bool limited_ = false;
};
