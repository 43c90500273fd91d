// The static parameter table. Its order is the order of reading and writing a .pf file and of
// the grid's rows; the key is also ctt's option word.
#include "profile/ParameterSet.h"

#include <array>

namespace ac {
namespace {

// Flags as the letters the table was drawn up with, so a row reads like its design note.
constexpr std::uint32_t Flags(std::string_view letters) {
    std::uint32_t flags = 0;
    for (char letter : letters) {
        switch (letter) {
            case 'S': flags |= PARAM_SWITCH; break;
            case 'E': flags |= PARAM_EXPERT; break;
            case 'V': flags |= PARAM_VIDEO; break;
            case 'A': flags |= PARAM_AUDIO; break;
            case 'G': flags |= PARAM_GENERAL; break;
            case 'M': flags |= PARAM_SUMMARY; break;
            case 'T': flags |= PARAM_TAG; break;
            case 'F': flags |= PARAM_FIXED_LIST; break;
            case 'L': flags |= PARAM_HAS_LIST; break;
            case 'N': flags |= PARAM_NOT_PASSED; break;
            case 'K': flags |= PARAM_KEEP_CASE; break;
            default: break;
        }
    }
    return flags;
}

// ID3v1 genres 0-125 with the Winamp extensions, spelled as the tag table spells them.
constexpr std::string_view kGenres[] = {
    "Blues", "Classic Rock", "Country", "Dance", "Disco", "Funk", "Grunge", "Hip-Hop", "Jazz",
    "Metal", "New Age", "Oldies", "Other", "Pop", "R&B", "Rap", "Reggae", "Rock", "Techno",
    "Industrial", "Alternative", "Ska", "Death Metal", "Pranks", "Soundtrack", "Euro-Techno",
    "Ambient", "Trip-Hop", "Vocal", "Jazz+Funk", "Fusion", "Trance", "Classical", "Instrumental",
    "Acid", "House", "Game", "Sound Clip", "Gospel", "Noise", "AlternRock", "Bass", "Soul", "Punk",
    "Space", "Meditative", "Instrumental Pop", "Instrumental Rock", "Ethnic", "Gothic",
    "Darkwave", "Techno-Industrial", "Electronic", "Pop-Folk", "Eurodance", "Dream",
    "Southern Rock", "Comedy", "Cult", "Gangsta", "Top 40", "Christian Rap", "Pop/Funk", "Jungle",
    "Native American", "Cabaret", "New Wave", "Psychadelic", "Rave", "Showtunes", "Trailer",
    "Lo-Fi", "Tribal", "Acid Punk", "Acid Jazz", "Polka", "Retro", "Musical", "Rock & Roll",
    "Hard Rock", "Folk", "Folk-Rock", "National Folk", "Swing", "Fast Fusion", "Bebob", "Latin",
    "Revival", "Celtic", "Bluegrass", "Avantgarde", "Gothic Rock", "Progressive Rock",
    "Psychedelic Rock", "Symphonic Rock", "Slow Rock", "Big Band", "Chorus", "Easy Listening",
    "Acoustic", "Humour", "Speech", "Chanson", "Opera", "Chamber Music", "Sonata", "Symphony",
    "Booty Bass", "Primus", "Porn Groove", "Satire", "Slow Jam", "Club", "Tango", "Samba",
    "Folklore", "Ballad", "Power Ballad", "Rhythmic Soul", "Freestyle", "Duet", "Punk Rock",
    "Drum Solo", "A capella", "Euro-House", "Dance Hall"};
static_assert(std::size(kGenres) == 126);

constexpr std::string_view kVideoCodecs[] = {
    "mpeg4", "msmpeg4", "msmpeg4v1", "msmpeg4v2", "mpeg1video", "mpeg2video", "wmv1", "wmv2", "h263",
    "h263p", "rawvideo", "rv10", "dvvideo", "huffyuv", "ljpeg", "mjpeg", "svq1", "zlib"};
constexpr std::string_view kStandards[] = {"Auto", "NTSC", "PAL"};
constexpr std::string_view kFrameSizes[] = {"128x96 (sqcif)", "176x144 (qcif)", "352x288 (cif)",
                                            "704x576 (4cif)", "352x240", "640x480", "480x272"};
constexpr std::string_view kAudioCodecs[] = {"ac3", "mp2", "g726", "pcm_alaw", "pcm_mulaw",
                                             "pcm_s16be", "pcm_s16le", "pcm_s8", "pcm_u16be",
                                             "pcm_u16le", "pcm_u8"};
constexpr std::string_view kBitRates[] = {"32", "40", "48", "56", "64", "80", "96",
                                          "112", "128", "160", "192", "224", "256", "320"};
constexpr std::string_view kSampleRates[] = {"48000", "44100", "32000", "22050"};
constexpr std::string_view kChannels[] = {"1 (Mono)", "2 (Stereo)"};

constexpr ValueList kNoList{};

constexpr ParameterDef kTable[] = {
    {"t", Flags("G"), 300, 500, "Full", kNoList},
    {"ss", Flags("G"), 301, 501, "00:00:00", kNoList},
    {"outfilename", Flags("G"), 631, 632, "", kNoList},
    {"copyts", Flags("S"), 302, 502, nullptr, kNoList},
    {"v", Flags(""), 303, 503, nullptr, kNoList},
    {"target", Flags("L"), 304, 504, nullptr, kNoList},
    {"hq", Flags("S"), 305, 505, nullptr, kNoList},
    {"bitexact", Flags("SE"), 306, 506, nullptr, kNoList},
    {"track", Flags("L"), 307, 507, "0", kNoList},
    {"subtitle", Flags("L"), 308, 508, "0", kNoList},
    {"angle", Flags("L"), 309, 509, "1", kNoList},
    {"title", Flags("MTK"), 310, 510, nullptr, kNoList},
    {"author", Flags("MTK"), 311, 511, nullptr, kNoList},
    {"copyright", Flags("MTK"), 312, 512, nullptr, kNoList},
    {"comment", Flags("MTK"), 313, 513, nullptr, kNoList},
    {"timestamp", Flags("G"), 314, 514, nullptr, kNoList},
    {"album", Flags("MTK"), 185, 186, nullptr, kNoList},
    {"genre", Flags("MTLK"), 187, 188, nullptr, kGenres},
    {"composer", Flags("MTK"), 189, 190, nullptr, kNoList},
    {"origaritist", Flags("MTK"), 191, 192, nullptr, kNoList},
    {"url", Flags("MTK"), 193, 194, nullptr, kNoList},
    {"encodedby", Flags("MTK"), 195, 196, nullptr, kNoList},
    {"year", Flags("MT"), 197, 198, nullptr, kNoList},
    {"id3v1", Flags("SM"), 199, 200, nullptr, kNoList},
    {"id3v2", Flags("SM"), 201, 202, nullptr, kNoList},
    {"itsoffset", Flags("G"), 315, 515, nullptr, kNoList},
    {"vismv", Flags("E"), 316, 516, nullptr, kNoList},
    {"benchmark", Flags("SE"), 317, 517, nullptr, kNoList},
    {"dump", Flags("SE"), 318, 518, nullptr, kNoList},
    {"hex", Flags("SE"), 319, 519, nullptr, kNoList},
    {"re", Flags("SE"), 320, 520, nullptr, kNoList},
    {"loop", Flags("SE"), 321, 521, nullptr, kNoList},
    {"threads", Flags("E"), 322, 522, "1", kNoList},
    {"vsync", Flags("E"), 323, 523, nullptr, kNoList},
    {"async", Flags("E"), 324, 524, nullptr, kNoList},
    {"vcodec", Flags("VL"), 325, 525, nullptr, kVideoCodecs},
    {"standard", Flags("VFN"), 326, 526, "Auto", kStandards},
    {"s", Flags("VL"), 327, 527, "Auto", kFrameSizes},
    {"b", Flags("VL"), 328, 528, "Auto", kNoList},
    {"maxrate", Flags("V"), 329, 529, "Auto", kNoList},
    {"minrate", Flags("V"), 330, 530, "Auto", kNoList},
    {"bufsize", Flags("V"), 331, 531, "Auto", kNoList},
    {"r", Flags("VL"), 332, 532, "Auto", kNoList},
    {"aspect", Flags("V"), 333, 533, "Auto", kNoList},
    {"pix_fmt", Flags("EVF"), 334, 534, "Auto", kNoList},
    {"croptop", Flags("V"), 335, 535, "0", kNoList},
    {"cropbottom", Flags("V"), 336, 536, "0", kNoList},
    {"cropleft", Flags("V"), 337, 537, "0", kNoList},
    {"cropright", Flags("V"), 338, 538, "0", kNoList},
    {"padtop", Flags("V"), 339, 539, "0", kNoList},
    {"padbottom", Flags("V"), 340, 540, "0", kNoList},
    {"padleft", Flags("V"), 341, 541, "0", kNoList},
    {"padright", Flags("V"), 342, 542, "0", kNoList},
    {"padcolor", Flags("V"), 343, 543, "000000", kNoList},
    {"bt", Flags("V"), 344, 544, "Auto", kNoList},
    {"sameq", Flags("SV"), 345, 545, nullptr, kNoList},
    {"pass", Flags("V"), 346, 546, "1", kNoList},
    {"passlogfile", Flags("V"), 347, 547, nullptr, kNoList},
    {"deinterlace", Flags("SEV"), 348, 548, nullptr, kNoList},
    {"acodec", Flags("AL"), 349, 549, nullptr, kAudioCodecs},
    {"ab", Flags("AL"), 350, 550, "Auto", kBitRates},
    {"ar", Flags("AL"), 351, 551, nullptr, kSampleRates},
    {"ac", Flags("AL"), 352, 552, nullptr, kChannels},
    {"vol_factor", Flags("A"), 183, 184, nullptr, kNoList},
    {"an", Flags("SA"), 353, 553, nullptr, kNoList},
    {"g", Flags("EV"), 354, 554, nullptr, kNoList},
    {"intra", Flags("SEV"), 355, 555, nullptr, kNoList},
    {"vn", Flags("SV"), 356, 556, nullptr, kNoList},
    {"qscale", Flags("EV"), 357, 557, nullptr, kNoList},
    {"qmin", Flags("EV"), 358, 558, nullptr, kNoList},
    {"qmax", Flags("EV"), 359, 559, nullptr, kNoList},
    {"lmin", Flags("EV"), 360, 560, nullptr, kNoList},
    {"lmax", Flags("EV"), 361, 561, nullptr, kNoList},
    {"mbqmin", Flags("EV"), 362, 562, nullptr, kNoList},
    {"mbqmax", Flags("EV"), 363, 563, nullptr, kNoList},
    {"qdiff", Flags("EV"), 364, 564, nullptr, kNoList},
    {"qblur", Flags("EV"), 365, 565, nullptr, kNoList},
    {"qcomp", Flags("EV"), 366, 566, nullptr, kNoList},
    {"rc_init_cplx", Flags("EV"), 367, 567, nullptr, kNoList},
    {"b_qfactor", Flags("EV"), 368, 568, nullptr, kNoList},
    {"i_qfactor", Flags("EV"), 369, 569, nullptr, kNoList},
    {"b_qoffset", Flags("EV"), 370, 570, nullptr, kNoList},
    {"i_qoffset", Flags("EV"), 371, 571, nullptr, kNoList},
    {"ibias", Flags("EV"), 372, 572, nullptr, kNoList},
    {"pbias", Flags("EV"), 373, 573, nullptr, kNoList},
    {"rc_eq", Flags("EV"), 374, 574, nullptr, kNoList},
    {"rc_override", Flags("EV"), 375, 575, nullptr, kNoList},
    {"me", Flags("EV"), 376, 576, nullptr, kNoList},
    {"dct_algo", Flags("EV"), 377, 577, nullptr, kNoList},
    {"idct_algo", Flags("EV"), 378, 578, nullptr, kNoList},
    {"me_threshold", Flags("EV"), 379, 579, nullptr, kNoList},
    {"mb_threshold", Flags("EV"), 380, 580, nullptr, kNoList},
    {"er", Flags("EV"), 381, 581, nullptr, kNoList},
    {"ec", Flags("EV"), 382, 582, nullptr, kNoList},
    {"bf", Flags("EV"), 383, 583, nullptr, kNoList},
    {"mbd", Flags("EV"), 384, 584, nullptr, kNoList},
    {"mbcmp", Flags("EV"), 385, 585, nullptr, kNoList},
    {"ildctcmp", Flags("EV"), 386, 586, nullptr, kNoList},
    {"subcmp", Flags("EV"), 387, 587, nullptr, kNoList},
    {"cmp", Flags("EV"), 388, 588, nullptr, kNoList},
    {"precmp", Flags("EV"), 389, 589, nullptr, kNoList},
    {"preme", Flags("EV"), 390, 590, nullptr, kNoList},
    {"lumi_mask", Flags("EV"), 391, 591, nullptr, kNoList},
    {"dark_mask", Flags("EV"), 392, 592, nullptr, kNoList},
    {"scplx_mask", Flags("EV"), 393, 593, nullptr, kNoList},
    {"tcplx_mask", Flags("EV"), 394, 594, nullptr, kNoList},
    {"p_mask", Flags("EV"), 395, 595, nullptr, kNoList},
    {"4mv", Flags("SEV"), 396, 596, nullptr, kNoList},
    {"obmc", Flags("SEV"), 397, 597, nullptr, kNoList},
    {"lf", Flags("SEV"), 398, 598, nullptr, kNoList},
    {"part", Flags("SEV"), 399, 599, nullptr, kNoList},
    {"bug", Flags("EV"), 400, 600, nullptr, kNoList},
    {"ps", Flags("E"), 401, 601, nullptr, kNoList},
    {"error", Flags("E"), 402, 602, nullptr, kNoList},
    {"strict", Flags("EV"), 403, 603, nullptr, kNoList},
    {"ildct", Flags("SEV"), 404, 604, nullptr, kNoList},
    {"ilme", Flags("SEV"), 405, 605, nullptr, kNoList},
    {"psnr", Flags("SEV"), 406, 606, nullptr, kNoList},
    {"vstats", Flags("SEV"), 407, 607, nullptr, kNoList},
    {"vhook", Flags("EV"), 408, 608, nullptr, kNoList},
    {"aic", Flags("SEV"), 409, 609, nullptr, kNoList},
    {"aiv", Flags("SEV"), 410, 610, nullptr, kNoList},
    {"umv", Flags("SEV"), 411, 611, nullptr, kNoList},
    {"ssm", Flags("SEV"), 412, 612, nullptr, kNoList},
    {"alt", Flags("SEV"), 413, 613, nullptr, kNoList},
    {"qprd", Flags("SEV"), 414, 614, nullptr, kNoList},
    {"cbp", Flags("SEV"), 415, 615, nullptr, kNoList},
    {"trell", Flags("SEV"), 416, 616, nullptr, kNoList},
    {"cgop", Flags("SEV"), 417, 617, nullptr, kNoList},
    {"scan_offset", Flags("SEV"), 418, 618, nullptr, kNoList},
    {"qpel", Flags("SEV"), 419, 619, nullptr, kNoList},
    {"intra_matrix", Flags("EV"), 420, 620, nullptr, kNoList},
    {"inter_matrix", Flags("EV"), 421, 621, nullptr, kNoList},
    {"top", Flags("EV"), 422, 622, nullptr, kNoList},
    {"nr", Flags("EV"), 423, 623, nullptr, kNoList},
    {"qns", Flags("EV"), 424, 624, nullptr, kNoList},
    {"sc_threshold", Flags("EV"), 425, 625, nullptr, kNoList},
    {"me_range", Flags("EV"), 426, 626, nullptr, kNoList},
    {"dc", Flags("EV"), 427, 627, nullptr, kNoList},
    {"coder", Flags("EV"), 428, 628, nullptr, kNoList},
    {"context", Flags("EV"), 429, 629, nullptr, kNoList},
    {"pred", Flags("EV"), 430, 630, nullptr, kNoList},
};
static_assert(std::size(kTable) == 142);

}  // namespace

std::span<const ParameterDef> ParameterTable() { return kTable; }

std::string_view GetParameterKey(int index) {
    if (index < 0 || static_cast<std::size_t>(index) >= std::size(kTable)) return {};
    return kTable[index].key;
}

int FindParameterIndex(std::string_view key) {
    for (std::size_t i = 0; i < std::size(kTable); ++i) {
        if (kTable[i].key == key) return static_cast<int>(i);
    }
    return -1;
}

const ParameterDef* FindParameterDef(std::string_view key) {
    const int index = FindParameterIndex(key);
    return index < 0 ? nullptr : &kTable[index];
}

std::uint32_t TestParameterFlags(std::string_view key, std::uint32_t mask) {
    const ParameterDef* def = FindParameterDef(key);
    return def ? def->flags & mask : 0;
}

std::string_view GetParameterDefault(std::string_view key) {
    const ParameterDef* def = FindParameterDef(key);
    return def && def->defaultValue ? std::string_view(def->defaultValue) : std::string_view();
}

ValueList GetParameterValueList(std::string_view key) {
    const ParameterDef* def = FindParameterDef(key);
    return def ? def->values : ValueList();
}

}  // namespace ac
