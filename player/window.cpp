#include "window.h"

#include <SDL.h>
#include <qorvex/view.h>

#include <cstdio>
#include <string>

#include "headless.h"
#include "session.h"

namespace player {
namespace {
using namespace qorvex;

constexpr std::uint32_t kTitleInterval = 500;  // milliseconds between two updates of the title

struct SdlDeleter {
    void operator()(SDL_Window* window) const { SDL_DestroyWindow(window); }
    void operator()(SDL_Renderer* renderer) const { SDL_DestroyRenderer(renderer); }
    void operator()(SDL_Texture* texture) const { SDL_DestroyTexture(texture); }
};
template <class T>
using SdlPointer = std::unique_ptr<T, SdlDeleter>;

EventModifiers CurrentModifiers() {
    const SDL_Keymod state = SDL_GetModState();
    EventModifiers modifiers;
    modifiers.ShiftKey = (state & KMOD_SHIFT) != 0;
    modifiers.CtrlKey = (state & KMOD_CTRL) != 0;
    modifiers.AltKey = (state & KMOD_ALT) != 0;
    modifiers.MetaKey = (state & KMOD_GUI) != 0;
    modifiers.NumLock = (state & KMOD_NUM) != 0;
    modifiers.CapsLock = (state & KMOD_CAPS) != 0;
    return modifiers;
}

// SDL's key to the virtual key code that pages see in keyCode.
std::int32_t VirtualKey(SDL_Keycode key) {
    struct Row {
        SDL_Keycode sdl;
        std::int32_t code;
    };
    static constexpr Row kRows[] = {
        {SDLK_BACKSPACE, 8}, {SDLK_TAB, 9},     {SDLK_RETURN, 13}, {SDLK_KP_ENTER, 13}, {SDLK_LSHIFT, 16},
        {SDLK_RSHIFT, 16},   {SDLK_LCTRL, 17},  {SDLK_RCTRL, 17},  {SDLK_LALT, 18},     {SDLK_RALT, 18},
        {SDLK_ESCAPE, 27},   {SDLK_SPACE, 32},  {SDLK_PAGEUP, 33}, {SDLK_PAGEDOWN, 34}, {SDLK_END, 35},
        {SDLK_HOME, 36},     {SDLK_LEFT, 37},   {SDLK_UP, 38},     {SDLK_RIGHT, 39},    {SDLK_DOWN, 40},
        {SDLK_INSERT, 45},   {SDLK_DELETE, 46},
    };
    for (const Row& row : kRows) {
        if (row.sdl == key) return row.code;
    }
    if (key >= SDLK_F1 && key <= SDLK_F12) return 112 + (key - SDLK_F1);
    if (key >= SDLK_a && key <= SDLK_z) return key - SDLK_a + 'A';
    return key > 0 && key < 128 ? key : 0;
}

class Window {
  public:
    explicit Window(Session& session) : session_(session) {}

    [[nodiscard]] bool Open(const Options& options) {
        window_.reset(SDL_CreateWindow("qorvex-player", SDL_WINDOWPOS_CENTERED, SDL_WINDOWPOS_CENTERED,
                                       static_cast<int>(options.width), static_cast<int>(options.height),
                                       SDL_WINDOW_RESIZABLE));
        if (!window_) return false;
        renderer_.reset(SDL_CreateRenderer(window_.get(), -1, SDL_RENDERER_PRESENTVSYNC));
        return renderer_ && MakeTexture();
    }

    void Loop() {
        SDL_StartTextInput();
        const Uint64 start = SDL_GetTicks64();
        Uint64 titled = 0;
        while (running_) {
            for (SDL_Event event; SDL_PollEvent(&event);)
                Handle(event);
            const Uint64 now = SDL_GetTicks64();
            const std::uint32_t frame = session_.RunFrame(static_cast<double>(now - start));
            FrameStats stats;
            const bool known = session_.Stats()->GetFrame(session_.View(), frame, &stats);
            if (!known || stats.Recorded > 0 || exposed_) {
                Show();
            } else {
                SDL_Delay(8);  // nothing to show: leave the processor to others for half a frame
            }
            if (known && now - titled >= kTitleInterval) {
                titled = now;
                SetTitle(stats);
            }
        }
    }

  private:
    bool MakeTexture() {
        texture_.reset(SDL_CreateTexture(renderer_.get(), SDL_PIXELFORMAT_RGB24, SDL_TEXTUREACCESS_STREAMING,
                                         static_cast<int>(session_.Target().Width()),
                                         static_cast<int>(session_.Target().Height())));
        exposed_ = true;
        return texture_ != nullptr;
    }

    void Show() {
        const std::vector<std::uint8_t> pixels = session_.Target().Flatten();
        SDL_UpdateTexture(texture_.get(), nullptr, pixels.data(),
                          static_cast<int>(session_.Target().Width() * 3));
        SDL_RenderCopy(renderer_.get(), texture_.get(), nullptr, nullptr);
        SDL_RenderPresent(renderer_.get());
        exposed_ = false;
    }

    void SetTitle(const FrameStats& stats) {
        char title[160];
        std::snprintf(title, sizeof title, "qorvex-player | advance %.2f ms, layout %.2f ms, paint %.2f ms",
                      stats.Advance, stats.Layout + stats.Record, stats.Paint);
        SDL_SetWindowTitle(window_.get(), title);
    }

    void Handle(const SDL_Event& event) {
        switch (event.type) {
            case SDL_QUIT:
                running_ = false;
                break;
            case SDL_WINDOWEVENT:
                HandleWindow(event.window);
                break;
            case SDL_MOUSEMOTION:
                Mouse(MouseEventData::Move, -1, event.motion.x, event.motion.y, event.motion.state);
                break;
            case SDL_MOUSEBUTTONDOWN:
            case SDL_MOUSEBUTTONUP:
                Mouse(event.type == SDL_MOUSEBUTTONDOWN ? MouseEventData::Down : MouseEventData::Up,
                      event.button.button - 1, event.button.x, event.button.y,
                      SDL_GetMouseState(nullptr, nullptr));
                break;
            case SDL_MOUSEWHEEL:
                Wheel(event.wheel);
                break;
            case SDL_KEYDOWN:
            case SDL_KEYUP:
                Key(event.key);
                break;
            case SDL_TEXTINPUT:
                Text(event.text.text);
                break;
            default:
                break;
        }
    }

    void HandleWindow(const SDL_WindowEvent& event) {
        if (event.event == SDL_WINDOWEVENT_EXPOSED) exposed_ = true;
        if (event.event == SDL_WINDOWEVENT_SIZE_CHANGED && event.data1 > 0 && event.data2 > 0) {
            session_.Resize(static_cast<std::uint32_t>(event.data1), static_cast<std::uint32_t>(event.data2));
            MakeTexture();
        }
    }

    void Mouse(MouseEventData::EventType type, int button, int x, int y, Uint32 held) {
        MouseEventData data;
        data.Type = type;
        data.Button = button < 0 ? 0 : button;
        data.X = x;
        data.Y = y;
        data.Modifiers = CurrentModifiers();
        data.LeftDown = (held & SDL_BUTTON_LMASK) != 0;
        data.MiddleDown = (held & SDL_BUTTON_MMASK) != 0;
        data.RightDown = (held & SDL_BUTTON_RMASK) != 0;
        session_.View()->MouseEvent(data, nullptr, nullptr);
    }

    void Wheel(const SDL_MouseWheelEvent& wheel) {
        constexpr float kPixelsPerNotch = 40;
        MouseEventData data;
        data.Type = MouseEventData::Wheel;
        data.X = wheel.mouseX;
        data.Y = wheel.mouseY;
        data.WheelX = static_cast<float>(wheel.x) * kPixelsPerNotch;
        data.WheelY = static_cast<float>(-wheel.y) * kPixelsPerNotch;
        data.Modifiers = CurrentModifiers();
        session_.View()->MouseEvent(data, nullptr, nullptr);
    }

    void Key(const SDL_KeyboardEvent& key) {
        if (key.type == SDL_KEYDOWN && key.keysym.sym == SDLK_F5) {
            session_.View()->Reload();
            return;
        }
        KeyEventData data;
        data.Type = key.type == SDL_KEYDOWN ? KeyEventData::Down : KeyEventData::Up;
        data.KeyCode = VirtualKey(key.keysym.sym);
        data.Modifiers = CurrentModifiers();
        data.Repeat = key.repeat;
        session_.View()->KeyEvent(data, nullptr, nullptr);
    }

    void Text(const char* text) {
        KeyEventData data;
        data.Type = KeyEventData::Char;
        data.Modifiers = CurrentModifiers();
        char* wide = SDL_iconv_string("UCS-4LE", "UTF-8", text, SDL_strlen(text) + 1);
        for (const auto* code = reinterpret_cast<const Uint32*>(wide); code && *code; ++code) {
            data.KeyCode = static_cast<std::int32_t>(*code);
            session_.View()->KeyEvent(data, nullptr, nullptr);
        }
        SDL_free(wide);
    }

    Session& session_;
    SdlPointer<SDL_Window> window_;
    SdlPointer<SDL_Renderer> renderer_;
    SdlPointer<SDL_Texture> texture_;
    bool running_ = true;
    bool exposed_ = true;
};

}  // namespace

int RunWindow(const Options& options) {
    if (SDL_Init(SDL_INIT_VIDEO) != 0) return RunHeadless(options);
    int code = kExitFine;
    {
        std::string error;
        const std::unique_ptr<Session> session = Session::Create(options, false, error);
        if (session && session->LoadPage(error)) {
            Window window(*session);
            if (window.Open(options)) {
                window.Loop();
                if (options.strict && session->SawErrors()) code = kExitStrict;
            } else {
                error = SDL_GetError();
            }
        }
        if (!error.empty()) {
            std::fprintf(stderr, "qorvex-player: %s\n", error.c_str());
            code = kExitBadInput;
        }
    }
    SDL_Quit();
    return code;
}

}  // namespace player
