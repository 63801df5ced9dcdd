// Control ids of the dialog. They change with its state: the same button bears one id after the
// other, IDOK (1) and IDCANCEL (2) among them.
#pragma once

#include "core/hooks.h"

inline constexpr int IDC_LOGO = 900;  // clickable
// IDC_MESSAGE, 901, is in core/hooks.h.
inline constexpr int IDC_DIRECTORY = 903;
inline constexpr int IDC_BROWSE = 904;
inline constexpr int IDC_FAILURE_END = 906;  // the rightmost button on the failure page
inline constexpr int IDC_NEXT = 907;         // the middle button at the start
inline constexpr int IDC_REMOVE = 908;       // the left button; the middle one on a removal page
inline constexpr int IDC_UPDATE = 909;       // the middle button on an update page
inline constexpr int IDC_BANNER = 910;
inline constexpr int IDC_LINK = 911;  // web address, clickable
inline constexpr int IDC_LANGUAGE = 917;
inline constexpr int IDC_LANGUAGE_LABEL = 918;
inline constexpr int IDC_DETAILS = 919;  // on an end page what was the middle button
inline constexpr int IDC_SPACE = 921;
