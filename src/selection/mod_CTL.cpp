#include "mod_CTL.h"

#include "PictureBox.h"

#include <QPainter>

namespace zelctl::mod_CTL {

thread_local zelctl::Picture FlagStripCache;
thread_local PictureBox *FlagScratchSurface = nullptr;
thread_local qint32 NifControlCount = 0;

namespace {

// ISO codes in the order of the Portuguese country names, the order of the strip's cells.
constexpr char FlagOrder[]
    = "AF;ZA;AL;DE;AD;AO;AI;AQ;AG;AN;SA;DZ;AR;AM;AW;AU;AT;AZ;BS;BD;BB;BH;BE;BZ;BJ;BM;BY;BO;BA;BW;BR;BN;BG;BF;BI;BT;"
      "CV;CM;KH;CA;QA;KZ;CF;TD;CL;CN;CY;CO;KM;CG;CD;KR;KP;CI;CR;HR;CU;DK;DM;EG;SV;AE;EC;ER;SK;SI;ES;US;EE;ET;PH;FI;"
      "FR;GA;GM;GH;GE;GS;GI;GD;GR;GL;GP;GU;GT;GY;GF;GN;GQ;GW;HT;HN;HK;HU;YE;BV;KY;CX;CC;CK;FK;FO;FJ;HM;MP;MH;UM;NF;"
      "SB;VG;VI;IN;ID;IR;IQ;IE;IS;IL;IT;JM;JP;DJ;JO;YU;KE;KI;KW;LA;LS;LV;LB;LR;LY;LI;LT;LU;MO;MK;MG;MY;MW;MV;ML;MT;"
      "MA;MQ;MU;MR;YT;MX;FM;MZ;MD;MC;MN;MS;MM;NA;NR;NP;NI;NE;NG;NU;NO;NC;NZ;OM;NL;PW;PA;PG;PK;PY;PE;PN;PF;PL;PR;PT;"
      "KG;GB;CZ;DO;RE;RO;RW;RU;WS;AS;SH;LC;VA;KN;SM;PM;ST;VC;EH;SN;SL;SC;SG;SY;SO;LK;SZ;SD;SE;CH;SR;SJ;TH;TW;TJ;TZ;"
      "IO;PS;TF;TL;TG;TK;TO;TT;TN;TC;TM;TR;TV;UA;UG;UY;UZ;VU;VE;VN;WF;ZM;ZW;";
constexpr int EntryLength = 3; // two letters and ";"
constexpr int CellsPerRow = 32;
static_assert(sizeof(FlagOrder) - 1 == FlagCellCount * EntryLength);
static_assert(FlagCellCount <= CellsPerRow * 8);

constexpr auto StripResource = ":/zelctl/COUNTRIES.bmp";
constexpr platform::OleColor White = platform::rgb(255, 255, 255);

} // namespace

int flagCellIndex(const QString &code)
{
    // Greece's tax code "EL" (the code of the member-state lists and the country file)
    // names the flag of its ISO code.
    const QString iso = code == QLatin1String("EL") ? QStringLiteral("GR") : code;
    // Only a whole entry counts: a text search alone would find "" or "A" inside another code.
    const QLatin1StringView order(FlagOrder, sizeof(FlagOrder) - 1);
    for (int index = 0; index < FlagCellCount; ++index) {
        if (order.sliced(index * EntryLength, 2) == iso)
            return index;
    }
    return -1;
}

zelctl::Picture GetCountryFlag(const QString &code)
{
    const int index = flagCellIndex(code);
    if (index < 0)
        return {};
    const QPoint cell((index % CellsPerRow) * FlagSize, (index / CellsPerRow) * FlagSize);

    if (FlagStripCache.isNull())
        FlagStripCache = zelctl::Picture(QImage(QString::fromLatin1(StripResource)));
    if (FlagStripCache.isNull() || !FlagScratchSurface)
        return {};

    PictureBox &surface = *FlagScratchSurface;
    surface.setBackColor(White);
    surface.Cls();
    surface.reserveImage(QSize(FlagSize, FlagSize));
    {
        QPainter painter(&surface.Image());
        painter.setCompositionMode(QPainter::CompositionMode_Source);
        painter.drawImage(QPoint(0, 0), FlagStripCache.image(), QRect(cell, QSize(FlagSize, FlagSize)));
    }
    surface.update();
    return zelctl::Picture(surface.Image().copy(0, 0, FlagSize, FlagSize));
}

zelctl::Picture flagOn(PictureBox &surface, const QString &code)
{
    FlagScratchSurface = &surface;
    zelctl::Picture flag = GetCountryFlag(code);
    FlagScratchSurface = nullptr;
    return flag;
}

void nifControlCreated()
{
    ++NifControlCount;
}

void nifControlTerminated()
{
    --NifControlCount;
    if (NifControlCount < 1)
        FlagStripCache = {};
}

} // namespace zelctl::mod_CTL
