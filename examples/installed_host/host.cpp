#include <wordcatcher/Version.h>
#include <wordcatcher/matcher/KXWordcatcher.h>
#include <iostream>

int main(int, char** arguments) {
  wordcatcher::KXWordcatcher matcher(arguments[1], 0);
  matcher.setMode(2);
  matcher.index_withData(u"golden retriever", u"golden retriever");
  matcher.setMode(1);
  const auto found = matcher.query(u"goldn retriver");
  std::cout << wordcatcher::versionString << '\n';
  for (const auto& record : std::get<0>(*found)) std::cout << record << '\n';
}
