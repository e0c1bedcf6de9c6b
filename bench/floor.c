// SPDX-License-Identifier: Apache-2.0
//
// The floor of the benchmark: the calls that `orvane -a`, `-i` or both make on the sample unit,
// without their meaning. It makes the same opens, maps and reads, in the same order, and one write
// per file. No program that does the job can cost less than these calls.
#include <dirent.h>
#include <fcntl.h>
#include <string.h>
#include <sys/mman.h>
#include <unistd.h>

static const char IMAGE[] = "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM";
static const char DISK[] = "/dev/hd0";
static const char VERSION_DIR[] = "/fs/rwdata/.Version/";

// At least the size of the longest file that is read or written here.
enum { BUFFER_SIZE = 8192 };
static char buffer[BUFFER_SIZE];

static void map_image(void) {
    const int image = open(IMAGE, O_RDONLY);
    const off_t size = lseek(image, 0, SEEK_END);
    void* const bytes = mmap(NULL, (size_t)size, PROT_READ, MAP_PRIVATE, image, 0);
    (void)*(const volatile char*)bytes;
    munmap(bytes, (size_t)size);
    close(image);
}

static void read_disk(off_t bytes_before_end, size_t length) {
    const int disk = open(DISK, O_RDONLY);
    lseek(disk, -bytes_before_end, SEEK_END);
    (void)!read(disk, buffer, length);
    close(disk);
}

static void read_whole(int file) {
    while (read(file, buffer, sizeof buffer) > 0) {
    }
    close(file);
}

static void write_file(const char* path, size_t length) {
    const int file = open(path, O_WRONLY | O_CREAT | O_TRUNC, 0666);
    (void)!write(file, buffer, length);
    close(file);
}

static void write_from_template(const char* path, const char* template_path, size_t length) {
    const int file = open(path, O_WRONLY | O_CREAT | O_TRUNC, 0666);
    read_whole(open(template_path, O_RDONLY));
    (void)!write(file, buffer, length);
    close(file);
}

static void read_versions(void) {
    char path[sizeof VERSION_DIR + 256];
    DIR* const folder = opendir(VERSION_DIR);
    if (folder == NULL) {
        return;
    }
    for (const struct dirent* entry = readdir(folder); entry != NULL; entry = readdir(folder)) {
        if (entry->d_name[0] != '.') {
            memcpy(path, VERSION_DIR, sizeof VERSION_DIR);
            memcpy(path + sizeof VERSION_DIR - 1, entry->d_name, strlen(entry->d_name) + 1);
            read_whole(open(path, O_RDONLY));
        }
    }
    closedir(folder);
}

static void update_airplay(void) {
    // model, brand, drive side, audio profile
    for (int lookup = 0; lookup < 4; ++lookup) {
        map_image();
    }
    read_disk(0xFF000, 1880);
    write_file("/tmp/telephony_FFFF.txt", 1122);
    read_disk(0xFF000, 1880);
    write_file("/tmp/speechrec_FFFF.txt", 1077);
    write_from_template("/tmp/airplay.conf", "/fs/mp/etc/airplay_static.conf", 718);
}

static void update_iap(void) {
    // serial, model, version, fuel type
    read_disk(0xFFF7F, 8);
    map_image();
    read_versions();
    map_image();
    write_from_template("/tmp/iap2_device.cfg", "/fs/mp/etc/iap2_device_static.cfg", 376);
    write_from_template("/tmp/iap2.cfg", "/fs/mp/etc/mm/iap2_static.cfg", 355);
    read_versions();
    write_from_template("/tmp/iap1.cfg", "/fs/mp/etc/mm/iap1_static.cfg", 385);
}

int main(int argc, char** argv) {
    for (int word = 1; word < argc; ++word) {
        if (strcmp(argv[word], "-a") == 0) {
            update_airplay();
        } else {
            update_iap();
        }
    }
    return 0;
}
