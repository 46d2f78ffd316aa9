#pragma once

#include <algorithm>
#include <array>
#include <string_view>

#include "QVSa/values/Values.h"

namespace QVSa {

// The ids of all messages, in order. Each language has its table in this same order, which it checks when it is
// compiled.
inline constexpr std::array messageIds = std::to_array<Long>({
    47,   48,   49,   50,   51,   52,   53,   58,   59,   60,   200,  202,  203,  204,  205,  206,   1001,
    1002, 1003, 1004, 1005, 1006, 1101, 1102, 1103, 1106, 1109, 1112, 1113, 1114, 1115, 1116, 1117,  1118,
    1119, 1120, 1121, 1123, 1126, 1130, 1131, 1132, 1133, 1134, 1135, 1136, 1137, 1138, 1139, 1140,  1141,
    1201, 1202, 1203, 1204, 1205, 1206, 1207, 1208, 1209, 1210, 1400, 1501, 1502, 1503, 1504, 1505,  1506,
    1507, 1508, 1601, 1602, 1603, 1701, 1702, 1703, 1704, 1705, 1706, 1707, 1708, 1709, 1710, 1711,  1712,
    1713, 1714, 1715, 1800, 1801, 1802, 1803, 1804, 1805, 1806, 1807, 1808, 1809, 2701, 2903, 2904,  2905,
    2906, 2907, 2908, 2909, 3001, 3002, 3003, 3004, 3100, 3101, 3103, 3104, 3105, 3106, 3114, 3115,  3116,
    3201, 3202, 3203, 3204, 3205, 3206, 3207, 3208, 3209, 3210, 3211, 3212, 3213, 3217, 3218, 33301, 33302,
});

struct Message {
  Long id;
  std::string_view text;
};

using MessageTable = std::array<Message, messageIds.size()>;

extern const MessageTable englishMessages;
extern const MessageTable simplifiedChineseMessages;
extern const MessageTable traditionalChineseMessages;

constexpr bool isComplete(const MessageTable& table) {
  return std::ranges::equal(table, messageIds, {}, &Message::id) &&
         std::ranges::none_of(table, &std::string_view::empty, &Message::text);
}

}  // namespace QVSa
