#pragma once

// Dialog templates give positions in dialog units, which scale with the dialog's font:
// four horizontal units per average character width, eight vertical units per line height.

#include <QFont>
#include <QRect>

namespace qtui {

class DialogUnits {
  public:
    explicit DialogUnits(const QFont& font);

    int x(int units) const;
    int y(int units) const;
    QRect rect(int x, int y, int width, int height) const;
    QSize size(int width, int height) const;

    int baseWidth() const { return m_baseWidth; }
    int baseHeight() const { return m_baseHeight; }

  private:
    int m_baseWidth;
    int m_baseHeight;
};

}  // namespace qtui
