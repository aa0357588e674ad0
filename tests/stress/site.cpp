#include "site.h"

#include <qorvex/file_system.h>

#include <algorithm>
#include <cstring>
#include <string_view>

#include "tests/support/image_files.h"

namespace stress {
namespace {

using qorvex::IAsyncResourceResponse;

struct File {
    std::string_view url;
    std::string_view text;
};

constexpr File kFiles[] = {
    {"coui://stress/plain.html",
     "<html><head><style>body{margin:0;background-color:#204060}.b{position:absolute;width:40px;height:30px;"
     "background-color:#fc0;border-radius:6px}</style></head><body><div "
     "class=b>one</div><p>two<b>three</b></p>"
     "</body></html>"},
    {"coui://stress/rich.html",
     "<html><head><link rel=stylesheet href=a.css><link rel=stylesheet href=b.css><script src=a.js></script>"
     "<script src=b.js async></script><script src=c.js defer></script></head><body><div id=app "
     "class='card shadow'>text <span>with a span</span></div><script>document.getElementById('app')"
     ".setAttribute('data-inline', '1')</script><img src=none.png><script "
     "src=gone.js></script></body></html>"},
    {"coui://stress/busy.html",
     "<html><head><link rel=stylesheet href=a.css></head><body><div id=app></div><script>"
     "var n = 0; function tick() { var app = document.getElementById('app'); if (!app) return;"
     "var e = document.createElement('div'); e.className = 'b' + (n % 3); e.textContent = 'item ' + n;"
     "app.appendChild(e); if (app.childNodes.length > 20) app.removeChild(app.firstChild); ++n;"
     "app.style.left = (n % 50) + 'px'; if (n < 400) requestAnimationFrame(tick); }"
     "tick(); setInterval(tick, 30); setTimeout(function () { throw new Error('late'); }, 20);"
     "</script></body></html>"},
    {"coui://stress/loader.html",
     "<html><body><script>['a.js', 'b.js', 'gone.js', 'a.css', 'b.css'].forEach(function (name, i) {"
     "var css = /css$/.test(name); var e = document.createElement(css ? 'link' : 'script');"
     "e.addEventListener('load', function () { window.loads = (window.loads || 0) + 1; });"
     "e.addEventListener('error', function () { if (e.parentNode) e.parentNode.removeChild(e); });"
     "if (css) { e.setAttribute('rel', 'stylesheet'); e.setAttribute('href', name); }"
     "else { e.setAttribute('src', name); } document.body.appendChild(e); if (i == 1)"
     "document.body.removeChild(e); });</script><p>loader</p></body></html>"},
    {"coui://stress/away.html",
     "<html><head><script src=a.js></script></head><body>leaving<script>setTimeout(function () {"
     "try { location.href = 'coui://stress/rich.html'; } catch (e) {} }, 40)</script></body></html>"},
    {"coui://stress/pictures.html",
     "<html><head><link rel=stylesheet href=a.css><style>.g{background-image:url(b.gif);width:20px;height:"
     "20px}</style></head><body><img id=app src=a.png><img src=cut.gif width=9><img src=none.png><div "
     "class=g></div><p qor-inline>in <img src=b.gif> line</p><script>var n = 0, names = ['a.png', "
     "'b.gif', 'cut.gif', 'none.png', '', 'a.js'];function swap() { var app = "
     "document.getElementById('app');"
     "if (!app || n++ > 300) return; app.src = names[n % 6]; if (n % 4 == 0) app.width = n % 50;"
     "var lost = new Image(n % 3); lost.onload = lost.onerror = function () { window.told = n; };"
     "lost.src = names[(n + 1) % 6] + '?' + n % 7; if (n % 5 == 0) { document.body.appendChild(lost);"
     "lost.parentNode.removeChild(lost); } requestAnimationFrame(swap); } swap();</script></body></html>"},
    {"coui://stress/a.css",
     "@font-face{font-family:Web;src:url(coui://stress/web.ttf)}body{margin:0;background-color:#fff}"
     ".b0{background:url(a.png),url(b.gif);height:10px}.b1{width:50%;opacity:.5;background-image:url(b.gif)}."
     "b2{"
     "border:3px solid;border-image:url(a.png) 3;mask-image:url(c.png)}.b2{transform:translate(4px,4px) "
     "rotate(5deg)}#app{position:absolute;padding:4px;font-family:Web,sans-serif;font-size:12px}"},
    {"coui://stress/b.css",
     ".card{display:flex;flex-direction:row;border:1px solid #000;border-radius:4px}.shadow{box-shadow:2px "
     "2px "
     "6px rgba(0,0,0,.5)}.card span{color:blue}@media (max-width: 200px){.card{flex-direction:column}}"},
    {"coui://stress/c.css", "p{margin:3px} broken { } } @import url(a.css); p::{"},
    {"coui://stress/a.js", "window.a = (window.a || 0) + 1; console.log('a');"},
    {"coui://stress/b.js",
     "if (document.body) { var s = document.createElement('script'); s.setAttribute('src', 'c.js');"
     "document.body.appendChild(s); }"},
    {"coui://stress/c.js", "null.missing();"},
};

// Pictures by their letter; any other is missing.
std::string MakePicture(std::string_view url) {
    constexpr std::string_view kAt = "coui://stress/";
    if (!url.starts_with(kAt)) return {};
    url.remove_prefix(kAt.size());
    url = url.substr(0, url.find('?'));
    if (url == "a.png" || url == "c.png") return qorvex::test::Png(qorvex::test::Plain(12, 8, 0x80402010));
    if (url == "b.gif") return qorvex::test::Gif(6, 6, {1, 3, 5});
    if (url == "cut.gif") return qorvex::test::Gif(6, 6, {1, 3, 5}).substr(0, 80);
    return {};
}

const File* Find(std::string_view url) {
    const File* found =
        std::find_if(std::begin(kFiles), std::end(kFiles), [&](const File& file) { return file.url == url; });
    return found == std::end(kFiles) ? nullptr : found;
}

// A font file that is none: reads come short and garbled.
class BrokenFont final : public qorvex::ISyncStreamReader {
  public:
    std::size_t GetSize() override { return 5000; }
    std::size_t Read(std::size_t offset, void* destination, std::size_t size) override {
        if (offset >= GetSize()) return 0;
        size = std::min(size, GetSize() - offset);
        for (std::size_t i = 0; i < size; ++i)
            static_cast<unsigned char*>(destination)[i] = static_cast<unsigned char>((offset + i) * 37);
        if (offset == 0 && size >= 4) std::memcpy(destination, "\0\1\0\0", 4);
        return size;
    }
    void Close() override { delete this; }

  private:
    ~BrokenFont() override = default;
};

}  // namespace

const char* const kPages[9] = {
    "coui://stress/plain.html",    "coui://stress/rich.html",
    "coui://stress/busy.html",     "coui://stress/loader.html",
    "coui://stress/pictures.html", "coui://stress/away.html",
    "coui://stress/missing.html",  "relative.html",
    "coui://stress/a.js",
};

const char* const kSheets[4] = {
    "coui://stress/a.css",
    "coui://stress/b.css",
    "coui://stress/c.css",
    "coui://stress/missing.css",
};

const char* const kScripts[12] = {
    "document.body && document.body.appendChild(document.createElement('div'))",
    "if (document.body) document.body.innerHTML = '<p class=b0>new</p><div id=app>x</div>'",
    "if (document.body) document.body.style.backgroundColor = '#' + (Math.random() * 899 + 100 | 0)",
    "throw new Error('thrown')",
    "this is no script {",
    "setTimeout(function () { document.title = 't'; }, 5)",
    "requestAnimationFrame(function () { document.body && document.body.setAttribute('class', 'card'); })",
    "(function f(n) { return n ? f(n - 1) : 0; })(1e6)",
    "var l = document.createElement('link'); l.setAttribute('rel', 'stylesheet'); l.setAttribute('href', "
    "'b.css'); if (document.head) document.head.appendChild(l)",
    "var s = document.createElement('script'); s.setAttribute('src', 'a.js'); if (document.body) "
    "document.body.appendChild(s)",
    "try { location.href = 'coui://stress/plain.html' } catch (e) {}",
    "var app = document.getElementById('app'); if (app && app.parentNode) app.parentNode.removeChild(app)",
};

void Site::OnResourceRequest(const qorvex::IAsyncResourceRequest* request, IAsyncResourceResponse* response) {
    const std::string_view url = request->GetAbsoluteURL();
    const File* file = Find(url);
    const std::string picture = file ? std::string() : MakePicture(url);
    if (!file && picture.empty()) {
        response->SetStatus(404);
        response->Finish(IAsyncResourceResponse::Status::Failure);
        return;
    }
    const std::string_view bytes = file ? file->text : std::string_view(picture);
    std::memcpy(response->GetSpace(bytes.size()), bytes.data(), bytes.size());
    response->SetHeader("Content-Type", "text/plain");
    response->SetStatus(200);
    response->Finish(IAsyncResourceResponse::Status::Success);
}

void Site::OnResourceStreamRequest(const qorvex::IAsyncResourceRequest*,
                                   qorvex::IAsyncResourceStreamResponse* response) {
    response->SetStreamReader(new BrokenFont);
    response->Finish(IAsyncResourceResponse::Status::Success);
}

}  // namespace stress
