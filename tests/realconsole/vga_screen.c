// Tells the kernel's driver of a VGA in a 16-colour mode that there is one. A kernel of today tells it nothing.
#include <linux/module.h>
#include <linux/platform_device.h>
#include <linux/screen_info.h>

static struct platform_device *device;

static int __init announce(void)
{
    static struct screen_info screen = {.orig_video_isVGA = VIDEO_TYPE_VGAC, .orig_video_mode = 0x12};

    device = platform_device_register_data(NULL, "vga-framebuffer", 0, &screen, sizeof(screen));
    return PTR_ERR_OR_ZERO(device);
}

static void __exit withdraw(void)
{
    platform_device_unregister(device);
}

module_init(announce);
module_exit(withdraw);
MODULE_LICENSE("GPL");
