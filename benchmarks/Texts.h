// Sentences in fifteen kinds of text, of which the benchmarks make longer texts.

#pragma once

#include <cstddef>
#include <random>
#include <string>
#include <vector>

#include <boost/locale/encoding_utf.hpp>

struct Language {
  const char* name;
  std::vector<std::string> sentences;
};

inline const std::vector<Language>& Languages() {
  static const std::vector<Language> kLanguages = {
      {"ASCII",
       {"GET /index.html HTTP/1.1\r\n", "key = \"value\"; // 42\n", "2024-02-29T12:00:00Z INFO ready\n",
        "for (i = 0; i < n; ++i) sum += a[i];\n", "{\"id\": 1017, \"tags\": [\"a\", \"b\"]}\n"}},
      {"English",
       {"The ferry leaves at seven, and nobody waits for those who are late. ",
        "\u201CWe\u2019ll see,\u201D she said, and closed the window. ",
        "After the storm the beach was covered with wood and weed. ",
        "He bought a map of the island, a lamp and two loaves of bread. ",
        "It rained all afternoon \u2013 not hard, but without a pause. "}},
      {"German",
       {"Die Fähre läuft um sieben Uhr früh aus dem Hafen. ",
        "Über Nacht hat es geschneit, und die Straßen sind glatt. ",
        "Möchten Sie noch etwas Käse oder lieber ein Stück Kuchen? ",
        "Großmutter erzählt gern von den Jahren, in denen sie am Fluss lebte. ",
        "Für morgen ist schönes Wetter angekündigt. "}},
      {"French",
       {"Le bac part à sept heures, et personne n’attend les retardataires. ",
        "Après l’orage, la plage était couverte de bois et d’algues. ",
        "Il a acheté une carte de l’île, une lampe et deux pains. ",
        "Où êtes-vous allés l’été dernier ? Ça m’intéresse énormément. ",
        "La fenêtre s’ouvrit, et le rideau se mit à trembler. "}},
      {"Russian",
       {"Паром уходит в семь часов, и опоздавших никто не ждёт. ",
        "После бури берег был покрыт досками и водорослями. ",
        "Он купил карту острова, лампу и две буханки хлеба. ",
        "Весь день шёл дождь, несильный, но без перерыва. ",
        "Бабушка любит рассказывать о годах у большой реки. "}},
      {"Japanese",
       {"フェリーは七時に出ます。遅れた人を待つことはありません。",
        "嵐の後、浜辺は木と海草でおおわれていました。", "彼は島の地図とランプとパンを二つ買いました。",
        "午後はずっと雨が降っていた。", "祖母は川のそばで暮らした年月をよく話します。"}},
      {"Chinese",
       {"渡轮七点开船，没有人会等迟到的人。", "暴风雨过后，海滩上到处是木头和海草。",
        "他买了一张岛上的地图、一盏灯和两条面包。", "整个下午都在下雨，雨不大，但一直没有停。",
        "奶奶喜欢讲她在河边生活的那些年。"}},
      {"Korean",
       {"배는 일곱 시에 떠나고 늦은 사람은 아무도 기다리지 않는다. ",
        "폭풍이 지나간 뒤 바닷가는 나무와 해초로 덮여 있었다. ",
        "그는 섬의 지도와 등불 하나와 빵 두 개를 샀다. ", "오후 내내 비가 조용히 내렸다. ",
        "할머니는 강가에서 살던 시절을 즐겨 이야기하신다. "}},
      {"Hindi",
       {"नाव सात बजे चलती है और देर से आने वालों का कोई इंतज़ार नहीं करता। ",
        "आँधी के बाद समुद्र तट पर लकड़ी और घास फैली थी। ", "उसने द्वीप का नक्शा, एक दीया और दो रोटियाँ खरीदीं। ",
        "पूरे दिन हल्की बारिश होती रही। ", "दादी नदी के किनारे बिताए बरसों की बातें सुनाती हैं। "}},
      {"emoji",
       {"See you at the port ⛵🌊🐟 ", "🎉🎉🎉 happy birthday 🥳🎂🕯️ ", "👍🏽 ok 😀😅 ",
        "🏠➡️🚲➡️🌅 ", "👩‍🍳🥐☕😋 yes! "}},
      {"chat",
       {"Running ten minutes late, the bus is stuck behind a tractor again 🚜 sorry! ",
        "Did you remember the tickets? They should be in the blue folder. ",
        "Haha no way 😂 tell me everything tonight, I will bring the soup. ", "ok see you there 👍 ",
        "The garden looks lovely after all that rain, thanks for watering 🌱 "}},
      {"Arabic",
       {"تغادر العبّارة في الساعة السابعة ولا ينتظر أحد المتأخرين. ",
        "بعد العاصفة امتلأ الشاطئ بالخشب والأعشاب. ", "اشترى خريطة للجزيرة ومصباحا ورغيفين من الخبز. ",
        "هطل المطر طوال العصر بهدوء ولم يتوقف. ", "تحب الجدة أن تحكي عن السنوات التي عاشتها قرب النهر. "}},
      {"Thai",
       {"เรือข้ามฟากออกตอนเจ็ดโมง และไม่มีใครรอคนที่มาสาย ", "หลังพายุผ่านไป ชายหาดเต็มไปด้วยเศษไม้และสาหร่าย ",
        "เขาซื้อแผนที่ของเกาะ ตะเกียงหนึ่งดวง และขนมปังสองก้อน ", "ฝนตกเบาๆตลอดบ่ายโดยไม่หยุดเลย ",
        "คุณยายชอบเล่าเรื่องสมัยที่อยู่ริมแม่น้ำ "}},
      {"markup",
       {"<p class=\"lead\">Το πλοίο φεύγει στις επτά και κανείς δεν περιμένει.</p>\n",
        "<li><a href=\"/karta.html\" title=\"Χάρτης\">Ο χάρτης του νησιού</a></li>\n",
        "<h2 id=\"kairos\">Ο καιρός σήμερα</h2>\n<br>\n",
        "<td align=\"right\">12</td><td>ψωμί &amp; τυρί</td>\n",
        "<img src=\"limani.jpg\" alt=\"Το λιμάνι μετά τη θύελλα\" width=\"640\">\n"}},
      {"source",
       {"  // 港に着いた船を数える\n  for (const auto& ship : ships)\n    count += ship.arrived;\n",
        "  if (tide < kLowest) return false; // 浅すぎる\n", "/* 灯台の光は二十秒ごとに見える */\n",
        "static double Distance(Point a, Point b) { return std::hypot(a.x - b.x, a.y - b.y); }\n",
        "  log << \"出港: \" << ship.name << '\\n';\n\n"}},
  };
  return kLanguages;
}

/// Returns sentences of the language in random order, at least size bytes.
inline std::string TextIn(const Language& language, std::size_t size) {
  std::mt19937 random(11);
  std::string text;
  while (text.size() < size)
    text += language.sentences[random() % language.sentences.size()];
  return text;
}

inline bool IsInsideCodePoint(char unit) { return (unit & 0xC0) == 0x80; }
inline bool IsInsideCodePoint(char16_t unit) { return unit >= 0xDC00 && unit <= 0xDFFF; }

/// Returns the boundary of code points that is nearest to an index of the text.
template <class Unit> std::size_t BoundaryNear(const std::basic_string<Unit>& text, std::size_t index) {
  for (std::size_t distance = 0;; ++distance)
    for (const std::size_t at : {index - distance, index + distance})
      if (at >= text.size() || !IsInsideCodePoint(text[at]))
        return at;
}

/// Returns texts of about size units: one, or eight from different places if they are short, since a few
/// units may not be typical of the language.
template <class Unit>
std::vector<std::basic_string<Unit>> TextsIn(const Language& language, std::size_t size) {
  constexpr std::size_t kStep = 97;
  const std::size_t count = size < 100 ? 8 : 1;
  const std::size_t units = size + kStep * count; // a 16-bit unit takes at most three bytes of UTF-8
  const auto text =
      boost::locale::conv::utf_to_utf<Unit>(TextIn(language, sizeof(Unit) == 1 ? units : 3 * units));
  std::vector<std::basic_string<Unit>> texts;
  for (std::size_t i = 0; i < count; ++i) {
    const std::size_t begin = BoundaryNear(text, i * kStep);
    texts.push_back(text.substr(begin, BoundaryNear(text, begin + size) - begin));
  }
  return texts;
}
