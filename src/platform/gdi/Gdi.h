#pragma once

#include "zelctl_export.h"

#include "platform/OleColor.h"
#include "platform/WindowHandles.h"

#include <QString>
#include <QtGlobal>

#include <array>

// The software raster layer: bitmaps, memory device contexts, blits, alpha blending and a
// few drawing calls, with the names and meanings the controls' drawing code was written
// against. Objects are integer handles in one table, so they can travel through public
// interfaces as numbers; a stale handle or a handle of the wrong kind makes a call fail
// (false, 0 or CLR_INVALID), never crash. Only text needs a QGuiApplication.
//
// Objects belong to the thread that uses them; the handle table itself may be used from
// any thread.
namespace zelctl::gdi {

using HGDIOBJ = qint32;
using HDC = HGDIOBJ;
using HBITMAP = HGDIOBJ;
using HBRUSH = HGDIOBJ;
using HPEN = HGDIOBJ;
using HFONT = HGDIOBJ;
using HWND = platform::HWND;

// 0x00BBGGRR; system colours (high bit set) are resolved when they are used.
using COLORREF = platform::OleColor;
using platform::GetSysColor;

inline constexpr COLORREF CLR_INVALID = 0xFFFFFFFFu;

// Raster operations.
inline constexpr quint32 SRCCOPY = 0x00CC0020u;
inline constexpr quint32 SRCAND = 0x008800C6u;
inline constexpr quint32 SRCPAINT = 0x00EE0086u;

// Stretch modes. BLACKONWHITE and WHITEONBLACK are kept and reported back but sample like
// COLORONCOLOR, which is also the mode of a new DC.
inline constexpr int BLACKONWHITE = 1;
inline constexpr int WHITEONBLACK = 2;
inline constexpr int COLORONCOLOR = 3;
inline constexpr int HALFTONE = 4;

// Pen modes for lines and dots.
inline constexpr int R2_XORPEN = 7;
inline constexpr int R2_COPYPEN = 13;

// Pen styles.
inline constexpr int PS_SOLID = 0;
inline constexpr int PS_NULL = 5;

// Bitmap header values.
inline constexpr quint32 BI_RGB = 0;
inline constexpr quint32 DIB_RGB_COLORS = 0;

// AlphaBlend.
inline constexpr quint8 AC_SRC_OVER = 0;
inline constexpr quint8 AC_SRC_ALPHA = 1;

// Object types (GetObjectType, GetCurrentObject).
inline constexpr int OBJ_PEN = 1;
inline constexpr int OBJ_BRUSH = 2;
inline constexpr int OBJ_FONT = 6;
inline constexpr int OBJ_BITMAP = 7;
inline constexpr int OBJ_MEMDC = 10;

// Stock objects (GetStockObject). Deleting one is harmless and does nothing.
inline constexpr int WHITE_BRUSH = 0;
inline constexpr int BLACK_BRUSH = 4;
inline constexpr int NULL_BRUSH = 5;
inline constexpr int WHITE_PEN = 6;
inline constexpr int BLACK_PEN = 7;
inline constexpr int NULL_PEN = 8;

// RedrawWindow flags.
inline constexpr quint32 RDW_INVALIDATE = 0x0001;
inline constexpr quint32 RDW_UPDATENOW = 0x0100;

struct POINT
{
    qint32 x = 0;
    qint32 y = 0;
};

struct SIZE
{
    qint32 cx = 0;
    qint32 cy = 0;
};

// Right and bottom are outside the rectangle.
struct RECT
{
    qint32 left = 0;
    qint32 top = 0;
    qint32 right = 0;
    qint32 bottom = 0;
};

struct RGBQUAD
{
    quint8 rgbBlue = 0;
    quint8 rgbGreen = 0;
    quint8 rgbRed = 0;
    quint8 rgbReserved = 0;
};
static_assert(sizeof(RGBQUAD) == 4);

// A colour table entry from 0x00RRGGBB, the order bitmap colour tables are written in.
constexpr RGBQUAD rgbQuad(quint32 rrggbb)
{
    return RGBQUAD { quint8(rrggbb), quint8(rrggbb >> 8), quint8(rrggbb >> 16), 0 };
}

struct BITMAPINFOHEADER
{
    quint32 biSize = 40;
    // Pixels; a negative height is a top-down bitmap (first row in memory is the top one).
    qint32 biWidth = 0;
    qint32 biHeight = 0;
    quint16 biPlanes = 1;
    // 1, 4, 8, 24 or 32.
    quint16 biBitCount = 0;
    quint32 biCompression = BI_RGB;
    quint32 biSizeImage = 0;
    qint32 biXPelsPerMeter = 0;
    qint32 biYPelsPerMeter = 0;
    // Colour table entries given; 0 means all 2^biBitCount.
    quint32 biClrUsed = 0;
    quint32 biClrImportant = 0;
};

struct BITMAPINFO
{
    BITMAPINFOHEADER bmiHeader;
    std::array<RGBQUAD, 256> bmiColors {};
};

struct BITMAP
{
    qint32 bmType = 0;
    qint32 bmWidth = 0;
    // Always positive; see DIBSECTION for the orientation.
    qint32 bmHeight = 0;
    qint32 bmWidthBytes = 0;
    quint16 bmPlanes = 1;
    quint16 bmBitsPixel = 0;
    void *bmBits = nullptr;
};

struct DIBSECTION
{
    BITMAP dsBm;
    BITMAPINFOHEADER dsBmih;
};

struct BLENDFUNCTION
{
    quint8 BlendOp = AC_SRC_OVER;
    quint8 BlendFlags = 0;
    quint8 SourceConstantAlpha = 255;
    quint8 AlphaFormat = 0;
};

// --- Device contexts -------------------------------------------------------------------

// A memory DC. hdc 0 stands for the screen. A new DC has a 1 × 1 stock bitmap selected,
// text colour black, background colour white, COLORONCOLOR, brush origin (0, 0), the
// white brush, the black pen and R2_COPYPEN.
ZELCTL_EXPORT HDC CreateCompatibleDC(HDC hdc);
// Deletes the DC; the objects selected into it stay alive and become deletable.
ZELCTL_EXPORT bool DeleteDC(HDC hdc);

// Selects a bitmap, brush, pen or font and returns the previously selected object of the
// same kind, or 0 when hdc or the object is not valid. A bitmap may be selected into
// several DCs at once.
ZELCTL_EXPORT HGDIOBJ SelectObject(HDC hdc, HGDIOBJ object);
// The object of a type (OBJ_BITMAP, OBJ_BRUSH, OBJ_PEN, OBJ_FONT) selected in hdc, or 0.
ZELCTL_EXPORT HGDIOBJ GetCurrentObject(HDC hdc, int type);

// Each setter returns the previous value, or CLR_INVALID / 0 when hdc is not a DC.
ZELCTL_EXPORT COLORREF SetTextColor(HDC hdc, COLORREF color);
ZELCTL_EXPORT COLORREF GetTextColor(HDC hdc);
ZELCTL_EXPORT COLORREF SetBkColor(HDC hdc, COLORREF color);
ZELCTL_EXPORT COLORREF GetBkColor(HDC hdc);
// Modes 1 to 4; others are refused with 0.
ZELCTL_EXPORT int SetStretchBltMode(HDC hdc, int mode);
ZELCTL_EXPORT int GetStretchBltMode(HDC hdc);
ZELCTL_EXPORT bool SetBrushOrgEx(HDC hdc, int x, int y, POINT *previous = nullptr);
// R2_COPYPEN or R2_XORPEN; others are refused with 0.
ZELCTL_EXPORT int SetROP2(HDC hdc, int mode);
ZELCTL_EXPORT int GetROP2(HDC hdc);

// --- Bitmaps ---------------------------------------------------------------------------

// A device-independent bitmap of 1, 4, 8, 24 or 32 bits per pixel, uncompressed, rows
// padded to 32 bits, all bytes 0. *bits (when given) receives the pixel memory, which
// lives until the bitmap is deleted. Colour tables of 1, 4 and 8 bits hold 2^bits entries:
// the first biClrUsed (or all) from bmiColors, the rest black. 0 on any invalid header or
// when the bitmap would be too large; hdc is not used and may be 0.
ZELCTL_EXPORT HBITMAP CreateDIBSection(HDC hdc, const BITMAPINFO *info, quint32 usage, void **bits);
// A bitmap of the format of the bitmap selected in hdc (colour table included); 32 bits,
// top-down, for the screen or a DC that still holds its stock bitmap.
ZELCTL_EXPORT HBITMAP CreateCompatibleBitmap(HDC hdc, int width, int height);

// Colour table of the bitmap selected in hdc: entries [start, start + count) clipped to the
// table. Return the number of entries set or read; 0 for a bitmap without a table.
ZELCTL_EXPORT quint32 SetDIBColorTable(HDC hdc, quint32 start, quint32 count, const RGBQUAD *colors);
ZELCTL_EXPORT quint32 GetDIBColorTable(HDC hdc, quint32 start, quint32 count, RGBQUAD *colors);

// Copies rows of a bitmap into bits in the format of info->bmiHeader (1, 4, 8, 24 or 32
// bits, the orientation from the sign of biHeight). Rows are counted from the bottom, as
// for a bottom-up bitmap. With bits null, fills info with the bitmap's header and colour
// table instead. Returns the number of rows copied (the height when bits is null), 0 on
// failure. A bitmap of 8 bits or less read into a different depth goes through its table;
// into a table-based format the colours are matched to the nearest entry of info's table.
ZELCTL_EXPORT int GetDIBits(
    HDC hdc, HBITMAP bitmap, quint32 start, quint32 lines, void *bits, BITMAPINFO *info, quint32 usage);

// --- Objects ---------------------------------------------------------------------------

ZELCTL_EXPORT HBRUSH CreateSolidBrush(COLORREF color);
// style PS_SOLID or PS_NULL; width below 1 means 1.
ZELCTL_EXPORT HPEN CreatePen(int style, int width, COLORREF color);
ZELCTL_EXPORT HGDIOBJ GetStockObject(int object);
// Deletes a bitmap, brush, pen or font. Fails (false) for a stale handle, a DC, or an object
// still selected into a DC.
ZELCTL_EXPORT bool DeleteObject(HGDIOBJ object);
// OBJ_* of a handle; 0 when the handle names nothing.
ZELCTL_EXPORT int GetObjectType(HGDIOBJ object);
// Describes a bitmap; false for anything else.
ZELCTL_EXPORT bool GetObject(HGDIOBJ object, BITMAP &bitmap);
ZELCTL_EXPORT bool GetObject(HGDIOBJ object, DIBSECTION &section);

// --- Blits -----------------------------------------------------------------------------

// Copies or combines (SRCCOPY, SRCAND, SRCPAINT) a rectangle of src into dst, converting
// between bit depths: a table-based source goes through its colour table, a colour into a
// table-based target takes the nearest entry; combinations act on the target's pixel
// values. A 32-bit target fed from a source without alpha gets alpha 255. Both rectangles
// are clipped to their bitmaps. Unknown raster operations and coordinates or extents
// beyond ±2^27 fail.
ZELCTL_EXPORT bool BitBlt(HDC dst, int x, int y, int width, int height, HDC src, int srcX, int srcY, quint32 rop);
// As BitBlt, scaling with the stretch mode of dst (HALFTONE averages areas, the others take
// the nearest pixel). A negative extent counts leftwards or upwards from its origin pixel;
// when the signs of the two widths (heights) differ, the picture is mirrored.
ZELCTL_EXPORT bool StretchBlt(HDC dst, int x, int y, int width, int height, HDC src, int srcX, int srcY, int srcWidth,
    int srcHeight, quint32 rop);
// Source-over: dst = src·k + dst·(1 − srcA·k), k = SourceConstantAlpha / 255, with srcA the
// pixel's alpha for a 32-bit source with AC_SRC_ALPHA and 1 otherwise, each channel within
// 1 of the exact value. With AC_SRC_ALPHA the pixels are premultiplied (no colour channel
// above alpha); a channel that would pass 255 stays at 255. Scales by the nearest pixel,
// whatever the stretch mode. Fails for negative extents and for a source rectangle outside
// the source bitmap; the target is clipped.
ZELCTL_EXPORT bool AlphaBlend(HDC dst, int x, int y, int width, int height, HDC src, int srcX, int srcY, int srcWidth,
    int srcHeight, BLENDFUNCTION blend);

// --- Drawing ---------------------------------------------------------------------------

// Fills [left, right) × [top, bottom) with a solid brush. Nonzero on success.
ZELCTL_EXPORT int FillRect(HDC hdc, const RECT &rect, HBRUSH brush);
// Outlines [left, right) × [top, bottom) with the selected pen and fills the inside with the
// selected brush.
ZELCTL_EXPORT bool Rectangle(HDC hdc, int left, int top, int right, int bottom);
ZELCTL_EXPORT bool MoveToEx(HDC hdc, int x, int y, POINT *previous = nullptr);
// A line with the selected pen and pen mode from the current position up to, not including,
// (x, y), which becomes the current position.
ZELCTL_EXPORT bool LineTo(HDC hdc, int x, int y);
// Sets a point as a picture box does: a filled circle with the diameter of the selected
// pen's width round the centre of pixel (x, y), in color, with the DC's pen mode (XOR acts
// on the colour and keeps a 32-bit pixel's alpha).
ZELCTL_EXPORT bool PSet(HDC hdc, int x, int y, COLORREF color);
// The colour of a pixel, CLR_INVALID outside the bitmap.
ZELCTL_EXPORT COLORREF GetPixel(HDC hdc, int x, int y);

// A font by face name, size in points (at 96 dots per inch) and weight.
ZELCTL_EXPORT HFONT CreateFont(const QString &faceName, double points, bool bold);
// Draws text with its top-left corner at (x, y) in the text colour, without background.
// Needs a 24- or 32-bit bitmap.
ZELCTL_EXPORT bool TextOut(HDC hdc, int x, int y, const QString &text);
// Width and height of text in the selected font, in pixels.
ZELCTL_EXPORT bool GetTextExtentPoint32(HDC hdc, const QString &text, SIZE &size);

// Repaints a window (RDW_INVALIDATE queues, with RDW_UPDATENOW at once), the whole of it
// when rect is null.
ZELCTL_EXPORT bool RedrawWindow(HWND window, const RECT *rect, quint32 flags);

} // namespace zelctl::gdi
