"""Targets on the loopback of the emulated machine: tgtd's, and the kernel's own. Each has one disk of 8 MiB."""

TGT = "tgtadm --lld iscsi"
CONFIG = "/sys/kernel/config/target"
KERNEL_PORT = 3261  # tgtd has 3260


def start_tgt(machine):
    machine.succeed("tgtd -f >/tmp/tgtd.log 2>&1 &")
    machine.until(f"{TGT} --op show --mode target")


def add_tgt(machine, number, name):
    """A target of tgtd's, for everyone; `number` is its own."""
    machine.succeed(f"""set -e
truncate -s 8M /tmp/disk{number}
{TGT} --op new --mode target --tid {number} -T {name}
{TGT} --op new --mode logicalunit --tid {number} --lun 1 -b /tmp/disk{number}
{TGT} --op bind --mode target --tid {number} -I ALL""")


def start_kernel(machine):
    machine.succeed(f"""set -e
modprobe iscsi_target_mod
modprobe target_core_file
mount -t configfs configfs /sys/kernel/config
mkdir {CONFIG}/iscsi""")


def add_kernel(machine, name, portal=f"127.0.0.1:{KERNEL_PORT}"):
    """A target of the kernel's own, for everyone, with its one portal."""
    disk, group = f"{CONFIG}/core/fileio_0/{name.replace(':', '.')}", f"{CONFIG}/iscsi/{name}/tpgt_1"
    machine.succeed(f"""set -e
truncate -s 8M '/tmp/{name}'
mkdir -p '{disk}' '{group}/np/{portal}' '{group}/lun/lun_0'
echo 'fd_dev_name=/tmp/{name},fd_dev_size=8388608' >'{disk}/control'
echo 1 >'{disk}/enable'
ln -s '{disk}' '{group}/lun/lun_0/disk'
for attribute in authentication=0 generate_node_acls=1 demo_mode_write_protect=0; do
  echo ${{attribute#*=}} >'{group}/attrib/'${{attribute%=*}}
done
echo 1 >'{group}/enable'""")
