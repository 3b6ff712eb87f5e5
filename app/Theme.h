#pragma once

// The look shared by every screen: fonts by pixel size (a point of the screen
// measures is one device-independent pixel) and the few colours of the bars and
// rows.

#include <QColor>
#include <QFont>

namespace corvane::theme {

// The system font at `pixelSize`, regular or bold.
QFont systemFont(int pixelSize);
QFont boldSystemFont(int pixelSize);

inline const QColor kBarBackground{0xf4, 0xf6, 0xf8};
inline const QColor kBarHairline{0xc9, 0xcf, 0xd6};
inline const QColor kTint{0x0b, 0x63, 0xce};  // buttons and the back arrow
inline const QColor kDarkText{0x1b, 0x24, 0x2e};
inline const QColor kValueText{0x2c, 0x4a, 0x6b};
inline const QColor kSecondaryText{0x5d, 0x6b, 0x7a};
inline const QColor kRowBackground{0xff, 0xff, 0xff};
inline const QColor kRowSelected{0xd9, 0xe7, 0xf8};
inline const QColor kSeparator{0xe1, 0xe5, 0xea};
inline const QColor kGroupBackground{0xec, 0xef, 0xf3};

}  // namespace corvane::theme
