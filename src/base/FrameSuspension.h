#pragma once

/// Holds the frame cycle up for as long as it lives: its idle steps, its pictures, or both.
///
///     {
///         const VtCFrameSuspension suspended;                              // the scene graph is rebuilt in here
///         Rebuild();
///     }                                                                    // on with the cycle
///     const VtCFrameSuspension undrawn(VtCFrameSuspension::Extent::pictures); // data go on, nothing is drawn
///
/// Suspensions count. They may lie within one another and end in any order, and the cycle goes on when the last of them
/// has ended, also when that is by an exception. What pumps messages while it works suspends the steps, as the host's
/// next idle event would find things half done; what rebuilds the scene graph or changes views suspends both.
///
/// There is one cycle in a process, and everything of it happens on the thread that owns the windows.
class VtCFrameSuspension
{
public:
    enum class Extent
    {
        steps,    ///< no idle step; who wants a picture still gets one
        pictures, ///< no pictures; data go on
        all,
    };

    explicit VtCFrameSuspension(Extent extent = Extent::all);
    ~VtCFrameSuspension();
    VtCFrameSuspension(const VtCFrameSuspension&) = delete;
    VtCFrameSuspension& operator=(const VtCFrameSuspension&) = delete;

    static bool AreStepsSuspended() { return steps > 0; }
    static bool ArePicturesSuspended() { return pictures > 0; }

private:
    void Count(int by) const;

    inline static int steps = 0;
    inline static int pictures = 0;
    const Extent held;
};
