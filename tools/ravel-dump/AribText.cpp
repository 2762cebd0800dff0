#include "AribText.h"

#include <iconv.h>

#include "BroadcastText.h"

#if RAVEL_DUMP_ARIB_SYMBOLS
// libaribb24's headers declare C functions without saying so.
extern "C" {
#include <aribb24/aribb24.h>
#include <aribb24/decoder.h>
}
#endif

namespace ravel_dump {
namespace {

// Graphic sets by their final byte (F) in designations.
enum class GSet {
  kKanji,              // 2-byte, F 0x42: JIS X 0208 with the additional symbols in rows 85 to 94
  kJisKanjiPlane1,     // 2-byte, F 0x39: JIS X 0213 plane 1
  kJisKanjiPlane2,     // 2-byte, F 0x3A: JIS X 0213 plane 2
  kAdditionalSymbols,  // 2-byte, F 0x3B
  kAlphanumeric,       // F 0x4A, 0x36 (proportional)
  kHiragana,           // F 0x30, 0x37 (proportional)
  kKatakana,           // F 0x31, 0x38 (proportional)
  kJisKatakana,        // F 0x49: JIS X 0201 katakana
  kDropped1,           // mosaics, 1-byte DRCS, macros, unknown 1-byte sets
  kDropped2,           // 2-byte DRCS, unknown 2-byte sets
};

bool TwoByte(GSet set) {
  return set == GSet::kKanji || set == GSet::kJisKanjiPlane1 || set == GSet::kJisKanjiPlane2 ||
         set == GSet::kAdditionalSymbols || set == GSet::kDropped2;
}

GSet OneByteSet(unsigned char f) {
  switch (f) {
    case 0x4A: case 0x36: return GSet::kAlphanumeric;
    case 0x30: case 0x37: return GSet::kHiragana;
    case 0x31: case 0x38: return GSet::kKatakana;
    case 0x49: return GSet::kJisKatakana;
    default: return GSet::kDropped1;
  }
}

GSet TwoByteSet(unsigned char f) {
  switch (f) {
    case 0x42: return GSet::kKanji;
    case 0x39: return GSet::kJisKanjiPlane1;
    case 0x3A: return GSet::kJisKanjiPlane2;
    case 0x3B: return GSet::kAdditionalSymbols;
    default: return GSet::kDropped2;
  }
}

// Control codes of SI texts.
const unsigned char kApr = 0x0D;  // line break
const unsigned char kLs1 = 0x0E, kLs0 = 0x0F, kSs2 = 0x19, kSs3 = 0x1D, kEsc = 0x1B;
const unsigned char kPapf = 0x16, kAps = 0x1C, kSp = 0x20;
const unsigned char kMsz = 0x89, kNsz = 0x8A, kSzx = 0x8B, kCol = 0x90, kFlc = 0x91, kCdc = 0x92, kPol = 0x93,
                    kWmm = 0x94, kMacro = 0x95, kHlc = 0x97, kRpc = 0x98, kCsi = 0x9B, kTime = 0x9D;

const unsigned int kReplacement = 0xFFFD;

// One character of the C library's iconv from `charset` (EUC-JP for JIS X 0208,
// EUC-JISX0213 for the JIS compatible kanji planes); false when unassigned.
class IconvCharacter {
 public:
  explicit IconvCharacter(const char* charset) : cd_(iconv_open("UTF-8", charset)) {}
  ~IconvCharacter() {
    if (cd_ != reinterpret_cast<iconv_t>(-1)) iconv_close(cd_);
  }
  IconvCharacter(const IconvCharacter&) = delete;
  IconvCharacter& operator=(const IconvCharacter&) = delete;

  bool Append(std::string& out, const char* bytes, std::size_t length) {
    if (cd_ == reinterpret_cast<iconv_t>(-1)) return false;
    char buffer[16];
    char* in = const_cast<char*>(bytes);
    char* to = buffer;
    std::size_t inLeft = length, outLeft = sizeof buffer;
    iconv(cd_, nullptr, nullptr, nullptr, nullptr);
    if (iconv(cd_, &in, &inLeft, &to, &outLeft) == static_cast<std::size_t>(-1) || inLeft != 0) return false;
    out.append(buffer, to);
    return true;
  }

 private:
  iconv_t cd_;
};

// A JIS X 0208 code (row and cell as 0x21 to 0x7E) through iconv's EUC-JP.
bool AppendJisX0208(std::string& out, unsigned char row, unsigned char cell) {
  static IconvCharacter eucJp("EUC-JP");
  const char bytes[] = {static_cast<char>(row | 0x80), static_cast<char>(cell | 0x80)};
  return eucJp.Append(out, bytes, 2);
}

// A JIS X 0213 code of `plane` 1 or 2 through iconv's EUC-JISX0213.
bool AppendJisX0213(std::string& out, int plane, unsigned char row, unsigned char cell) {
  static IconvCharacter eucJisX0213("EUC-JISX0213");
  const char bytes[] = {'\x8F', static_cast<char>(row | 0x80), static_cast<char>(cell | 0x80)};
  return plane == 2 ? eucJisX0213.Append(out, bytes, 3) : eucJisX0213.Append(out, bytes + 1, 2);
}

// The additional symbols and kanji of rows 85 to 94 (the [字], [二], [解]
// marks of event names, circled numbers, units, extra kanji), from the table
// of libaribb24, designated alone into a fresh decoder. Unknown without it.
bool AppendAdditionalSymbol(std::string& out, unsigned char row, unsigned char cell) {
#if RAVEL_DUMP_ARIB_SYMBOLS
  static arib_instance_t* instance = arib_instance_new(nullptr);
  arib_decoder_t* decoder = instance != nullptr ? arib_get_decoder(instance) : nullptr;
  if (decoder == nullptr) return false;
  const unsigned char designated[] = {kEsc, 0x24, 0x3B, row, cell};
  char buffer[16] = {};
  arib_initialize_decoder(decoder);
  std::size_t written = arib_decode_buffer(decoder, designated, sizeof designated, buffer, sizeof buffer - 1);
  if (written == 0 || written >= sizeof buffer) return false;
  out.append(buffer, written);
  return true;
#else
  (void)out, (void)row, (void)cell;
  return false;
#endif
}

// Cells 0x77 to 0x7E of the hiragana and katakana sets: iteration marks,
// prolonged sound mark and punctuation, as their JIS X 0208 row 1 cells.
const unsigned char kKanaMarkCells[2][8] = {
    {0x35, 0x36, 0x3C, 0x23, 0x56, 0x57, 0x22, 0x26},  // hiragana: ゝ ゞ ー 。 「 」 、 ・
    {0x33, 0x34, 0x3C, 0x23, 0x56, 0x57, 0x22, 0x26},  // katakana: ヽ ヾ ー 。 「 」 、 ・
};

class Decoder {
 public:
  Decoder(const unsigned char* bytes, std::size_t length) : bytes_(bytes), length_(length) {}

  std::string Run() {
    while (at_ < length_) {
      unsigned char byte = bytes_[at_++];
      if (byte >= 0x21 && byte <= 0x7E) {
        int g = singleShift_ >= 0 ? singleShift_ : gl_;
        singleShift_ = -1;
        Character(g_[g], byte);
      } else if (byte >= 0xA1 && byte <= 0xFE) {
        Character(g_[gr_], byte & 0x7F);
      } else if (byte == kSp) {
        AppendUtf8(out_, middleSize_ ? ' ' : 0x3000);  // a space of the character's width
      } else {
        Control(byte);
      }
    }
    return out_;
  }

 private:
  bool Next(unsigned char& byte) {
    if (at_ >= length_) return false;
    byte = bytes_[at_++];
    return true;
  }
  void Skip(std::size_t count) { at_ = at_ + count < length_ ? at_ + count : length_; }

  void Character(GSet set, unsigned char first) {
    if (TwoByte(set)) {
      unsigned char second = 0;
      if (!Next(second)) return;
      second &= 0x7F;
      if (second < 0x21 || second > 0x7E) return;
      TwoByteCharacter(set, first, second);
      return;
    }
    switch (set) {
      case GSet::kAlphanumeric: Alphanumeric(first); return;
      case GSet::kHiragana: Kana(0x24, 0, first); return;
      case GSet::kKatakana: Kana(0x25, 1, first); return;
      case GSet::kJisKatakana:
        AppendUtf8(out_, first <= 0x5F ? 0xFF61 + (first - 0x21) : kReplacement);
        return;
      default: return;  // mosaics, DRCS and macros have no text
    }
  }

  void TwoByteCharacter(GSet set, unsigned char row, unsigned char cell) {
    bool known = false;
    switch (set) {
      case GSet::kKanji:
        known = row >= 0x75 ? AppendAdditionalSymbol(out_, row, cell) : AppendJisX0208(out_, row, cell);
        break;
      case GSet::kAdditionalSymbols: known = AppendAdditionalSymbol(out_, row, cell); break;
      case GSet::kJisKanjiPlane1:
        known = row >= 0x75 ? AppendAdditionalSymbol(out_, row, cell) : AppendJisX0213(out_, 1, row, cell);
        break;
      case GSet::kJisKanjiPlane2: known = AppendJisX0213(out_, 2, row, cell); break;
      default: return;  // DRCS
    }
    if (!known) AppendUtf8(out_, kReplacement);
  }

  // JIS X 0201 Roman: ASCII but for the yen sign and the overline.
  void Alphanumeric(unsigned char c) {
    if (middleSize_) {
      AppendUtf8(out_, c == 0x5C ? 0x00A5 : c == 0x7E ? 0x203E : c);
    } else {
      AppendUtf8(out_, c == 0x5C ? 0xFFE5 : c == 0x7E ? 0xFFE3 : 0xFF01 + (c - 0x21));
    }
  }

  // The kana of JIS X 0208 row `jisRow` (4 hiragana, 5 katakana) up to cell
  // 0x76, then the marks both sets share.
  void Kana(unsigned char jisRow, int set, unsigned char c) {
    bool known = c >= 0x77 ? AppendJisX0208(out_, 0x21, kKanaMarkCells[set][c - 0x77])
                           : AppendJisX0208(out_, jisRow, c);
    if (!known) AppendUtf8(out_, kReplacement);
  }

  void Control(unsigned char byte) {
    unsigned char parameter = 0;
    switch (byte) {
      case kApr: out_ += '\n'; break;
      case kLs0: gl_ = 0; break;
      case kLs1: gl_ = 1; break;
      case kSs2: singleShift_ = 2; break;
      case kSs3: singleShift_ = 3; break;
      case kEsc: Escape(); break;
      case kPapf: Skip(1); break;
      case kAps: Skip(2); break;
      case kMsz: middleSize_ = true; break;
      case kNsz: middleSize_ = false; break;
      case kSzx: case kFlc: case kPol: case kWmm: case kHlc: case kRpc: Skip(1); break;
      case kCol: case kCdc:  // one parameter, or 0x20 and one more
        if (Next(parameter) && parameter == 0x20) Skip(1);
        break;
      case kMacro: Macro(); break;
      case kCsi:  // parameters up to a final byte
        while (Next(parameter) && (parameter < 0x40 || parameter > 0x7E)) {
        }
        break;
      case kTime: Skip(2); break;
      default: break;  // other controls (colours, sizes, DEL, 0xA0, 0xFF) leave no text
    }
  }

  // LS2, LS3, LS1R to LS3R and the designations of graphic sets.
  void Escape() {
    unsigned char b = 0;
    if (!Next(b)) return;
    switch (b) {
      case 0x6E: gl_ = 2; return;
      case 0x6F: gl_ = 3; return;
      case 0x7E: gr_ = 1; return;
      case 0x7D: gr_ = 2; return;
      case 0x7C: gr_ = 3; return;
      default: break;
    }
    if (b >= 0x28 && b <= 0x2B) {  // ESC ( F to ESC + F: a 1-byte set into G0 to G3
      Designate(b - 0x28, false);
    } else if (b == 0x24) {  // ESC $ F into G0, ESC $ ( F to ESC $ + F into G0 to G3
      unsigned char c = 0;
      if (!Next(c)) return;
      if (c >= 0x28 && c <= 0x2B) {
        Designate(c - 0x28, true);
      } else {
        g_[0] = TwoByteSet(c);
      }
    }
  }

  // F, or 0x20 then F for a DRCS set (DRCS-0 is 2-byte) or the macro set.
  void Designate(int g, bool twoByte) {
    unsigned char f = 0;
    if (!Next(f)) return;
    if (f == 0x20) {
      if (!Next(f)) return;
      g_[g] = twoByte || f == 0x40 ? GSet::kDropped2 : GSet::kDropped1;
      return;
    }
    g_[g] = twoByte ? TwoByteSet(f) : OneByteSet(f);
  }

  // MACRO 0x40 or 0x41 starts a definition that runs to MACRO 0x4F.
  void Macro() {
    unsigned char kind = 0;
    if (!Next(kind) || (kind != 0x40 && kind != 0x41)) return;
    while (at_ + 1 < length_ && !(bytes_[at_] == kMacro && bytes_[at_ + 1] == 0x4F)) ++at_;
    Skip(2);
  }

  const unsigned char* bytes_;
  std::size_t length_;
  std::size_t at_ = 0;
  std::string out_;
  GSet g_[4] = {GSet::kKanji, GSet::kAlphanumeric, GSet::kHiragana, GSet::kKatakana};
  int gl_ = 0;
  int gr_ = 2;
  int singleShift_ = -1;
  bool middleSize_ = false;
};

}  // namespace

std::string AribTextToUtf8(const unsigned char* bytes, std::size_t length) {
  return Decoder(bytes, length).Run();
}

}  // namespace ravel_dump
