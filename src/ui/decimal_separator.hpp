// The decimal separator the windows' number entries accept besides the point.
#pragma once

namespace tarn::ui {

// The locale's decimal separator as one character; the point when the locale's is wider.
char decimalSeparator();

}  // namespace tarn::ui
