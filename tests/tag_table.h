// Every tag that the library knows, written down once more and apart from its code.
#ifndef TESTS_TAG_TABLE_H
#define TESTS_TAG_TABLE_H

#include <map>
#include <string>

#include "scmn/tags.h"

namespace tag_table {

inline uint32_t number(const std::string &name) {
    uint32_t tag = 0;
    for (size_t i = 4; i-- > 0;) tag = tag * 256 + uint8_t(name[i]);
    return tag;
}

inline std::map<uint32_t, int32_t> build(
    std::initializer_list<std::pair<int32_t, std::initializer_list<const char *>>> names,
    std::map<uint32_t, int32_t> table) {
    for (const auto &[type, spellings] : names)
        for (const char *name : spellings) table[number(name)] = type;
    return table;
}

inline const std::map<uint32_t, int32_t> audio = build({{306, {"aac ", "mp4a"}},
                                                        {309, {"samr"}},
                                                        {310, {"sawb"}},
                                                        {311, {"sqcp", "dqcp"}},
                                                        {321, {"evrc"}}},
                                                       {{1, 300},
                                                        {6, 301},
                                                        {7, 302},
                                                        {0x50, 304},
                                                        {0x55, 305},
                                                        {0xFF, 306},
                                                        {0x2000, 307},
                                                        {0x2001, 308},
                                                        {0x160, 312},
                                                        {0x161, 312},
                                                        {0x162, 313},
                                                        {0x163, 314}});
inline const std::map<uint32_t, int32_t> video =
    build({{102,
            {"DX50", "dx50", "DIVX", "divx", "XVID", "xvid", "DIV4", "div4", "FMP4", "MP4V", "mp4v",
             "M4S2", "m4s2"}},
           {103, {"H263", "h263", "d263", "s263"}},
           {104, {"AVC1", "avc1", "avcC", "H264", "h264", "x264"}},
           {105, {"WMV1", "wmv1"}},
           {106, {"WMV2", "wmv2"}},
           {107, {"WMV3", "wmv3"}},
           {110, {"DIV3", "div3"}}},
          {});
inline const std::map<uint32_t, int32_t> drm = build({{1100, {"DIVX", "divx"}}}, {});

inline int32_t look_up(const std::map<uint32_t, int32_t> &table, uint32_t tag, int32_t unknown) {
    const auto found = table.find(tag);
    return found == table.end() ? unknown : found->second;
}

// Do all four functions answer as the tables say?
inline bool agrees(uint32_t tag) {
    const int32_t a = look_up(audio, tag, 499), v = look_up(video, tag, 299);
    return scmn_fcc2mt_aud(tag) == a && scmn_fcc2mt_vid(tag) == v &&
           scmn_fcc2mt_drm(tag) == look_up(drm, tag, 1299) &&
           scmn_fcc2mt(tag) == (a != 499   ? a
                                : v != 299 ? v
                                           : 0);
}

}  // namespace tag_table

#endif
