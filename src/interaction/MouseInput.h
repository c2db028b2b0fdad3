#pragma once

/// Extension point for modes of the mouse. Each view owns one; the base does nothing.
class VtCBaseMouseInput
{
public:
    virtual ~VtCBaseMouseInput() = default;
    virtual void activate() {}
    virtual void deactivate() {}
};

/// Remembers which view's input holds the mouse of a scene, and tells the old and the new one when that changes.
///
/// The objects aren't owned, and a view that goes away doesn't say so: whoever reads them must know that their view
/// still exists.
class VtCMouseInputManager
{
public:
    virtual ~VtCMouseInputManager() = default;

    /// Null and the present object change nothing. The old one is deactivated before the new one is activated, and both
    /// see the new values.
    void setActiveInput(VtCBaseMouseInput* input)
    {
        if (!input || input == currentInput)
            return;
        previousInput = currentInput;
        currentInput = input;
        if (previousInput)
            previousInput->deactivate();
        currentInput->activate();
    }

    VtCBaseMouseInput* getCurrentInput() const { return currentInput; }
    VtCBaseMouseInput* getPreviousInput() const { return previousInput; }

private:
    VtCBaseMouseInput* currentInput = nullptr;
    VtCBaseMouseInput* previousInput = nullptr;
};
