#include "dom/dom_fixture.h"
#include "dom/event_dispatcher.h"

namespace qorvex::dom::test {

using qsl::RefPtr;

class EventTest : public DomTest {
  protected:
    // Notes "<name><phase>" at each target that is listened to.
    void Note(EventTarget& target, const std::string& name, bool capture,
              std::function<void(Event&)> also = nullptr) {
        Listen(
            target, "ping",
            [this, name, also](Event& event) {
                trace_ += name + std::to_string(static_cast<int>(event.GetPhase())) + " ";
                if (also) also(event);
            },
            capture);
    }
    bool Ping(EventTarget& target, bool bubbles = true, bool cancelable = true) {
        RefPtr<Event> event =
            script::MakeHandle<Event>(document_.get(), document_->Intern("ping"), bubbles, cancelable);
        const bool result = target.DispatchEvent(event.get());
        EXPECT_EQ(event->GetTarget(), &target);
        EXPECT_EQ(event->GetCurrentTarget(), nullptr);
        EXPECT_EQ(event->GetPhase(), EventPhase::None);
        return result;
    }
    std::string Trace() { return std::exchange(trace_, {}); }
    std::string trace_;
};

TEST_F(EventTest, EventsOfABusyFrameAllocateNothing) {
    LoadEmpty();
    Note(Body(), "body", false);
    trace_.reserve(4096);
    const auto round = [&] {
        std::vector<RefPtr<Event>> kept;
        kept.reserve(40);
        for (int i = 0; i < 40; ++i) {
            Ping(Body());
            kept.push_back(script::MakeHandle<UIEvent>(document_.get(), Atom(), true, true));
        }
    };
    round();
    const uint64_t before = allocator_.Allocations();
    round();
    EXPECT_EQ(allocator_.Allocations(), before);
}

TEST_F(EventTest, CaptureTargetBubble) {
    Load("<div id=a><p id=b></p></div>");
    Element &a = Find("a"), &b = Find("b");
    Note(*document_, "doc", true);
    Note(a, "a", true);
    Note(a, "A", false);
    Note(b, "b", true);
    Note(b, "B", false);
    Note(Body(), "Body", false);
    EXPECT_TRUE(Ping(b));
    EXPECT_EQ(Trace(), "doc1 a1 b2 B2 A3 Body3 ");
    EXPECT_TRUE(Ping(b, false));
    EXPECT_EQ(Trace(), "doc1 a1 b2 B2 ");
}

TEST_F(EventTest, StoppingAndCancelling) {
    Load("<div id=a><p id=b></p></div>");
    Element &a = Find("a"), &b = Find("b");
    Note(b, "b", false, [](Event& event) { event.PreventDefault(); });
    Note(a, "a", false, [](Event& event) { event.StopPropagation(); });
    Note(Body(), "body", false);
    EXPECT_FALSE(Ping(b));
    EXPECT_EQ(Trace(), "b2 a3 ");
    EXPECT_TRUE(Ping(b, true, false));
    Trace();
    Note(b, "c", true, [](Event& event) { event.StopImmediatePropagation(); });
    Note(b, "d", false);
    Ping(b);
    EXPECT_EQ(Trace(), "b2 c2 ");
}

TEST_F(EventTest, ListenersComeAndGoWhileTheyRun) {
    Load("<p id=a></p>");
    Element& a = Find("a");
    const Atom ping = document_->Intern("ping");
    RefPtr<EventListener> self;
    self = script::MakeHandle<TestListener>([&](Event&) {
        trace_ += "self ";
        a.RemoveEventListener(ping, self.get(), false);
        Note(a, "added", false);
    });
    a.AddEventListener(ping, self, false);
    a.AddEventListener(ping, self, false);  // the same once more is no second entry
    Note(a, "skipped", false);
    Ping(a);
    EXPECT_EQ(Trace(), "self added2 ");
    Ping(a);
    EXPECT_EQ(Trace(), "skipped2 added2 ");
    a.RemoveEventListener(document_->Intern("never"), self.get(), false);
    EXPECT_TRUE(log_.Contains("Attempting to remove listener for non-existing event type."));
    self = nullptr;
}

TEST_F(EventTest, TheTreeMayChangeBetweenPhases) {
    Load("<div id=a><p id=b></p></div>");
    RefPtr<Element> a(&Find("a"));
    RefPtr<Element> b(&Find("b"));
    Note(*a, "a", false);
    Note(Body(), "cut", true, [&](Event&) { Body().RemoveChild(a.get()); });
    Ping(*b);
    EXPECT_EQ(Trace(), "cut1 ");
    Note(*b, "b", false);
    Ping(*b);  // outside the document there is no path
    EXPECT_EQ(Trace(), "b2 ");
}

TEST_F(EventTest, OnlyFreshEventsGoOut) {
    Load("<p id=a></p>");
    Element& a = Find("a");
    EXPECT_FALSE(a.DispatchEvent(nullptr));
    RefPtr<Event> event = document_->CreateEvent("Event");
    EXPECT_FALSE(a.DispatchEvent(event.get()));
    event->InitEvent(document_->Intern("ping"), true, true);
    Note(a, "a", false, [&](Event& current) { EXPECT_FALSE(a.DispatchEvent(&current)); });
    EXPECT_TRUE(a.DispatchEvent(event.get()));
    EXPECT_EQ(document_->CreateEvent("NoSuchEvent"), nullptr);
    EXPECT_EQ(EventId("message"), 67);
    EXPECT_EQ(EventId("nonsense"), -1);
    EXPECT_EQ(InlineHandlerName(2), "onclick");
}

}  // namespace qorvex::dom::test
