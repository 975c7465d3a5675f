#include "ui/decimal_separator.hpp"

#include <QLocale>

namespace tarn::ui {

char decimalSeparator() {
    const QString point = QLocale().decimalPoint();
    return point.size() == 1 && point[0].unicode() < 128 ? static_cast<char>(point[0].unicode())
                                                         : '.';
}

}  // namespace tarn::ui
