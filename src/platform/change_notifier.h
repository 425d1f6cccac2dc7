#pragma once

#include <functional>

// An engine's procedures run to their end and then tell their views once.
// A procedure that calls another (a click that runs a timer's handler) nests:
// only the outermost one tells. Every early return is covered, since the
// scope ends there too. Before a modal box stands the views must show the
// state so far, so the engine calls flush() just before it asks the Operator.
//
//   ChangeNotifier m_notify{[this] { emit changed(); }};
//   void nowstatus_Click() { const auto p = m_notify.procedure(); ... }
class ChangeNotifier {
public:
    explicit ChangeNotifier(std::function<void()> tell) : m_tell(std::move(tell)) {}
    ChangeNotifier(const ChangeNotifier&) = delete;
    ChangeNotifier& operator=(const ChangeNotifier&) = delete;

    class Scope {
    public:
        explicit Scope(ChangeNotifier& n) : m_n(&n) { ++m_n->m_depth; }
        Scope(Scope&& other) noexcept : m_n(other.m_n) { other.m_n = nullptr; }
        Scope(const Scope&) = delete;
        Scope& operator=(const Scope&) = delete;
        Scope& operator=(Scope&&) = delete;
        ~Scope()
        {
            if (m_n && --m_n->m_depth == 0)
                m_n->m_tell();
        }

    private:
        ChangeNotifier* m_n;
    };

    // While a modal box stands the event loop runs: a timer or an arrival
    // handled under it is an outermost procedure there and tells its own end.
    class Box {
    public:
        explicit Box(ChangeNotifier& n) : m_n(&n), m_depth(n.m_depth) { n.m_depth = 0; }
        Box(Box&& other) noexcept : m_n(other.m_n), m_depth(other.m_depth) { other.m_n = nullptr; }
        Box(const Box&) = delete;
        Box& operator=(const Box&) = delete;
        Box& operator=(Box&&) = delete;
        ~Box()
        {
            if (m_n)
                m_n->m_depth = m_depth;
        }

    private:
        ChangeNotifier* m_n;
        int m_depth;
    };

    [[nodiscard]] Scope procedure() { return Scope(*this); }
    // The views show what the procedure has done so far (before a box).
    void flush() { m_tell(); }
    // flush(), and procedures running until the box ends tell for themselves.
    [[nodiscard]] Box box()
    {
        flush();
        return Box(*this);
    }
    bool inProcedure() const { return m_depth > 0; }

private:
    std::function<void()> m_tell;
    int m_depth = 0;
};
